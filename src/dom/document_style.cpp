// Who has to be matched and solved again, and the lists in which a solve leaves what it changed.

#include "dom/document.h"
#include "dom/style_engine.h"
#include "dom/style_sheet_list.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

void StyleRunLists::Clear() {
    for (NodeList* list :
         {&leftLayout, &enteredLayout, &animation, &transition, &transitionTargets, &textTransform})
        list->clear();
}

void Document::MarkNodeDirty(Node& node) {
    if (node.IsInDocument()) style_dirty_nodes_.insert(&node);
}

void Document::MarkSelectorDirty(Element& element) {
    if (element.IsInDocument()) selector_dirty_elements_.insert(&element);
}

void Document::SolveStyles() {
    style_engine_->SolveStyles(*this);
    TakeStyleImages();
}

// After the solve: the client's handler, which may be called here, must not find it half done, and may do
// whatever it likes to the tree.
void Document::TakeStyleImages() {
    if (image_changes_.empty()) return;
    NodeVector changed;
    changed.reserve(image_changes_.size());
    for (Node* node : image_changes_)
        changed.push_back(RefPtr<Node>(node));
    image_changes_.clear();
    for (const RefPtr<Node>& node : changed)
        if (node->IsInDocument() && node->IsElement()) static_cast<Element&>(*node).TakeStyleImages();
}

void Document::NoteStyleChange(Node& node, uint32_t mask) {
    // A node outside the layout has nothing to lay out, but what made it leave is itself such a change.
    if (mask & kChangeLeftLayout) {
        run_lists_.leftLayout.push_back(&node);
    } else if (mask & kChangeEnteredLayout) {
        run_lists_.enteredLayout.push_back(&node);
    }
    if (mask & kChangeLayout) {
        QueueLayoutChange(node);
    } else if (mask & kChangeTransform) {
        QueueTransformChange(node);
    }
    if (mask & kChangeVisual) QueueVisualChange(node);
    if (mask & kChangeAnimation) run_lists_.animation.push_back(&node);
    if (mask & kChangeTransition) run_lists_.transition.push_back(&node);
    if (mask & kChangeTransitionTarget) run_lists_.transitionTargets.push_back(&node);
    if (mask & kChangeImages) image_changes_.insert(&node);
    if (mask & kChangeTextTransform) run_lists_.textTransform.push_back(&node);
}

void Document::AddRemovedCompositionId(std::string_view id) {
    removed_composition_ids_.emplace_back(id);
}

StyleSheetList& Document::GetStyleSheets() {
    if (!style_sheets_) style_sheets_ = script::MakeHandle<StyleSheetList>();
    return *style_sheets_;
}

void Document::AddStyleSheet(Element& owner, css::StylesheetPtr sheet, std::string_view media) {
    GetStyleSheets().Add(owner, sheet);
    style_engine_->AddStyleSheet(*this, &owner, std::move(sheet), media);
    RequestFullStyleSolve();
}

void Document::RemoveStyleSheet(Element& owner) {
    GetStyleSheets().Remove(owner);
    style_engine_->RemoveStyleSheet(*this, &owner);
    RequestFullStyleSolve();
}

}  // namespace qorvex::dom
