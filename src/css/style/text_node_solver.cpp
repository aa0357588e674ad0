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

// Colours change what is painted and no glyph's place, so a text that only changes colour is not laid out
// again.
bool DiffersInLayout(const TextLayoutStyle& a, const TextLayoutStyle& b) {
    bool same = static_cast<const TextLayoutDerived&>(a) == static_cast<const TextLayoutDerived&>(b);
#define QORVEX_ROW(id, name, type, parser, field, ...)                                          \
    if (PropertyId::id != PropertyId::Color && PropertyId::id != PropertyId::TextStrokeColor && \
        PropertyId::id != PropertyId::SelectionColor)                                           \
        same = same && a.field == b.field;
    QORVEX_CSS_TEXT_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
    return !same;
}

template <class Group>
bool Take(LaidOutStyle& style, StyleHandle<Group>& own, const StyleHandle<Group>& group) {
    if (own == group) return false;
    own = group;
    style.written.Add(kGroupOf<Group>);
    return true;
}

uint32_t TakeParentText(LaidOutStyle& style, const LaidOutStyle& parent) {
    const StyleHandle<TextLayoutStyle> old = style.text;
    if (!Take(style, style.text, parent.text)) return 0;
    uint32_t mask = dom::kChangeVisual;
    if (DiffersInLayout(*old, *parent.text)) mask |= dom::kChangeLayout;
    if (old->textTransform != parent.text->textTransform) mask |= dom::kChangeTextTransform;
    return mask;
}

}  // namespace

uint32_t SolveTextNode(dom::Text& text, StyleRun& run) {
    ++run.counters.textNodesSolved;
    const LaidOutStyle& parent = text.GetParent()->GetLaidOutStyle();
    LaidOutStyle& style = text.GetStyle();
    uint32_t mask = dom::kChangeSolved;
    const CSSDisplay display = parent.layout->display;
    // Below a parent without display the kind stays what it was: nothing is laid out, and nothing changes.
    const uint8_t kind =
        display == CSSDisplay::None ? style.layout->textKind : TextKindOf(parent.text->whiteSpace);
    if (Take(style, style.layout, run.textStyles.LayoutFor(display, kind))) mask |= dom::kChangeLayout;
    mask |= TakeParentText(style, parent);
    if (Take(style, style.visual, run.textStyles.VisualFor(*parent.visual))) mask |= dom::kChangeVisual;
    if (style.written.Has(StyleGroup::Transform)) mask |= dom::kChangeTransform;

    const bool inLayout = text.Is(dom::kInLayoutTree);
    if (display != CSSDisplay::None && !inLayout) mask |= dom::kChangeEnteredLayout | dom::kChangeLayout;
    if (display == CSSDisplay::None && inLayout) mask |= dom::kChangeLeftLayout | dom::kChangeLayout;
    return mask;
}

}  // namespace qorvex::css
