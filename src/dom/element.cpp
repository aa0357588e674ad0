#include "dom/element.h"

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "core/memory/temp_vector.h"
#include "dom/document.h"
#include "dom/dom_rect.h"
#include "dom/event.h"
#include "dom/node_list.h"
#include "dom/style_engine.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

Element::Element(Document& document, css::TagId tag, uint32_t extra_flags)
    : Node(document, kIsElement | extra_flags, tag), dirty_properties_(css::PropertySet::All()) {
    // The document has no default style yet while it is constructed itself.
    if (static_cast<Element*>(&document) != this) style_ = document.GetDefaultStyle();
}

void Element::ResetStyle() {
    style_ = GetDocument()->GetDefaultStyle();
}

void Element::ToDebugString(NodeText& out) const {
    out.append("HTML");
    out.append(css::TagName(GetTag()));
    out.append("Element");
}

RefPtr<Node> Element::CloneNode(bool deep) {
    RefPtr<Element> clone = script::MakeHandle<Element>(*GetDocument(), GetTag());
    CopyElementTo(*clone);
    CopyCommon(*clone, deep);
    return clone;
}

void Element::CopyElementTo(Element& target) {
    // Through SetAttribute, so that the target's class reacts as it does to a page's own attributes.
    ForEachAttribute([&](std::string_view name, std::string_view value) {
        if (name != "style" && !name.starts_with("data-")) target.SetAttribute(name, value);
        return true;
    });
    // Data attributes are copied as they are: what they brought about, a translation for one, is among the
    // children already.
    if (!GetDataset().empty()) target.EnsureRareData().dataset = GetRareData()->dataset;
    // Declarations are copied as they are: some have no text form that gives the same value back.
    if (inline_style_) target.EnsureInlineStyle() = *inline_style_;
    if (const css::StyleDeclarationSet* extra = GetExtraStyle()) target.EnsureExtraStyle() = *extra;
}

void Element::OnInsertedIntoDocument() {
    Node::OnInsertedIntoDocument();
    dirty_properties_ = css::PropertySet::All();
    GetDocument()->ElementConnected(*this);
}

void Element::OnRemovedFromDocument() {
    Blur();
    if (const css::StyleHandle<css::VisualStyle>& visual = GetStyle().visual)
        if (!visual->compositionId.empty())
            GetDocument()->AddRemovedCompositionId(visual->compositionId.value);
}

void Element::OnSubtreeRemoved() {
    GetDocument()->ElementDisconnected(*this);
    Node::OnSubtreeRemoved();
}

// --- Style marks

void Element::ClearStyleSolved() {
    Node::ClearStyleSolved();
    dirty_properties_ = css::PropertySet::All();
}

void Element::MarkStyleDirty() {
    if (!IsInDocument()) return;
    Document& document = *GetDocument();
    if (document.NeedsFullStyleSolve()) return;  // the whole tree is matched anyway
    document.MarkSelectorDirty(*this);
    document.MarkNodeDirty(*this);
    if (document.AreComplexSelectorsEnabled() && document.GetStyleEngine().SubtreeInvalidatingRules() > 0)
        QueueDependents();
}

// Whatever a rule with a combinator may reach from this element is queued: its subtree, and the siblings
// behind it with theirs when a rule looks at siblings. Who is queued was queued together with all that stood
// below and behind it, and what came there since is matched anyway; so a walk ends where another one began,
// and a script that dirties n siblings costs n steps.
void Element::QueueDependents() {
    if (pendingStyleBits & kQueuedForMatching) return;
    Document& document = *GetDocument();
    TempMark mark;
    TempVector<Node*> queue;
    queue.push_back(this);
    Node* parent = GetParent();
    if (parent && parent->GetChildCount() > 1 && document.GetStyleEngine().SiblingInvalidatingRules() > 0) {
        const auto siblings = parent->GetChildren();
        for (size_t i = GetIndexInParent() + 1; i < siblings.size(); ++i) {
            if (siblings[i]->pendingStyleBits & kQueuedForMatching) break;
            queue.push_back(siblings[i].get());
        }
    }
    for (size_t i = 0; i < queue.size(); ++i) {
        Node& node = *queue[i];
        if ((node.pendingStyleBits & kQueuedForMatching) || !node.IsInDocument() || !node.IsElement())
            continue;
        document.MarkSelectorDirty(static_cast<Element&>(node));
        document.MarkNodeDirty(node);
        node.pendingStyleBits |= kQueuedForMatching;
        for (const RefPtr<Node>& child : node.GetChildren())
            queue.push_back(child.get());
    }
    document.work.dependentsVisited += queue.size();
}

void Element::MarkPseudoDependentChain(uint16_t bits) {
    if (!IsInDocument()) return;
    for (Node* node = this; node && !node->Is(kIsDocument); node = node->GetParent())
        if (node->pendingStyleBits & bits) node->MarkStyleDirty();
}

// --- Queries

RefPtr<HTMLCollection> Element::GetElementsByTagName(std::string_view name) {
    return GetDocument()->GetElementsByTagName(*this, name);
}

RefPtr<HTMLCollection> Element::GetElementsByClassName(std::string_view name) {
    return GetDocument()->GetElementsByClassName(*this, name);
}

Element* Element::QuerySelector(std::string_view selector) {
    return GetDocument()->GetStyleEngine().QuerySelector(*this, selector);
}

RefPtr<NodeListStatic> Element::QuerySelectorAll(std::string_view selector) {
    Vector<Element*, MemoryTag::DOM> matches;
    GetDocument()->GetStyleEngine().QuerySelectorAll(*this, selector, matches);
    RefPtr<NodeListStatic> list = script::MakeHandle<NodeListStatic>();
    for (Element* element : matches)
        list->Add(*element);
    return list;
}

bool Element::Matches(std::string_view selector) {
    return GetDocument()->GetStyleEngine().Matches(*this, selector);
}

Element* Element::Closest(std::string_view selector) {
    return GetDocument()->GetStyleEngine().Closest(*this, selector);
}

Element* Element::GetFirstElementChild() const {
    for (const RefPtr<Node>& child : GetChildren())
        if (child->IsElement()) return static_cast<Element*>(child.get());
    return nullptr;
}

Element* Element::GetLastElementChild() const {
    const auto children = GetChildren();
    for (size_t i = children.size(); i-- > 0;)
        if (children[i]->IsElement()) return static_cast<Element*>(children[i].get());
    return nullptr;
}

size_t Element::GetChildElementCount() const {
    const auto children = GetChildren();
    return static_cast<size_t>(std::count_if(children.begin(), children.end(),
                                             [](const RefPtr<Node>& child) { return child->IsElement(); }));
}

RefPtr<HTMLCollection> Element::GetChildElements() {
    RefPtr<HTMLCollection> list = script::MakeHandle<HTMLCollection>();
    for (const RefPtr<Node>& child : GetChildren())
        if (child->IsElement()) list->Add(*child);
    return list;
}

// --- Geometry

layout::Rect Element::GetBoundingBox() const {
    const layout::BoxResult* box = GetBoxResult();
    return box ? box->viewBox : layout::MakeRect(0, 0, 0, 0);
}

RefPtr<DOMRect> Element::GetBoundingClientRect() {
    const layout::Rect box = GetBoundingBox();
    return script::MakeHandle<DOMRect>(box.x, box.y, box.width, box.height);
}

// --- Focus and events

void Element::Focus() {
    GetDocument()->SetFocusedElement(HasTabIndex() ? this : nullptr);
}

void Element::Blur() {
    if (GetDocument()->GetFocusedElement() == this) GetDocument()->SetFocusedElement(nullptr);
}

bool Element::PreDispatch(Event& event) {
    if (event.IsScriptConstructed()) return true;
    // Input events, which are what a client may stop here, come with input routing.
    return true;
}

void Element::PostDispatch(Event& event) {
    Node::PostDispatch(event);
    if (event.GetTarget() == this && (event.GetType() == atoms::kFocus || event.GetType() == atoms::kBlur))
        OnPseudoStateChanged();
}

}  // namespace qorvex::dom
