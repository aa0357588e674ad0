#include "css/values/shared_style.h"

namespace qorvex::css {

SharedStyle::SharedStyle(const LaidOutStyle& style) : LaidOutStyle(style) {
    written.Clear();
}

const SharedStylePtr& SharedStyles::Get(const LaidOutStyle& style, const StyleHandle<LayoutStyle>& layout,
                                        const StyleHandle<VisualStyle>& visual,
                                        const StyleHandle<TextLayoutStyle>& text) {
    const auto mix = [](uint64_t hash, const void* group) {
        return (hash ^ reinterpret_cast<uintptr_t>(group)) * 0x9E3779B97F4A7C15u;
    };
    const uint64_t hash = mix(mix(mix(0, layout.get()), visual.get()), text.get());
    SharedStylePtr& place = records_[hash >> (64 - kBits)];
    const bool same = place && place->layout == layout && place->visual == visual && place->text == text &&
                      place->transform == style.transform;
    if (!same) {
        LaidOutStyle wanted = style;
        wanted.layout = layout;
        wanted.visual = visual;
        wanted.text = text;
        place = MakeRef<SharedStyle>(wanted);
    }
    return place;
}

}  // namespace qorvex::css
