// Value records of the transform group.
#pragma once

#include <algorithm>
#include <cstdint>

#include "css/values/css_containers.h"
#include "css/values/length.h"

namespace qorvex::css {

// The numbers are read by the transform pass and by the interpolation. translate() is stored as Translate3d,
// rotate() as RotateZ, every scale function as Scale3d, matrix() as Matrix.
enum class TransformKind : uint8_t {
    TranslateX = 1,
    TranslateY = 2,
    TranslateZ = 3,
    Translate3d = 4,
    RotateX = 5,
    RotateY = 6,
    RotateZ = 7,
    Rotate3d = 8,
    Scale3d = 9,
    SkewX = 10,
    SkewY = 11,
    Matrix = 12,
};

struct TransformOperation {
    TransformKind kind = TransformKind::TranslateX;
    // TranslateX, Y, Z use lengths[0]; Translate3d all three.
    Length lengths[3];
    // Rotate and skew: numbers[0] in degrees. Rotate3d: x, y, z, degrees. Scale3d: x, y, z.
    // Matrix: 16 values in column-major order, as matrix3d() lists them.
    float numbers[16] = {};

    bool IsTranslation() const { return kind <= TransformKind::Translate3d; }
    friend bool operator==(const TransformOperation& a, const TransformOperation& b) {
        if (a.kind != b.kind) return false;
        return a.IsTranslation() ? std::equal(a.lengths, a.lengths + 3, b.lengths)
                                 : std::equal(a.numbers, a.numbers + 16, b.numbers);
    }
};

inline constexpr uint32_t kMaxTransformOperations = 16;

struct Transform {
    CssVector<TransformOperation> operations;

    bool empty() const { return operations.empty(); }
    friend bool operator==(const Transform&, const Transform&) = default;
};

struct TransformOrigin {
    Length x = Length::Percent(50);
    Length y = Length::Percent(50);
    Length z;
    friend bool operator==(const TransformOrigin&, const TransformOrigin&) = default;
};

struct PerspectiveOrigin {
    Length x = Length::Percent(50);
    Length y = Length::Percent(50);
    friend bool operator==(const PerspectiveOrigin&, const PerspectiveOrigin&) = default;
};

enum class PerspectiveKind : uint32_t { None = 0, Length = 1 };

struct Perspective {
    PerspectiveKind kind = PerspectiveKind::None;
    Length length;
    friend bool operator==(const Perspective&, const Perspective&) = default;
};

enum class ZIndexKind : uint32_t { Auto = 0, Value = 1 };

struct ZIndex {
    ZIndexKind kind = ZIndexKind::Auto;
    int32_t value = 0;
    friend bool operator==(const ZIndex&, const ZIndex&) = default;
};

}  // namespace qorvex::css
