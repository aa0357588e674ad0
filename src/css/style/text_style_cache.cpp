#include "css/style/text_style_cache.h"

#include "css/values/property_traits.h"

namespace qorvex::css {
namespace {

template <class Visitor>
void ForEachTextVisual(Visitor&& visit) {
    visit(&VisualStyle::visibility);
    visit(&VisualStyle::textShadow);
    visit(&VisualStyle::userSelect);
    visit(&VisualStyle::pointerEvents);
    visit(&VisualStyle::cursor);
    visit(&VisualStyle::selectionBackgroundColor);
}

bool LooksLike(const VisualStyle& text, const VisualStyle& parent) {
    bool same = true;
    ForEachTextVisual([&](auto field) { same = same && text.*field == parent.*field; });
    return same;
}

}  // namespace

const StyleHandle<LayoutStyle>& TextStyleCache::LayoutFor(CSSDisplay display, uint8_t textKind) {
    StyleHandle<LayoutStyle>& handle =
        layouts_[static_cast<size_t>(display) % kDisplays][textKind % kTextKinds];
    if (!handle) {
        handle = DefaultStyles().layout;
        LayoutStyle& layout = handle.MakeMutable();
        layout.display = display;
        layout.textKind = textKind;
    }
    return handle;
}

const StyleHandle<VisualStyle>& TextStyleCache::VisualFor(const VisualStyle& parent) {
    if (LooksLike(*DefaultStyles().visual, parent)) return DefaultStyles().visual;
    for (const StyleHandle<VisualStyle>& known : visuals_) {
        if (known && LooksLike(*known, parent)) return known;
    }
    StyleHandle<VisualStyle>& made = visuals_[nextVisual_++ % kVisuals];
    made = DefaultStyles().visual;
    VisualStyle& visual = made.MakeMutable();
    ForEachTextVisual([&](auto field) { visual.*field = parent.*field; });
    return made;
}

}  // namespace qorvex::css
