// Value records of images and what places them: backgrounds, masks, border images, gradients.
#pragma once

#include <array>
#include <cstdint>

#include "css/values/color.h"
#include "css/values/css_containers.h"
#include "css/values/keywords.h"
#include "css/values/length.h"
#include "css/values/shared_value.h"

namespace qorvex::css {

enum class GradientKind : uint8_t { Linear = 0, Radial = 1, RepeatingLinear = 2, RepeatingRadial = 3 };

struct GradientStop {
    Color color;
    bool hasPosition = false;
    Length position;
    friend bool operator==(const GradientStop&, const GradientStop&) = default;
};

enum GradientSideBits : uint8_t { kSideTop = 1, kSideRight = 2, kSideBottom = 4, kSideLeft = 8 };

enum class GradientShape : uint8_t { Ellipse, Circle };

// Immutable once parsed; the layout side reads it from shared styles.
struct Gradient : SharedValue<Gradient> {
    GradientKind kind = GradientKind::Linear;
    // Linear: towards the sides in `sides`, or at `angle` degrees (0 points up, clockwise) when that is 0.
    uint8_t sides = 0;
    float angle = 180;
    // Radial: sized by keyword unless `hasExplicitSize`; a circle has both radii equal.
    GradientShape shape = GradientShape::Ellipse;
    GradientSize size = GradientSize::FarthestCorner;
    bool hasExplicitSize = false;
    Length radiusX, radiusY;
    Length centerX = Length::Percent(50);
    Length centerY = Length::Percent(50);
    CssVector<GradientStop> stops;

    bool IsRadial() const { return kind == GradientKind::Radial || kind == GradientKind::RepeatingRadial; }
    bool IsRepeating() const { return kind >= GradientKind::RepeatingLinear; }
    bool SameAs(const Gradient& other) const;
};

enum class ImageKind : uint8_t {
    None,
    Initial,
    Url,
    LinearGradient,
    RadialGradient,
    RepeatingLinearGradient,
    RepeatingRadialGradient,
};

struct ImageValue {
    ImageKind kind = ImageKind::None;
    CssString url;                    // as written, without url( ) and quotes
    RefPtr<const Gradient> gradient;  // of the four gradient kinds

    bool IsGradient() const { return kind >= ImageKind::LinearGradient; }
    friend bool operator==(const ImageValue& a, const ImageValue& b) {
        if (a.kind != b.kind || a.url != b.url) return false;
        return a.gradient == b.gradient || (a.gradient && b.gradient && a.gradient->SameAs(*b.gradient));
    }
};

using ImageValueList = ValueList<ImageValue, struct ImageListTag>;

// Keywords become percentages: left and top 0%, center 50%, right and bottom 100%.
using BackgroundPositionList = ValueList<Length, struct PositionListTag>;

struct BackgroundPosition {
    Length x = Length::Percent(0);
    Length y = Length::Percent(0);
    friend bool operator==(const BackgroundPosition&, const BackgroundPosition&) = default;
};

enum class BackgroundSizeMode : uint32_t { Size = 0, Cover = 1, Contain = 2 };

struct BackgroundSize {
    BackgroundSizeMode mode = BackgroundSizeMode::Size;
    Extent width;  // Auto or Length, like the height
    Extent height;
    friend bool operator==(const BackgroundSize&, const BackgroundSize&) = default;
};

using BackgroundSizeListType = ValueList<BackgroundSize, struct SizeListTag>;

// Space is never stored: it falls back to Round with a warning.
struct BackgroundRepeatType {
    RepeatMode x = RepeatMode::Repeat;
    RepeatMode y = RepeatMode::Repeat;

    static constexpr BackgroundRepeatType None() { return {RepeatMode::NoRepeat, RepeatMode::NoRepeat}; }
    friend bool operator==(const BackgroundRepeatType&, const BackgroundRepeatType&) = default;
};

using BackgroundRepeatList = ValueList<BackgroundRepeatType, struct RepeatListTag>;

// The four sides of the border image records run top, right, bottom, left.
struct BorderImageSliceType {
    struct Side {
        float value = 100;
        bool isPercent = true;
        friend bool operator==(const Side&, const Side&) = default;
    };
    std::array<Side, 4> sides;
    bool fill = false;
    friend bool operator==(const BorderImageSliceType&, const BorderImageSliceType&) = default;
};

enum class NumberOrLengthKind : uint32_t { Number = 0, Length = 1, Auto = 2 };

struct NumberOrLength {
    NumberOrLengthKind kind = NumberOrLengthKind::Number;
    Length length;  // of a Number only the value counts

    static constexpr NumberOrLength Number(float value) {
        return {NumberOrLengthKind::Number, Length::Pixels(value)};
    }
    friend bool operator==(const NumberOrLength&, const NumberOrLength&) = default;
};

// A number is a multiple of the border width.
struct BorderImageWidthType {
    std::array<NumberOrLength, 4> sides{NumberOrLength::Number(1), NumberOrLength::Number(1),
                                        NumberOrLength::Number(1), NumberOrLength::Number(1)};
    friend bool operator==(const BorderImageWidthType&, const BorderImageWidthType&) = default;
};

struct BorderImageOutsetType {
    std::array<NumberOrLength, 4> sides{};
    friend bool operator==(const BorderImageOutsetType&, const BorderImageOutsetType&) = default;
};

// Space is never stored: it falls back to Repeat with a warning.
struct BorderImageRepeatType {
    BorderImageRepeatMode x = BorderImageRepeatMode::Stretch;
    BorderImageRepeatMode y = BorderImageRepeatMode::Stretch;
    friend bool operator==(const BorderImageRepeatType&, const BorderImageRepeatType&) = default;
};

}  // namespace qorvex::css
