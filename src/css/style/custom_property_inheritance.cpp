#include "css/style/custom_property_inheritance.h"

namespace qorvex::css {
namespace {

bool IsOverlayOf(const CustomPropertyMap& map, const CustomPropertyMap* parent,
                 const CustomPropertyMap& own) {
    size_t expected = own.size();
    for (const auto& entry : own) {
        const CustomPropertyPtr* present = map.get(entry.first);
        if (!present || !(*present == entry.second)) return false;
    }
    if (parent) {
        for (const auto& entry : *parent) {
            if (own.get(entry.first)) continue;
            const CustomPropertyPtr* present = map.get(entry.first);
            if (!present || !(*present == entry.second)) return false;
            ++expected;
        }
    }
    return map.size() == expected;
}

}  // namespace

bool UpdateCustomProperties(LayoutStyleRefs& style, const LayoutStyleRefs& parent, const MatchState& match) {
    const CustomPropertyMap& own = match.customProperties();
    if (own.empty()) {
        if (style.customProperties == parent.customProperties) return false;
        style.customProperties = parent.customProperties;
    } else {
        const CustomPropertyMap* above = parent.customProperties ? &parent.customProperties->map : nullptr;
        if (style.customProperties && IsOverlayOf(style.customProperties->map, above, own)) return false;
        auto map = MakeRef<SharedCustomProperties>();
        if (above) map->map = *above;
        // Entries come in the order of their hashes: a table that grew under them would crowd them in one
        // place.
        map->map.reserve(map->map.size() + own.size());
        for (const auto& entry : own)
            map->map.insert_or_assign(entry.first, entry.second);
        style.customProperties = std::move(map);
    }
    style.written.AddCustomProperties();
    return true;
}

}  // namespace qorvex::css
