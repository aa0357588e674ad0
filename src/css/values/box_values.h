// Value records of the box: flex, containment, radii and the small numbers of the visual group.
#pragma once

#include <cstdint>

#include "css/values/css_containers.h"
#include "css/values/length.h"

namespace qorvex::css {

enum class FlexBasisKind : uint8_t { Initial = 0, Inherit = 1, Auto = 2, Length = 3 };

struct CSSFlexValue {
    bool inherit = false;
    bool hasGrow = false;
    bool hasShrink = false;
    FlexBasisKind basisKind = FlexBasisKind::Auto;
    float grow = 0;
    float shrink = 0;
    Length basis;

    friend bool operator==(const CSSFlexValue&, const CSSFlexValue&) = default;
};

enum ContainmentBits : uint8_t {
    kContainSize = 1,
    kContainLayout = 2,
    kContainStyle = 4,
    kContainPaint = 8,
    kContainContent = kContainLayout | kContainStyle | kContainPaint,
    kContainStrict = kContainContent | kContainSize,
};

struct Containment {
    uint8_t bits = 0;
    friend bool operator==(const Containment&, const Containment&) = default;
};

struct BorderRadius {
    Length horizontal;
    Length vertical;
    friend bool operator==(const BorderRadius&, const BorderRadius&) = default;
};

struct Opacity {
    float value = 1;
    friend bool operator==(const Opacity&, const Opacity&) = default;
};

struct FloatParam {
    float value = 0;
    friend bool operator==(const FloatParam&, const FloatParam&) = default;
};

struct StringParam {
    CssString value;
    bool empty() const { return value.empty(); }
    friend bool operator==(const StringParam&, const StringParam&) = default;
};

}  // namespace qorvex::css
