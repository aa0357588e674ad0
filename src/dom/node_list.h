// Lists of nodes that script gets.
#pragma once

#include "dom/node.h"

namespace qorvex::dom {

class NodeList : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(NodeList)
  public:
    virtual size_t GetLength() const = 0;
    // Null when out of range.
    virtual Node* GetItem(size_t index) const = 0;
};

// Holds what was found when it was made.
class NodeListStatic : public NodeList {
  public:
    NodeListStatic() = default;
    explicit NodeListStatic(NodeVector nodes) : nodes_(std::move(nodes)) {}
    size_t GetLength() const override { return nodes_.size(); }
    Node* GetItem(size_t index) const override {
        return index < nodes_.size() ? nodes_[index].get() : nullptr;
    }
    void Add(Node& node) { nodes_.push_back(qsl::RefPtr<Node>(&node)); }

  private:
    NodeVector nodes_;
};

// The children of a node as they are at each call; none once it is gone.
class NodeListLive final : public NodeList {
  public:
    explicit NodeListLive(Node& parent) : parent_(&parent) {}
    size_t GetLength() const override;
    Node* GetItem(size_t index) const override;

  private:
    script::WeakHandle<Node> parent_;
};

// Elements by tag or class: a snapshot, which the document keeps until a change could show in it.
class HTMLCollection final : public NodeListStatic {
    QORVEX_SCRIPT_CLASS(HTMLCollection)
  public:
    Element* GetElement(size_t index) const;
    // The first element with this id, else with this name.
    Element* GetNamedItem(std::string_view name) const;
};

// What `element.attributes` gives: fresh Attr objects in the order id, class, style, plain attributes,
// dataset.
class Attr;
class NamedNodeMap final : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(NamedNodeMap)
  public:
    size_t GetLength() const { return attributes_.size(); }
    Attr* GetItem(size_t index) const {
        return index < attributes_.size() ? attributes_[index].get() : nullptr;
    }
    void Add(qsl::RefPtr<Attr> attribute);
    NamedNodeMap();
    ~NamedNodeMap() override;

  private:
    Vector<qsl::RefPtr<Attr>, MemoryTag::DOM> attributes_;
};

}  // namespace qorvex::dom
