// Typed views of the tails that follow the fields of a record; see <fresco/command_records.h>.
#pragma once
#include <fresco/command_records.h>

namespace fresco {

struct NoneTail {};

struct PathTail {
    const PathVerb* verbs = nullptr;
    uint32_t verbCount = 0;
    const Point* points = nullptr;
    uint32_t pointCount = 0;
    FillRule fillRule = kFillNonZero;
};

struct TextTail {
    const char* text = nullptr;
    uint32_t length = 0;
};

struct GlyphsTail {
    const Glyph* glyphs = nullptr;
    uint32_t count = 0;
};

struct StopsTail {
    const GradientStop* stops = nullptr;
    uint32_t count = 0;
};

// Effects one after the other, each with its header.
struct EffectsTail {
    const uint8_t* data = nullptr;
    uint32_t count = 0;
    uint32_t size = 0;
};

struct BytesTail {
    const uint8_t* data = nullptr;
    uint32_t size = 0;
};

inline constexpr uint32_t Padded(uint32_t size) {
    return (size + 3u) & ~3u;
}

template <class R>
NoneTail ReadTail(const R&, const uint8_t*, uint32_t, const NoneTail*) {
    return {};
}

template <class R>
PathTail ReadTail(const R& record, const uint8_t* data, uint32_t, const PathTail*) {
    const auto* points = reinterpret_cast<const Point*>(data);
    const auto* verbs =
        reinterpret_cast<const PathVerb*>(data + size_t(record.path.pointCount) * sizeof(Point));
    return {verbs, record.path.verbCount, points, record.path.pointCount, FillRule(record.path.fillRule)};
}

template <class R>
TextTail ReadTail(const R& record, const uint8_t* data, uint32_t, const TextTail*) {
    return {reinterpret_cast<const char*>(data), record.count};
}

template <class R>
GlyphsTail ReadTail(const R& record, const uint8_t* data, uint32_t, const GlyphsTail*) {
    return {reinterpret_cast<const Glyph*>(data), record.count};
}

template <class R>
StopsTail ReadTail(const R& record, const uint8_t* data, uint32_t, const StopsTail*) {
    return {reinterpret_cast<const GradientStop*>(data), record.count};
}

template <class R>
EffectsTail ReadTail(const R& record, const uint8_t* data, uint32_t size, const EffectsTail*) {
    return {data, record.count, size};
}

template <class R>
BytesTail ReadTail(const R& record, const uint8_t* data, uint32_t, const BytesTail*) {
    return {data, record.count};
}

}  // namespace fresco
