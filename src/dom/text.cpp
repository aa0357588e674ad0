#include "core/logging/log.h"
#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/shown_text.h"
#include "dom/text_transform.h"
#include "layout/layout_tree.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

Text::Text(Document& document, std::string_view data)
    : CharacterData(document, kIsText | kDisplayable, data), style_(document.GetDefaultTextStyle()) {}

Text::~Text() {
    if (display_element_) static_cast<ShownText&>(*display_element_).Cut();
}

layout::HandlePtr Text::CreateLayoutNode(layout::LayoutTree& tree, layout::LayoutHandle& parent) {
    if (!display_element_) return nullptr;
    AdoptLayoutHandle(tree.AddChild(parent, FindLayoutIndex(parent),
                                    {.style = *style_,
                                     .display = display_element_,
                                     .link = layout::NodeLinkPtr(&static_cast<ShownText&>(*display_element_)),
                                     .scroll = {}}));
    return layout::HandlePtr(GetLayoutHandle());
}

void Text::ResetStyle() {
    SetStyle(GetDocument()->GetDefaultTextStyle());
}

void Text::SetStyle(css::SharedStylePtr style) {
    style_ = std::move(style);
    // The former record may be gone.
    layout::LayoutHandle* handle = GetLayoutHandle();
    if (handle && handle->data().style) handle->data().style = style_.get();
}

void Text::ToDebugString(NodeText& out) const {
    out.append("Text [");
    out.append(GetData().substr(0, 16));
    out.append("...]");
}

RefPtr<Node> Text::CloneNode(bool deep) {
    RefPtr<Text> clone = script::MakeHandle<Text>(*GetDocument(), GetData());
    CopyCommon(*clone, deep);
    return clone;
}

RefPtr<Text> Text::SplitText(size_t offset) {
    if (offset > GetData().size()) return nullptr;
    RefPtr<Text> rest = script::MakeHandle<Text>(*GetDocument(), GetData().substr(offset));
    if (Node* parent = GetParent()) parent->InsertBefore(rest, GetNextSibling());
    DeleteData(offset, GetData().size());
    return rest;
}

void Text::OnInsertedIntoDocument() {
    ForgetTransformedText();
    CharacterData::OnInsertedIntoDocument();
    if (!display_element_) {
        display_element_ = ShownText::Make(*this, GetDocument()->GetHost().GetInternationalizationManager());
    }
    GetDocument()->QueueTextCommit(*this);
}

void Text::OnComputedStyleChanged() {
    UpdateTransformedText();
    if (IsInDocument()) GetDocument()->QueueTextCommit(*this);
}

void Text::OnTextChanged() {
    UpdateTransformedText();
    if (!IsInDocument()) return;
    GetDocument()->QueueTextCommit(*this);
    MarkLayoutDirty();
}

void Text::ForgetTransformedText() {
    if (NodeRareData* rare = GetRareData()) rare->transformed_text.reset();
}

void Text::UpdateTransformedText() {
    if (!IsInDocument()) return;
    NodeText transformed;
    switch (TransformText(GetStyle(), *GetDocument(), GetData(), transformed)) {
        case TextTransformResult::NotWanted:
            ForgetTransformedText();
            break;
        case TextTransformResult::Failed:
            break;  // what was shown stays
        case TextTransformResult::Done:
            EnsureRareData().transformed_text = MakeUnique<NodeText, MemoryTag::DOM>(std::move(transformed));
            break;
    }
}

const layout::TextPositions* Text::GetTextPositions() const {
    if (!font_style_) {
        LogError("Failed to calculate text positions! Font style data is missing.");
        return nullptr;
    }
    return positions_.get();
}

void Text::CommitDisplayedText() {
    if (display_element_) static_cast<dsp::DisplayText&>(*display_element_).SetText(GetDisplayedText());
}

}  // namespace qorvex::dom
