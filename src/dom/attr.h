// An attribute as script sees it: made on demand and not kept, so two reads give two objects. While its
// element lives, value reads and writes go through the element; after that the Attr keeps its own.
#pragma once

#include "dom/node.h"

namespace qorvex::dom {

class Attr final : public Node {
    QORVEX_SCRIPT_CLASS(Attr)
  public:
    Attr(Document& document, std::string_view name, std::string_view value, Element* owner);

    std::string_view GetName() const { return name_; }
    std::string_view GetPrefix() const { return prefix_; }
    std::string_view GetValue() const;
    void SetValue(std::string_view value);
    Element* GetOwnerElement() const;
    void SetOwnerElement(Element& element);

    Atom GetNodeName() const override;
    std::optional<std::string_view> GetNodeValue() const override { return GetValue(); }
    void SetNodeValue(std::string_view value) override { SetValue(value); }
    NodeText GetTextContent() const override { return NodeText(GetValue()); }
    void SetTextContent(std::string_view text) override { SetValue(text); }
    void ToDebugString(NodeText& out) const override;
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override {
        return nullptr;
    }

  private:
    NodeText prefix_;
    NodeText name_;
    mutable NodeText value_;
    script::WeakHandle<Node> owner_;
};

}  // namespace qorvex::dom
