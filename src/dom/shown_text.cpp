#include "dom/shown_text.h"

#include "dom/character_data.h"
#include "layout/dom_tasks.h"

namespace qorvex::dom {

qsl::RefPtr<ShownText> ShownText::Make(dom::Text& text, IInternationalizationManager* i18n) {
    return AdoptRef(Take(text, i18n));
}

void ShownText::SetInLayoutTree(bool in_tree) {
    if (text_) text_->SetFlag(kInLayoutTree, in_tree);
}

std::string_view ShownText::DebugName() const {
    return text_ ? text_->GetMarkupName().view() : std::string_view();
}

void ShownText::Receive(layout::DOMTaskKind kind, const layout::DOMTaskData& data) {
    if (!text_) return;
    // Blocks are immutable once sent; the node only shares this one.
    auto& shared = const_cast<layout::DOMTaskData&>(data);
    if (kind == layout::DOMTaskKind::UpdateTextPositionsInDOM)
        text_->TakeTextPositions(qsl::RefPtr(&static_cast<layout::TextPositions&>(shared)));
    else if (kind == layout::DOMTaskKind::UpdateFontStyleDataInDOM)
        text_->TakeFontStyle(qsl::RefPtr(&static_cast<layout::TextFontStyle&>(shared)));
}

}  // namespace qorvex::dom
