#include "fresco/commands/validate.h"

#include "fresco/commands/finite.h"
#include "fresco/commands/tails.h"

namespace fresco {
namespace {

// --- tails: is `size` what the record's counts ask for, and is the content sound? ---

template <class R>
bool ValidTail(const R&, const uint8_t*, size_t size, const NoneTail*) {
    return size == 0;
}

template <class R>
bool ValidTail(const R& record, const uint8_t* data, size_t size, const PathTail*) {
    const uint64_t points = record.path.pointCount, verbs = record.path.verbCount;
    const uint64_t wanted = points * sizeof(Point) + ((verbs + 3) & ~uint64_t(3));
    if (wanted != size || record.path.fillRule > kFillEvenOdd) return false;
    const auto* list = reinterpret_cast<const Point*>(data);
    for (uint64_t i = 0; i < points; ++i) {
        if (!IsFinite(list[i])) return false;
    }
    // The verbs must use exactly the points there are.
    constexpr uint8_t kPointsOf[] = {1, 1, 2, 3, 0};
    const uint8_t* verb = data + points * sizeof(Point);
    uint64_t used = 0;
    for (uint64_t i = 0; i < verbs; ++i) {
        if (verb[i] >= sizeof(kPointsOf)) return false;
        used += kPointsOf[verb[i]];
    }
    return used == points;
}

template <class R>
bool ValidTail(const R& record, const uint8_t* data, size_t size, const TextTail*) {
    return ((uint64_t(record.count) + 1 + 3) & ~uint64_t(3)) == size && data[record.count] == 0;
}

template <class R>
bool ValidTail(const R& record, const uint8_t* data, size_t size, const GlyphsTail*) {
    if (uint64_t(record.count) * sizeof(Glyph) != size) return false;
    const auto* glyphs = reinterpret_cast<const Glyph*>(data);
    for (uint32_t i = 0; i < record.count; ++i) {
        if (!AllFinite(&glyphs[i].x, 2)) return false;
    }
    return true;
}

bool ValidStops(const uint8_t* data, uint64_t count, size_t size) {
    if (count * sizeof(GradientStop) != size) return false;
    const auto* stops = reinterpret_cast<const GradientStop*>(data);
    for (uint64_t i = 0; i < count; ++i) {
        if (!IsFinite(stops[i])) return false;
    }
    return true;
}

template <class R>
bool ValidTail(const R& record, const uint8_t* data, size_t size, const StopsTail*) {
    return ValidStops(data, record.count, size);
}

template <class Geometry>
bool ValidGradient(const uint8_t* data, size_t size) {
    uint32_t count;
    if (size < sizeof(Geometry) + sizeof(count)) return false;
    std::memcpy(&count, data + sizeof(Geometry), sizeof(count));
    const size_t head = sizeof(Geometry) + sizeof(count);
    return IsFinite(*reinterpret_cast<const Geometry*>(data)) && ValidStops(data + head, count, size - head);
}

bool ValidFilters(const uint8_t* data, size_t size) {
    uint32_t count;
    if (size < sizeof(count)) return false;
    std::memcpy(&count, data, sizeof(count));
    if (uint64_t(count) * sizeof(FilterRecord) != size - sizeof(count)) return false;
    const auto* filters = reinterpret_cast<const FilterRecord*>(data + sizeof(count));
    for (uint32_t i = 0; i < count; ++i) {
        if (!IsFinite(filters[i])) return false;
    }
    return true;
}

bool ValidCustom(const uint8_t* data, size_t size) {
    float params[4];
    uint32_t lengths[3];
    const size_t head = sizeof(params) + sizeof(lengths);
    if (size < head) return false;
    std::memcpy(params, data, sizeof(params));
    std::memcpy(lengths, data + sizeof(params), sizeof(lengths));
    uint64_t at = head;
    for (const uint32_t length : lengths) {
        at += length;
        if (at >= size || data[at] != 0) return false;
        ++at;
    }
    return AllFinite(params, 4);
}

bool ValidEffect(uint32_t kind, const uint8_t* data, size_t size) {
    switch (EffectKind(kind)) {
        case EffectKind::LinearGradient:
            return ValidGradient<LinearGradient>(data, size);
        case EffectKind::RadialGradient:
            return ValidGradient<RadialGradient>(data, size);
        case EffectKind::Pattern:
            return size == sizeof(PatternGeometry) &&
                   IsFinite(*reinterpret_cast<const PatternGeometry*>(data));
        case EffectKind::Filter:
            return ValidFilters(data, size);
        case EffectKind::Blend:
            return size == sizeof(uint32_t);
        case EffectKind::Custom:
            return ValidCustom(data, size);
    }
    return false;
}

template <class R>
bool ValidTail(const R& record, const uint8_t* data, size_t size, const EffectsTail*) {
    size_t at = 0;
    for (uint32_t i = 0; i < record.count; ++i) {
        EffectHeader header;
        if (size - at < sizeof(header)) return false;
        std::memcpy(&header, data + at, sizeof(header));
        at += sizeof(header);
        if (header.size % 4 != 0 || header.size > size - at ||
            !ValidEffect(header.kind, data + at, header.size)) {
            return false;
        }
        at += header.size;
    }
    return at == size;
}

template <class R>
bool ValidTail(const R& record, const uint8_t* data, size_t size, const BytesTail*) {
    if (((uint64_t(record.count) + 3) & ~uint64_t(3)) != size) return false;
    if (record.kind == kAnnotateCompositionId && record.count > 0) return data[record.count - 1] == 0;
    return true;
}

// --- fields that are more than numbers ---

template <class R>
bool ValidFields(const R& record, size_t) {
    return IsFinite(record);
}

bool ValidFields(const CreateImageRecord& record, size_t pixelCount) {
    // A pointer to a client's object has no meaning in a file.
    return (record.pixels.index == kNoId || record.pixels.index < pixelCount) &&
           !(record.flags & kImageUserObject);
}

bool ValidFields(const UpdateImageRecord& record, size_t pixelCount) {
    return record.pixels.index == kNoId || record.pixels.index < pixelCount;
}

template <class Record, class Tail>
const char* CheckRecord(const uint8_t* body, size_t size, size_t pixelCount) {
    if (size < sizeof(Record)) return "a record is too short";
    const auto& record = *reinterpret_cast<const Record*>(body);
    if (!ValidFields(record, pixelCount)) return "a record holds invalid numbers";
    if (!ValidTail(record, body + sizeof(Record), size - sizeof(Record), static_cast<const Tail*>(nullptr))) {
        return "the data of a record does not fit its counts";
    }
    return nullptr;
}

}  // namespace

bool ValidateStream(const void* stream, size_t size, size_t pixelCount, const char** error) {
    const auto* cursor = static_cast<const uint8_t*>(stream);
    size_t left = size;
    *error = nullptr;
    while (left > 0 && !*error) {
        RecordHeader header;
        if (left < sizeof(header)) {
            *error = "the stream ends within a record";
            break;
        }
        std::memcpy(&header, cursor, sizeof(header));
        if (header.size < sizeof(header) || header.size % 4 != 0 || header.size > left) {
            *error = "a record has an impossible size";
            break;
        }
        switch (CommandType(header.type)) {
#define FRESCO_CHECK(name, tail, fields)                                                          \
    case CommandType::name:                                                                       \
        *error = CheckRecord<name##Record, tail##Tail>(cursor + sizeof(header),                   \
                                                       header.size - sizeof(header), pixelCount); \
        break;
#define FRESCO_NO_FIELD(type, field)
            FRESCO_COMMANDS(FRESCO_CHECK, FRESCO_NO_FIELD)
#undef FRESCO_CHECK
#undef FRESCO_NO_FIELD
            default:
                *error = "a record of an unknown type";
        }
        cursor += header.size;
        left -= header.size;
    }
    return *error == nullptr;
}

}  // namespace fresco
