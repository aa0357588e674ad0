// Colours stay floats from the parser onward; values of the wide-gamut spaces may lie outside 0 to 1.
#pragma once

#include <cstdint>
#include <string_view>

namespace qorvex::css {

// Non-premultiplied.
struct Color {
    float alpha = 0;
    float blue = 0;
    float green = 0;
    float red = 0;

    static constexpr Color Rgba(float r, float g, float b, float a = 1) { return {a, b, g, r}; }
    static constexpr Color Transparent() { return {}; }
    static constexpr Color Black() { return Rgba(0, 0, 0); }
    static constexpr Color White() { return Rgba(1, 1, 1); }
    // Left open by the standard (a system colour); a mid blue is legible under white text.
    static constexpr Color SelectionBackground() { return Rgba(51 / 255.0f, 144 / 255.0f, 1); }
    constexpr bool IsTransparent() const { return alpha <= 0; }
    friend constexpr bool operator==(const Color&, const Color&) = default;
};

enum class ColorKind : uint32_t { Color = 0, CurrentColor = 1, Initial = 2 };

// A colour that may follow the element's own `color`: border sides and shadows.
struct BorderColor {
    ColorKind kind = ColorKind::CurrentColor;
    Color color;

    static constexpr BorderColor Of(Color color) { return {ColorKind::Color, color}; }
    constexpr Color Resolve(const Color& currentColor) const {
        return kind == ColorKind::Color ? color : currentColor;
    }
    friend constexpr bool operator==(const BorderColor&, const BorderColor&) = default;
};

// Hexadecimal, rgb(), rgba(), color(), and the named colours of CSS Color Module Level 3.
[[nodiscard]] bool ParseColor(std::string_view text, Color& out);

}  // namespace qorvex::css
