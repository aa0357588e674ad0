#include "dom/node.h"

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "dom/attr.h"
#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/element.h"
#include "dom/event.h"
#include "dom/node_list.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

namespace {
// A document counts its nodes, itself excluded; see Document::OnBeforeDestroy.
bool IsItself(const Node* node, const Document& document) {
    return node == static_cast<const Node*>(&document);
}
}  // namespace

Node::Node(Document& document, uint32_t flags, css::TagId tag)
    : tag_(tag), flags_(flags), document_(&document) {
    if (IsItself(this, document)) {
        depth_ = 0;
        return;
    }
    document.CountNode(1);
}

Node::~Node() {
    if (link_) link_->Cut();
    if (layout_node_) layout_node_->data().style = nullptr;
    for (const RefPtr<Node>& child : children_)
        child->parent_ = nullptr;
    if (IsItself(this, *document_)) return;
    document_->ReleaseLater(children_);
    document_->OnNodeDestroyed(*this);
}

const css::LaidOutStyle& Node::GetLaidOutStyle() const {
    const css::LaidOutStyle* own = GetOwnLaidOutStyle();
    return own ? *own : document_->GetDefaultStyle();
}

Atom Node::GetNodeName() const {
    return document_->GetTagName(tag_);
}

// https://dom.spec.whatwg.org/#dom-node-nodetype
int Node::GetNodeType() const {
    if (Is(kIsDocument)) return 9;
    if (Is(kIsElement)) return 1;
    if (Is(kIsAttr)) return 2;
    if (Is(kIsText)) return 3;
    if (Is(kIsComment)) return 8;
    if (Is(kIsDocumentType)) return 10;
    if (Is(kIsFragment)) return 11;
    return 1;
}

Element* Node::GetParentElement() const {
    return parent_ && parent_->IsElement() && !parent_->Is(kIsDocument) ? static_cast<Element*>(parent_)
                                                                        : nullptr;
}

Document* Node::GetOwnerDocument() const {
    return Is(kIsDocument) ? nullptr : document_;
}

size_t Node::GetIndexInParent() const {
    if (!parent_) return kNoIndex;
    const NodeChildren& siblings = parent_->children_;
    const size_t count = siblings.size();
    if (index_hint_ < count && siblings[index_hint_] == this) return index_hint_;
    if (count > 0 && siblings.front() == this) return index_hint_ = 0;
    return FindIndexInParent();
}

// Removals before this node shift it down, insertions shift it up: it is looked for around the last known
// place. Where many came or went it is far from there and so are its neighbours: then all are told their
// places, so that asking each of n siblings costs n.
size_t Node::FindIndexInParent() const {
    constexpr size_t kNear = 64;
    const NodeChildren& siblings = parent_->children_;
    const size_t count = siblings.size();
    const size_t guess = std::min<size_t>(index_hint_, count);
    document_->work.siblingsSearched += kNear;
    for (size_t distance = 1; distance <= kNear; ++distance) {
        if (guess + distance < count && siblings[guess + distance] == this)
            return index_hint_ = static_cast<uint32_t>(guess + distance);
        if (distance <= guess && siblings[guess - distance] == this)
            return index_hint_ = static_cast<uint32_t>(guess - distance);
    }
    document_->work.siblingsSearched += count;
    for (size_t i = 0; i < count; ++i)
        siblings[i]->index_hint_ = static_cast<uint32_t>(i);
    return index_hint_ < count && siblings[index_hint_] == this ? index_hint_ : kNoIndex;
}

Node* Node::GetPreviousSibling() const {
    const size_t index = GetIndexInParent();
    if (index == kNoIndex || index == 0) return nullptr;
    Node* sibling = parent_->children_[index - 1].get();
    sibling->index_hint_ = static_cast<uint32_t>(index - 1);
    return sibling;
}

Node* Node::GetNextSibling() const {
    const size_t index = GetIndexInParent();
    if (index == kNoIndex || index + 1 >= parent_->children_.size()) return nullptr;
    Node* sibling = parent_->children_[index + 1].get();
    sibling->index_hint_ = static_cast<uint32_t>(index + 1);
    return sibling;
}

Element* Node::GetPreviousElementSibling() const {
    Node* node = GetPreviousSibling();
    while (node && !node->IsElement())
        node = node->GetPreviousSibling();
    return static_cast<Element*>(node);
}

Element* Node::GetNextElementSibling() const {
    Node* node = GetNextSibling();
    while (node && !node->IsElement())
        node = node->GetNextSibling();
    return static_cast<Element*>(node);
}

Node& Node::GetRootNode() {
    Node* root = this;
    while (root->parent_)
        root = root->parent_;
    return *root;
}

Node* Node::GetNextSkippingChildren(const Node* root) const {
    for (const Node* node = this; node && node != root; node = node->parent_)
        if (Node* next = node->GetNextSibling()) return next;
    return nullptr;
}

Node* Node::GetNextInTree(const Node* root) const {
    if (Node* child = GetFirstChild()) {
        child->index_hint_ = 0;
        return child;
    }
    return GetNextSkippingChildren(root);
}

bool Node::Contains(const Node* other) const {
    // A connected node knows how deep it lies, so a walk from it ends at this node's level.
    for (; other && other != this; other = other->parent_)
        if (IsInDocument() && other->IsInDocument() && other->depth_ <= depth_) return false;
    return other == this;
}

NodeText Node::GetTextContent() const {
    // Breadth first: text of a deeper level comes behind that of the level above, unlike on the web.
    NodeText text;
    Vector<const Node*, MemoryTag::DOM> queue;
    queue.push_back(this);
    for (size_t i = 0; i < queue.size(); ++i) {
        const Node* node = queue[i];
        if (node->IsText()) text.append(static_cast<const Text*>(node)->GetData());
        for (const RefPtr<Node>& child : node->children_)
            queue.push_back(child.get());
    }
    return text;
}

bool Node::IsEqualNode(const Node* other) const {
    if (!other) return false;
    // Pairs instead of recursion; flags that tell of the place in the page do not count.
    constexpr uint32_t kPlaceFlags = kInDocument | kInLayoutTree | kBeingRemoved;
    Vector<std::pair<const Node*, const Node*>, MemoryTag::DOM> pairs;
    pairs.push_back({this, other});
    while (!pairs.empty()) {
        const auto [a, b] = pairs.take_back();
        if (a->Is(kIsDocument) || b->Is(kIsDocument)) return false;
        if ((a->flags_ & ~kPlaceFlags) != (b->flags_ & ~kPlaceFlags) || a->tag_ != b->tag_) return false;
        if (a->GetNodeValue() != b->GetNodeValue() || a->GetNodeName() != b->GetNodeName()) return false;
        if (a->children_.size() != b->children_.size()) return false;
        for (size_t i = 0; i < a->children_.size(); ++i)
            pairs.push_back({a->children_[i].get(), b->children_[i].get()});
    }
    return true;
}

// https://dom.spec.whatwg.org/#dom-node-comparedocumentposition
int Node::CompareDocumentPosition(const Node& other) const {
    constexpr int kDisconnected = 1, kPreceding = 2, kFollowing = 4, kContains = 8, kContainedBy = 16,
                  kImplementationSpecific = 32;
    if (this == &other) return 0;
    if (Is(kIsAttr) && other.Is(kIsAttr)) {
        const Element* owner = static_cast<const Attr*>(this)->GetOwnerElement();
        if (owner && owner == static_cast<const Attr&>(other).GetOwnerElement()) return kPreceding;
    }
    if (Contains(&other)) return kContainedBy | kFollowing;
    if (other.Contains(this)) return kContains | kPreceding;
    // The two children of the common ancestor through which the paths run.
    SmallVector<const Node*, 32, MemoryTag::DOM> mine, theirs;
    for (const Node* node = this; node; node = node->parent_)
        mine.push_back(node);
    for (const Node* node = &other; node; node = node->parent_)
        theirs.push_back(node);
    if (mine.back() != theirs.back()) {
        const bool lower = std::less<const Node*>()(&other, this);
        return kDisconnected | kImplementationSpecific | (lower ? kPreceding : kFollowing);
    }
    size_t a = mine.size(), b = theirs.size();
    while (a && b && mine[a - 1] == theirs[b - 1])
        --a, --b;
    return theirs[b - 1]->GetIndexInParent() < mine[a - 1]->GetIndexInParent() ? kPreceding : kFollowing;
}

void Node::CopyCommon(Node& target, bool deep) {
    document_->GetEventListenerTable().Copy(*this, target);
    if (!deep) return;
    // Level by level with a list of its own; each clone is made shallow and then filled.
    Vector<std::pair<RefPtr<Node>, RefPtr<Node>>, MemoryTag::DOM> work;
    work.push_back({RefPtr<Node>(this), RefPtr<Node>(&target)});
    while (!work.empty()) {
        const auto [source, copy] = work.take_back();
        const NodeChildren children = source->children_;
        for (const RefPtr<Node>& child : children) {
            RefPtr<Node> clone = child->CloneNode(false);
            // Past AppendChild, by which a script gathers its source: a clone has the source already.
            copy->InsertBefore(clone, nullptr);
            if (child->HasChildNodes()) work.push_back({child, std::move(clone)});
        }
    }
}

NodeRareData& Node::EnsureRareData() {
    if (!rare_) rare_ = MakeUnique<NodeRareData, MemoryTag::DOM>();
    return *rare_;
}

RefPtr<NodeList> Node::GetChildNodes() {
    RefPtr<NodeList>& list = EnsureRareData().child_nodes;
    if (!list) list = script::MakeHandle<NodeListLive>(*this);
    return list;
}

RefPtr<NodeLink> Node::GetLayoutLink() {
    if (!link_) link_ = qsl::AdoptRef(NodeLink::Take(*this));
    return link_;
}

void Node::SetTextSelectionFlag() {
    for (Node* node = this; node; node = node->GetNextInTree(this)) {
        if (!node->IsText()) continue;
        node->textTransformFlag = 1;
        // Solving goes no further down than what changed, so each text stands for itself.
        document_->MarkNodeDirty(*node);
    }
}

void Node::PostDispatch(Event& event) {
    if (event.GetTarget() != this) return;
    if (event.GetType() == atoms::kMouseenter || event.GetType() == atoms::kMouseleave) OnHoverChanged();
}

}  // namespace qorvex::dom
