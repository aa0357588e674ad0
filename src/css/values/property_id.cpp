#include "css/values/property_id.h"

#include <array>

namespace qorvex::css {

namespace {

constexpr std::string_view kNames[kPropertyEnd] = {
#define QORVEX_ROW(id, name, ...) name,
    QORVEX_CSS_LONGHANDS(QORVEX_ROW) "", QORVEX_CSS_SHORTHANDS(QORVEX_ROW)
#undef QORVEX_ROW
};

// Names by hash, made by the compiler. Open addressing at about half load keeps a look-up to one or two
// compares.
constexpr size_t kSlots = 256;

constexpr uint32_t HashName(std::string_view name) {
    uint32_t hash = 2166136261u;
    for (char c : name)
        hash = (hash ^ static_cast<unsigned char>(c)) * 16777619u;
    return hash ^ (hash >> 15);
}

consteval std::array<uint8_t, kSlots> BuildIndex() {
    std::array<uint8_t, kSlots> index{};
    for (uint8_t& slot : index)
        slot = static_cast<uint8_t>(kLonghandCount);
    for (size_t id = 0; id < kPropertyEnd; ++id) {
        if (kNames[id].empty()) continue;
        size_t slot = HashName(kNames[id]) % kSlots;
        while (index[slot] != kLonghandCount)
            slot = (slot + 1) % kSlots;
        index[slot] = static_cast<uint8_t>(id);
    }
    return index;
}

constexpr std::array<uint8_t, kSlots> kIndex = BuildIndex();
constexpr size_t kLongestName = 32;

}  // namespace

PropertyId FindProperty(std::string_view name) {
    if (name.empty() || name.size() > kLongestName) return PropertyId::kUnknown;
    for (size_t slot = HashName(name) % kSlots; kIndex[slot] != kLonghandCount; slot = (slot + 1) % kSlots)
        if (kNames[kIndex[slot]] == name) return static_cast<PropertyId>(kIndex[slot]);
    return PropertyId::kUnknown;
}

std::string_view PropertyName(PropertyId id) {
    return IndexOf(id) < kPropertyEnd ? kNames[IndexOf(id)] : std::string_view();
}

}  // namespace qorvex::css
