// Value records of shadows, filters and the cursor.
#pragma once

#include <array>
#include <cstdint>

#include "css/values/color.h"
#include "css/values/css_containers.h"
#include "css/values/keywords.h"
#include "css/values/length.h"

namespace qorvex::css {

struct ShadowItem {
    Length offsetX;
    Length offsetY;
    Length blur;
    Length spread;       // always 0 of a text shadow
    bool inset = false;  // always false of a text shadow
    BorderColor color;
    friend bool operator==(const ShadowItem&, const ShadowItem&) = default;
};

using BoxShadowListType = ValueList<ShadowItem, struct BoxShadowTag>;
using TextShadowListType = ValueList<ShadowItem, struct TextShadowTag>;

// The numbers are those of the rendering library's filter records.
enum class FilterKind : uint8_t {
    Blur = 1,
    Brightness = 2,
    Contrast = 3,
    DropShadow = 4,
    Grayscale = 5,
    HueRotate = 6,
    Invert = 7,
    Opacity = 8,
    Saturate = 9,
    Sepia = 10,
    ColorMatrix = 11,
    AxisBlur = 12,
};

struct FilterFunction {
    FilterKind kind = FilterKind::Blur;
    bool isPercent = false;             // `amount` was written as a percentage
    float amount = 0;                   // of the one-number functions; degrees of hue-rotate
    Length radiusX;                     // blur and qor-axis-blur
    Length radiusY;                     // qor-axis-blur
    ShadowItem shadow;                  // drop-shadow
    std::array<float, 20> matrix = {};  // qor-color-matrix, row by row: r, g, b, a, offset

    // The amount as a plain number.
    float Amount() const { return isPercent ? amount / 100 : amount; }
    friend bool operator==(const FilterFunction&, const FilterFunction&) = default;
};

using FilterListType = ValueList<FilterFunction, struct FilterTag>;

struct CursorProperty {
    CursorType type = CursorType::Auto;  // the fallback word when there is a url, Url when none followed it
    CssString url;
    friend bool operator==(const CursorProperty&, const CursorProperty&) = default;
};

}  // namespace qorvex::css
