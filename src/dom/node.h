// The base of the document tree. A node owns its children by strong references in one array, whose order is
// the document order; `parent` and `document` are plain pointers. Tree walks are loops with their own stack:
// pages and scripts decide how deep a tree nests.
//
// Invariants:
// - a child's parent is the node whose array holds it; a node without a parent is held by somebody else;
// - kInDocument holds for a node exactly when the chain of parents ends at the document, and then depth is
// the
//   length of that chain; else depth is -1;
// - the document outlives its nodes (see Document::OnBeforeDestroy);
// - everything runs on the view's script thread.
#pragma once

#include <optional>
#include <span>
#include <string_view>

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "css/values/html_tags.h"
#include "css/values/layout_style_refs.h"
#include "display/display_element.h"
#include "dom/event_target.h"
#include "dom/node_flags.h"
#include "dom/node_rare_data.h"
#include "layout/layout_handle.h"
#include "layout/node_link.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class Comment;
class Document;
class Element;
class NodeList;
class Text;

using NodeText = TaggedString<MemoryTag::DOM>;
using NodeVector = Vector<RefPtr<Node>, MemoryTag::DOM>;

class Node : public EventTarget {
  public:
    Node(Document& document, uint32_t flags);

    // --- EventTarget
    EventListeners* GetEventListeners(bool create) override;
    script::ScriptingContext* GetScriptingContext() override;
    void PostDispatch(Event& event) override;
    Node* GetEventTargetNode() override { return this; }
    Document* GetEventTargetDocument() const override { return document_; }

    // --- Identity
    bool Is(uint32_t flags) const { return (flags_ & flags) != 0; }
    bool IsElement() const { return Is(kIsElement); }
    bool IsText() const { return Is(kIsText); }
    bool IsInDocument() const { return Is(kInDocument); }
    uint32_t GetFlags() const { return flags_; }
    css::TagId GetTag() const { return tag_; }
    virtual Atom GetNodeName() const;
    int GetNodeType() const;
    virtual std::optional<std::string_view> GetNodeValue() const { return std::nullopt; }
    virtual void SetNodeValue(std::string_view) {}
    virtual void ToDebugString(NodeText& out) const;

    // --- Tree
    Node* GetParent() const { return parent_; }
    Element* GetParentElement() const;
    Document* GetDocument() const { return document_; }
    // Null for the document itself, as script sees it.
    Document* GetOwnerDocument() const;
    std::span<const RefPtr<Node>> GetChildren() const { return {children_.data(), children_.size()}; }
    size_t GetChildCount() const { return children_.size(); }
    bool HasChildNodes() const { return !children_.empty(); }
    Node* GetFirstChild() const { return children_.empty() ? nullptr : children_[0].get(); }
    Node* GetLastChild() const { return children_.empty() ? nullptr : children_[children_.size() - 1].get(); }
    Node* GetPreviousSibling() const;
    Node* GetNextSibling() const;
    Element* GetPreviousElementSibling() const;
    Element* GetNextElementSibling() const;
    Node& GetRootNode();
    int32_t GetDepth() const { return depth_; }
    RefPtr<NodeList> GetChildNodes();

    // The single path of every insertion; see node_tree.cpp for the order of its steps. Returns the child in
    // all outcomes but two: a null child, and a reference that is no child of this node.
    RefPtr<Node> InsertBefore(RefPtr<Node> child, Node* reference, bool suppress_records = false);
    virtual RefPtr<Node> AppendChild(RefPtr<Node> child) { return InsertBefore(std::move(child), nullptr); }
    RefPtr<Node> RemoveChild(Node* child, bool suppress_records = false);
    RefPtr<Node> ReplaceChild(RefPtr<Node> new_child, Node* old_child);
    void RemoveAllChildren();
    void Normalize();

    virtual NodeText GetTextContent() const;
    virtual void SetTextContent(std::string_view text);

    virtual RefPtr<Node> CloneNode(bool deep) = 0;
    bool Contains(const Node* other) const;
    bool IsEqualNode(const Node* other) const;
    int CompareDocumentPosition(const Node& other) const;
    // The next node in document order below `root`, this node excluded; null at the end.
    Node* GetNextInTree(const Node* root) const;

    // --- Connection. The walk over the subtree is the caller's (see node_connection.cpp): each node acts for
    // itself alone, first before and then after its children were told.
    virtual void OnInsertedIntoDocument();
    virtual void OnSubtreeInserted() {}
    virtual void OnRemovedFromDocument();
    void ConnectSubtree();
    void DisconnectSubtree();

    // --- Style. Fields that the solver reads and writes on every visit.
    css::LayoutStyleRefs& GetStyle() { return style_; }
    const css::LayoutStyleRefs& GetStyle() const { return style_; }
    uint16_t pendingStyleBits = 0;
    uint8_t timesSolved = 0;
    uint8_t styleSolved = 1;
    uint8_t textTransformFlag = 0;  // Text only

    virtual void MarkStyleDirty() {}
    virtual void ClearStyleSolved();
    virtual void OnActiveChanged() {}
    virtual void OnHoverChanged() {}
    virtual void OnComputedStyleChanged() {}
    // Sets textTransformFlag on every text below this node.
    void SetTextSelectionFlag();

    // --- Layout
    layout::LayoutHandle* GetLayoutHandle() const { return layout_node_.get(); }
    void SetLayoutHandle(RefPtr<layout::LayoutHandle> handle);
    // Makes the handle of this node below `parent`; null for nodes that have no box of their own.
    virtual RefPtr<layout::LayoutHandle> CreateLayoutNode(layout::LayoutTree& tree,
                                                          layout::LayoutHandle& parent);
    void MarkLayoutDirty(bool clear_style_solved = true);
    dsp::IDisplayElement* GetDisplayElement() const { return display_element_.get(); }
    // The geometry of the last finished layout; null without a box.
    const layout::LayoutResult* GetLayoutResult() const;
    // What layout and tasks hold of this node: a weak link that reads null after its death.
    RefPtr<layout::NodeLink> GetLayoutLink();

    float GetScrollLeft();
    float GetScrollTop();
    void SetScrollLeft(float value);
    void SetScrollTop(float value);
    float GetScrollWidth() const;
    float GetScrollHeight() const;

    // --- Images and localisation
    virtual void ReleaseImages(int kind, int slot);
    virtual bool HasLocalizedContent() const { return false; }
    virtual void ApplyLocalization() {}

    NodeRareData* GetRareData() const { return rare_.get(); }
    NodeRareData& EnsureRareData();

  protected:
    ~Node() override;
    void CopyCommon(Node& target, bool deep);
    void SetFlag(uint32_t flag, bool on) { flags_ = on ? flags_ | flag : flags_ & ~flag; }

    css::TagId tag_;
    RefPtr<dsp::IDisplayElement> display_element_;
    std::optional<NodeText> transformed_text_;

  private:
    friend class Document;
    friend class Builder;

    // (private tree steps are declared in node_tree.cpp's order)
    bool CanInsert(const Node& child) const;
    void InsertFragment(Node& fragment, Node* reference, bool suppress_records);
    size_t IndexOf(const Node* child) const;
    void AnnounceRemoval(Node& child);
    void NotifyAdded(Node& child);

    uint32_t flags_;
    int32_t depth_ = -1;
    Node* parent_ = nullptr;
    Document* document_;
    css::LayoutStyleRefs style_;
    RefPtr<layout::LayoutHandle> layout_node_;
    NodeVector children_;
    float scroll_left_ = 0;
    float scroll_top_ = 0;
    UniquePtr<NodeRareData, MemoryTag::DOM> rare_;
};

}  // namespace qorvex::dom
