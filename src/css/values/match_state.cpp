#include "css/values/match_state.h"

namespace qorvex::css {

void MatchState::Clear() {
    properties_.Clear();
    inheriting_.Clear();
    expressions_.Clear();
    own_.Clear();
    slots_.clear();
    customProperties_.clear();
}

void MatchState::Fill(const PropertySet& properties, const PropertySet& own,
                      const Declaration* const* winners) {
    properties_ = properties;
    own_ = own;
    slots_.clear();
    slots_.reserve(static_cast<uint32_t>(properties.Count()));
    properties.ForEach([&](PropertyId id) {
        const Declaration* winner = winners[IndexOf(id)];
        slots_.push_back(winner);
        if (winner->kind() == DeclarationKind::Inherit) inheriting_.Add(id);
        if (winner->kind() == DeclarationKind::CustomExpression) expressions_.Add(id);
    });
}

static bool SameCustomProperties(const CustomPropertyMap& a, const CustomPropertyMap& b) {
    if (a.size() != b.size()) return false;
    for (const auto& entry : a) {
        const CustomPropertyPtr* other = b.get(entry.first);
        if (!other || !(*other == entry.second)) return false;
    }
    return true;
}

PropertySet MatchState::Difference(const MatchState& a, const MatchState& b) {
    if (&a == &b) return a.own_;
    if (!SameCustomProperties(a.customProperties_, b.customProperties_)) return PropertySet::All();
    PropertySet different = a.own_ | b.own_;
    const Declaration* const* left = a.slots_.data();
    const Declaration* const* right = b.slots_.data();
    (a.properties_ | b.properties_).ForEach([&](PropertyId id) {
        const Declaration* was = a.properties_.Contains(id) ? *left++ : nullptr;
        const Declaration* is = b.properties_.Contains(id) ? *right++ : nullptr;
        if (was != is) different.Add(id);
    });
    return different;
}

}  // namespace qorvex::css
