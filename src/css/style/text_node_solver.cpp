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

template <class Group>
bool Take(LaidOutStyle& style, StyleHandle<Group>& own, const StyleHandle<Group>& group) {
    if (own == group) return false;
    own = group;
    style.written.Add(kGroupOf<Group>);
    return true;
}

uint32_t TakeParentText(LaidOutStyle& style, const LaidOutStyle& parent, TextStep& step) {
    if (style.text == parent.text) return 0;
    const uint32_t mask = step.MaskOfText(style.text, parent.text);
    Take(style, style.text, parent.text);
    return mask;
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
    LaidOutStyle& style = text.GetStyle();
    uint32_t mask = dom::kChangeSolved;
    const CSSDisplay display = parent.layout->display;
    if (parentDirty.Intersects(kOutsideTextGroup)) {
        // Below a parent without display the kind stays what it was: nothing is laid out, and nothing
        // changes.
        const uint8_t kind =
            display == CSSDisplay::None ? style.layout->textKind : TextKindOf(parent.text->whiteSpace);
        if (Take(style, style.layout, run.textStyles.LayoutFor(display, kind))) mask |= dom::kChangeLayout;
        if (Take(style, style.visual, run.textStyles.VisualFor(*parent.visual))) mask |= dom::kChangeVisual;
    }
    mask |= TakeParentText(style, parent, run.textStep);
    if (style.written.Has(StyleGroup::Transform)) mask |= dom::kChangeTransform;

    const bool inLayout = text.Is(dom::kInLayoutTree);
    if (display != CSSDisplay::None && !inLayout) mask |= dom::kChangeEnteredLayout | dom::kChangeLayout;
    if (display == CSSDisplay::None && inLayout) mask |= dom::kChangeLeftLayout | dom::kChangeLayout;
    return mask;
}

}  // namespace qorvex::css
