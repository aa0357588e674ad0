// Lengths and the records that hold one: all are final after parsing and are resolved to pixels by layout and
// paint.
#pragma once

#include <cstdint>

namespace qorvex::css {

// The numbers are stored in records and read by layout.
enum class LengthUnit : uint32_t {
    Px = 0,
    Percent = 1,
    Vw = 2,
    Vh = 3,
    Vmin = 4,
    Vmax = 5,
    Em = 6,
    Rem = 7,
    In = 8,
    Pt = 9,
};

struct Length {
    LengthUnit unit = LengthUnit::Px;
    float value = 0;

    static constexpr Length Pixels(float value) { return {LengthUnit::Px, value}; }
    static constexpr Length Percent(float value) { return {LengthUnit::Percent, value}; }
    friend constexpr bool operator==(const Length&, const Length&) = default;
};

enum class ExtentKind : uint32_t { Auto = 0, Inherit = 1, Initial = 2, Length = 3 };

// Margins, sizes and offsets. Computed styles hold only Auto and Length.
struct Extent {
    ExtentKind kind = ExtentKind::Auto;
    LengthUnit unit = LengthUnit::Px;
    float value = 0;

    static constexpr Extent Auto() { return {}; }
    static constexpr Extent Of(Length length) { return {ExtentKind::Length, length.unit, length.value}; }
    static constexpr Extent Pixels(float value) { return {ExtentKind::Length, LengthUnit::Px, value}; }
    constexpr bool IsLength() const { return kind == ExtentKind::Length; }
    constexpr Length AsLength() const { return {unit, value}; }
    friend constexpr bool operator==(const Extent&, const Extent&) = default;
};

enum class BorderWidthKind : uint32_t {
    Medium = 0,
    Thin = 1,
    Thick = 2,
    Initial = 3,
    Inherit = 4,
    Length = 5
};

struct BorderWidth {
    BorderWidthKind kind = BorderWidthKind::Medium;
    LengthUnit unit = LengthUnit::Px;
    float value = 0;

    static constexpr BorderWidth Of(Length length) {
        return {BorderWidthKind::Length, length.unit, length.value};
    }
    constexpr Length AsLength() const { return {unit, value}; }
    friend constexpr bool operator==(const BorderWidth&, const BorderWidth&) = default;
};

}  // namespace qorvex::css
