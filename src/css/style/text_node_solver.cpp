#include "css/style/text_node_solver.h"

namespace qorvex::css {
namespace {

using dom::ChangeMask;

uint8_t TextKindOf(WhiteSpaceMode mode) {
    switch (mode) {
        case WhiteSpaceMode::NoWrap:
            return 3;
        case WhiteSpaceMode::Pre:
            return 2;
        default:
            return 1;
    }
}

// What a text takes from its parent in groups other than the text group.
constexpr PropertySet kOutsideTextGroup = [] {
    PropertySet set;
    for (const PropertyId id : {PropertyId::Display, PropertyId::WhiteSpace, PropertyId::Visibility,
                                PropertyId::TextShadow, PropertyId::UserSelect, PropertyId::PointerEvents,
                                PropertyId::Cursor, PropertyId::SelectionBackgroundColor})
        set.Add(id);
    return set;
}();

}  // namespace

uint32_t SolveTextNode(dom::Text& text, const PropertySet& parentDirty, StyleRun& run) {
    ++run.counters.textNodesSolved;
    const LaidOutStyle& parent = text.GetParent()->GetLaidOutStyle();
    const LaidOutStyle& style = text.GetStyle();
    WrittenGroups& written = *text.GetWrittenGroups();
    uint32_t mask = dom::kChangeSolved;
    const CSSDisplay display = parent.layout->display;
    const StyleHandle<LayoutStyle>* layout = &style.layout;
    const StyleHandle<VisualStyle>* visual = &style.visual;
    if (parentDirty.Intersects(kOutsideTextGroup)) {
        // Below a parent without display the kind stays what it was: nothing is laid out, and nothing
        // changes.
        const uint8_t kind =
            display == CSSDisplay::None ? style.layout->textKind : TextKindOf(parent.text->whiteSpace);
        layout = &run.textStyles.LayoutFor(display, kind);
        visual = &run.textStyles.VisualFor(*parent.visual);
    }
    const bool newLayout = !(*layout == style.layout), newVisual = !(*visual == style.visual);
    const bool newText = !(parent.text == style.text);
    if (newLayout) {
        written.Add(StyleGroup::Layout);
        mask |= dom::kChangeLayout;
    }
    if (newVisual) {
        written.Add(StyleGroup::Visual);
        mask |= dom::kChangeVisual;
    }
    if (newText) {
        written.Add(StyleGroup::TextLayout);
        mask |= run.textStep.MaskOfText(style.text, parent.text);
    }
    if (newLayout || newVisual || newText)
        text.SetStyle(run.textStyles.Records().Get(style, *layout, *visual, parent.text));
    if (written.Has(StyleGroup::Transform)) mask |= dom::kChangeTransform;

    const bool inLayout = text.Is(dom::kInLayoutTree);
    if (display != CSSDisplay::None && !inLayout) mask |= dom::kChangeEnteredLayout | dom::kChangeLayout;
    if (display == CSSDisplay::None && inLayout) mask |= dom::kChangeLeftLayout | dom::kChangeLayout;
    return mask;
}

}  // namespace qorvex::css
