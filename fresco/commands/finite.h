// Are all numbers of a record finite? Derived from the field types of the record table.
#pragma once
#include <fresco/command_records.h>
#include <cstring>

namespace fresco {

// A word of a record, loaded by itself. Callers have mostly just written their rectangles and colours word by
// word, and a wider load of those waits until all stores before them have reached the cache.
inline uint32_t WordAt(const void* at) {
    uint32_t word;
    std::memcpy(&word, at, sizeof(word));
    asm("" : "+r"(word));
    return word;
}

// By the bits, which are compared side by side; a sum of floats would wait for each one.
inline bool AllFinite(const float* values, size_t count) {
    constexpr uint32_t kExponent = 0x7F800000u;
    uint32_t others = 0;
    for (size_t i = 0; i < count; ++i) {
        const uint32_t bits = WordAt(values + i);
        others |= static_cast<uint32_t>((bits & kExponent) == kExponent);
    }
    return others == 0;
}

inline bool IsFinite(const uint32_t&) {
    return true;
}
inline bool IsFinite(const float& value) {
    return value * 0.0f == 0.0f;
}
inline bool IsFinite(const PathRef&) {
    return true;
}
inline bool IsFinite(const PixelRef&) {
    return true;
}
inline bool IsFinite(const YuvPlanes&) {
    return true;
}
inline bool IsFinite(const SurfaceDescription&) {
    return true;
}
inline bool IsFinite(const Point& v) {
    return AllFinite(&v.x, 2);
}
inline bool IsFinite(const Rect& v) {
    return AllFinite(&v.x, 5);
}
inline bool IsFinite(const CornerRadii& v) {
    return AllFinite(&v.topLeft.x, 8);
}
inline bool IsFinite(const Quad& v) {
    return AllFinite(&v.points[0].x, 8);
}
inline bool IsFinite(const Quad3& v) {
    return AllFinite(&v.points[0].x, 12);
}
inline bool IsFinite(const Circle& v) {
    return AllFinite(&v.cx, 5);
}
inline bool IsFinite(const Matrix4& v) {
    return AllFinite(v.m, 16);
}
inline bool IsFinite(const Color& v) {
    return AllFinite(&v.r, 4);
}
inline bool IsFinite(const Paint& v) {
    return IsFinite(v.opacity) && IsFinite(v.color) && AllFinite(&v.strokeWidth, 3);
}
inline bool IsFinite(const GlyphRunParams& v) {
    return AllFinite(&v.size, 4) && IsFinite(v.paint);
}
inline bool IsFinite(const TextPaint& v) {
    return AllFinite(&v.size, 3) && IsFinite(v.paint);
}
inline bool IsFinite(const LinearGradient& v) {
    return IsFinite(v.start) && IsFinite(v.end);
}
inline bool IsFinite(const RadialGradient& v) {
    return IsFinite(v.center) && IsFinite(v.radius);
}
inline bool IsFinite(const ImageTile& v) {
    return IsFinite(v.source) && IsFinite(v.tile) && AllFinite(&v.spacingX, 2);
}
inline bool IsFinite(const MorphProgress& v) {
    return IsFinite(v.progress) && IsFinite(v.paint);
}
inline bool IsFinite(const GradientStop& v) {
    return IsFinite(v.offset) && IsFinite(v.color);
}
inline bool IsFinite(const FilterRecord& v) {
    return AllFinite(v.values, 20);
}
inline bool IsFinite(const PatternGeometry& v) {
    return IsFinite(v.tile);
}

#define FRESCO_FINITE_FIELD(type, field) &&IsFinite(record.field)
#define FRESCO_FINITE(name, tail, fields)                               \
    inline bool IsFinite([[maybe_unused]] const name##Record& record) { \
        return true fields;                                             \
    }
FRESCO_COMMANDS(FRESCO_FINITE, FRESCO_FINITE_FIELD)
#undef FRESCO_FINITE
#undef FRESCO_FINITE_FIELD

}  // namespace fresco
