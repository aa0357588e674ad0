#include "css/values/html_tags.h"

#include <array>

namespace qorvex::css {

namespace {

constexpr std::string_view kNames[kTagCount] = {
#define QORVEX_TAG(name, text) text,
    QORVEX_HTML_TAGS(QORVEX_TAG)
#undef QORVEX_TAG
};

constexpr size_t kSlots = 512;
constexpr uint8_t kFree = 0xFF;
constexpr size_t kUnknown = static_cast<size_t>(TagId::Unknown);

constexpr uint32_t HashName(std::string_view name) {
    uint32_t hash = 2166136261u;
    for (char c : name)
        hash = (hash ^ static_cast<unsigned char>(c)) * 16777619u;
    return hash ^ (hash >> 15);
}

consteval std::array<uint8_t, kSlots> BuildIndex() {
    std::array<uint8_t, kSlots> index{};
    for (uint8_t& slot : index)
        slot = kFree;
    for (size_t tag = 0; tag < kTagCount; ++tag) {
        size_t slot = HashName(kNames[tag]) % kSlots;
        while (index[slot] != kFree)
            slot = (slot + 1) % kSlots;
        index[slot] = static_cast<uint8_t>(tag);
    }
    return index;
}

constexpr std::array<uint8_t, kSlots> kIndex = BuildIndex();

}  // namespace

TagId TagLookup(std::string_view upperCaseName) {
    for (size_t slot = HashName(upperCaseName) % kSlots; kIndex[slot] != kFree; slot = (slot + 1) % kSlots)
        if (kNames[kIndex[slot]] == upperCaseName) return static_cast<TagId>(kIndex[slot]);
    return upperCaseName.find('-') == std::string_view::npos ? TagId::Unknown : TagId::Custom;
}

std::string_view TagName(TagId tag) {
    size_t index = static_cast<size_t>(tag);
    return kNames[index < kTagCount ? index : kUnknown];
}

}  // namespace qorvex::css
