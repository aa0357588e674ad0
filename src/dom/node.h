// The base of the document tree. A node owns its children by strong references in one array, whose order is
// the document order; `parent` and `document` are plain pointers. Tree walks are loops with their own stack:
// pages and scripts decide how deep a tree nests.
//
// Invariants:
// - a child's parent is the node whose array holds it; a node without a parent is held by somebody else;
// - kInDocument holds for a node exactly when the chain of parents ends at the document, and then depth is
// the
//   length of that chain; else depth is -1;
// - the memory of the document outlives its nodes (see Document::OnBeforeDestroy);
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
#include "dom/image_loading.h"
#include "dom/node_flags.h"
#include "dom/node_link.h"
#include "dom/node_rare_data.h"
#include "layout/layout_handle.h"
#include "qsl/ref_ptr.h"

namespace qorvex::layout {
class LayoutTree;
}

namespace qorvex::dom {

class Comment;
class Document;
class Element;
class NodeList;
class Text;
struct ChildListChange;

using NodeText = TaggedString<MemoryTag::DOM>;
using NodeVector = Vector<qsl::RefPtr<Node>, MemoryTag::DOM>;
// Of one node: mostly none or one.
using NodeChildren = CompactVector<qsl::RefPtr<Node>, MemoryTag::DOM>;
using NodeSet = qorvex::NodeSet<Node*, MemoryTag::DOM>;

class Node : public EventTarget {
    QORVEX_SCRIPT_CLASS(Node)
  public:
    // --- EventTarget
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
    // As markup and selectors write it: a custom element, which shares its node name with all others, by its
    // own.
    virtual Atom GetMarkupName() const { return GetNodeName(); }
    int GetNodeType() const;
    virtual std::optional<std::string_view> GetNodeValue() const { return std::nullopt; }
    virtual void SetNodeValue(std::string_view) {}
    // One line about the node, for logs and dumps.
    virtual void ToDebugString(NodeText& out) const = 0;

    // --- Tree
    Node* GetParent() const { return parent_; }
    Element* GetParentElement() const;
    Document* GetDocument() const { return document_; }
    // Null for the document itself, as script sees it.
    Document* GetOwnerDocument() const;
    std::span<const qsl::RefPtr<Node>> GetChildren() const { return {children_.data(), children_.size()}; }
    size_t GetChildCount() const { return children_.size(); }
    bool HasChildNodes() const { return !children_.empty(); }
    Node* GetFirstChild() const { return children_.empty() ? nullptr : children_.front().get(); }
    Node* GetLastChild() const { return children_.empty() ? nullptr : children_.back().get(); }
    Node* GetPreviousSibling() const;
    Node* GetNextSibling() const;
    Element* GetPreviousElementSibling() const;
    Element* GetNextElementSibling() const;
    Node& GetRootNode();
    int32_t GetDepth() const { return depth_; }
    qsl::RefPtr<NodeList> GetChildNodes();
    // Place in the parent's array; kNoIndex without a parent, and for a child whose removal is under way.
    static constexpr size_t kNoIndex = static_cast<size_t>(-1);
    size_t GetIndexInParent() const;

    // The single path of every insertion; node_tree.cpp tells the order of its steps. Returns the child in
    // all outcomes but two: a null child, and a reference that is no child of this node.
    qsl::RefPtr<Node> InsertBefore(qsl::RefPtr<Node> child, Node* reference, bool suppress_records = false);
    virtual qsl::RefPtr<Node> AppendChild(qsl::RefPtr<Node> child) {
        return InsertBefore(std::move(child), nullptr);
    }
    qsl::RefPtr<Node> RemoveChild(Node* child, bool suppress_records = false);
    qsl::RefPtr<Node> ReplaceChild(qsl::RefPtr<Node> new_child, Node* old_child);
    void RemoveAllChildren();
    void Normalize();

    virtual NodeText GetTextContent() const;
    virtual void SetTextContent(std::string_view text);

    virtual qsl::RefPtr<Node> CloneNode(bool deep) = 0;
    // A node contains itself.
    bool Contains(const Node* other) const;
    bool IsEqualNode(const Node* other) const;
    int CompareDocumentPosition(const Node& other) const;
    // The next node of the subtree of `root` in document order; null at the end.
    Node* GetNextInTree(const Node* root) const;
    Node* GetNextSkippingChildren(const Node* root) const;

    // --- Connection. Each node acts for itself alone; the walk over the subtree, which calls one operation
    // before and one after the node's children, is ConnectSubtree's and DisconnectSubtree's.
    virtual void OnInsertedIntoDocument();
    virtual void OnSubtreeInserted() {}
    virtual void OnRemovedFromDocument() {}
    virtual void OnSubtreeRemoved();
    void ConnectSubtree();
    void DisconnectSubtree();

    // --- Style. What the solver reads and writes on every visit is public.
    // What layout takes of the node's style. Elements and texts have one of their own; it is the default
    // style for all others.
    const css::LaidOutStyle& GetLaidOutStyle() const;
    uint16_t pendingStyleBits = 0;
    uint8_t timesSolved = 0;
    uint8_t styleSolved = 1;
    uint8_t textTransformFlag = 0;  // Text only

    virtual void MarkStyleDirty() {}
    virtual void ClearStyleSolved() { styleSolved = 0; }
    virtual void OnActiveChanged() {}
    virtual void OnHoverChanged() {}
    virtual void OnComputedStyleChanged() {}
    // Sets textTransformFlag on every text of this subtree.
    void SetTextSelectionFlag();

    // --- Layout
    layout::LayoutHandle* GetLayoutHandle() const { return layout_node_.get(); }
    // Makes the handle of this node below `parent`; null for nodes that have no box of their own.
    virtual layout::HandlePtr CreateLayoutNode(layout::LayoutTree& tree, layout::LayoutHandle& parent);
    // The next frame lays the node out again.
    void MarkLayoutDirty();
    dsp::IDisplayElement* GetDisplayElement() const { return display_element_.get(); }
    // The geometry of the last finished layout; null without a box.
    const layout::LayoutResult* GetLayoutResult() const;
    // The rest of it, which texts have none of.
    const layout::BoxResult* GetBoxResult() const;
    // What layout and tasks hold of this node: it reads null after the node's death.
    qsl::RefPtr<NodeLink> GetLayoutLink();

    float GetScrollLeft();
    float GetScrollTop();
    void SetScrollLeft(float value);
    void SetScrollTop(float value);
    float GetScrollWidth() const;
    float GetScrollHeight() const;

    // --- Images and localisation
    virtual void ReleaseImages(int, int) {}
    // News of an image that this node uses.
    virtual void OnImageLoaded(uint32_t, const ImageInfoPtr&, ImageState) {}
    virtual void OnSVGLoaded(uint32_t, const SVGImagePtr&) {}
    // (id, frame, on screen): an animated image that this node uses shows another frame; a repaint makes
    // sense only when the node is on screen. Requests and releases no image.
    virtual void OnImageFrame(uint32_t, uint32_t, bool) {}
    // Layout is idle: what the node's display element draws becomes what the node's images are.
    virtual void CommitImages() {}
    virtual bool HasLocalizedContent() const { return false; }
    virtual void ApplyLocalization() {}

    NodeRareData* GetRareData() const { return rare_.get(); }
    NodeRareData& EnsureRareData();

  protected:
    Node(Document& document, uint32_t flags, css::TagId tag = css::TagId::Unknown);
    ~Node() override;

    // Listeners of this node, and clones of its children when `deep`.
    void CopyCommon(Node& target, bool deep);
    // Null for a node without a style of its own.
    virtual const css::LaidOutStyle* GetOwnLaidOutStyle() const { return nullptr; }
    // What of it layout has not taken over yet.
    virtual css::WrittenGroups* GetWrittenGroups() { return nullptr; }
    virtual void ResetStyle() {}
    void SetFlag(uint32_t flag, bool on) { flags_ = on ? flags_ | flag : flags_ & ~flag; }
    void SetScroll(layout::ScrollPosition wanted);
    layout::ScrollPosition ClampScroll(layout::ScrollPosition wanted) const;
    layout::ScrollPosition KeepScrollInside();
    layout::ScrollPosition GetStoredScroll() const {
        return rare_ ? rare_->scroll : layout::ScrollPosition();
    }
    // Index among the layout children of `parent` at which a new handle of this node goes.
    uint32_t FindLayoutIndex(const layout::LayoutHandle& parent) const;
    void AdoptLayoutHandle(layout::HandlePtr handle) { layout_node_ = std::move(handle); }

    css::TagId tag_;

  private:
    uint32_t flags_;

  protected:
    dsp::DisplayElementPtr display_element_;

  private:
    friend class Document;
    friend class NodeLink;

    size_t FindIndexInParent() const;
    bool MayInsert(const Node& child) const;
    void InsertFragment(Node& fragment, Node* reference, bool suppress_records);
    bool PlaceChild(qsl::RefPtr<Node>& child, Node* reference);
    void QueueChildListRecord(const ChildListChange& change);
    void LeaveDocument(Node& child);
    void AfterRemoval();

    int32_t depth_ = -1;
    // Where the parent's array held this node when it was last looked up: a guess that is checked at each
    // use, so that walks from sibling to sibling cost no search.
    mutable uint32_t index_hint_ = 0;
    Node* parent_ = nullptr;
    Document* document_;
    layout::HandlePtr layout_node_;
    NodeChildren children_;
    UniquePtr<NodeRareData, MemoryTag::DOM> rare_;
    qsl::RefPtr<NodeLink> link_;
};
// Every node of a page pays for a word more.
static_assert(sizeof(Node) == 104);

}  // namespace qorvex::dom
