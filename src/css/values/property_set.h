// A set of longhands as 118 bits: dirty sets, the inherited set, the animatable set.
#pragma once

#include <bit>
#include <cstdint>

#include "css/values/property_id.h"

namespace qorvex::css {

class PropertySet {
  public:
    constexpr PropertySet() = default;
    static constexpr PropertySet All() {
        PropertySet set;
        set.words_[0] = ~uint64_t{0};
        set.words_[1] = (uint64_t{1} << (kLonghandCount - 64)) - 1;
        return set;
    }

    constexpr void Add(PropertyId id) { words_[IndexOf(id) >> 6] |= Bit(id); }
    constexpr void Remove(PropertyId id) { words_[IndexOf(id) >> 6] &= ~Bit(id); }
    constexpr bool Contains(PropertyId id) const { return (words_[IndexOf(id) >> 6] & Bit(id)) != 0; }
    constexpr bool Empty() const { return (words_[0] | words_[1]) == 0; }
    constexpr void Clear() { words_[0] = words_[1] = 0; }
    constexpr int Count() const { return std::popcount(words_[0]) + std::popcount(words_[1]); }
    // Members with a smaller number.
    constexpr uint32_t CountBelow(PropertyId id) const {
        const uint64_t below = Bit(id) - 1;
        if (IndexOf(id) < 64) return static_cast<uint32_t>(std::popcount(words_[0] & below));
        return static_cast<uint32_t>(std::popcount(words_[0]) + std::popcount(words_[1] & below));
    }
    constexpr bool Intersects(const PropertySet& other) const {
        return ((words_[0] & other.words_[0]) | (words_[1] & other.words_[1])) != 0;
    }

    constexpr PropertySet& operator|=(const PropertySet& other) {
        words_[0] |= other.words_[0];
        words_[1] |= other.words_[1];
        return *this;
    }
    constexpr PropertySet& operator&=(const PropertySet& other) {
        words_[0] &= other.words_[0];
        words_[1] &= other.words_[1];
        return *this;
    }
    friend constexpr PropertySet operator|(PropertySet a, const PropertySet& b) { return a |= b; }
    friend constexpr PropertySet operator&(PropertySet a, const PropertySet& b) { return a &= b; }
    friend constexpr PropertySet operator~(const PropertySet& set) {
        PropertySet result = All();
        result.words_[0] &= ~set.words_[0];
        result.words_[1] &= ~set.words_[1];
        return result;
    }
    friend constexpr bool operator==(const PropertySet&, const PropertySet&) = default;

    // Calls visit(PropertyId) for each member in ascending order; costs one step per member.
    template <class Visitor>
    constexpr void ForEach(Visitor&& visit) const {
        for (int word = 0; word < 2; ++word)
            for (uint64_t bits = words_[word]; bits != 0; bits &= bits - 1)
                visit(static_cast<PropertyId>(word * 64 + std::countr_zero(bits)));
    }

  private:
    static constexpr uint64_t Bit(PropertyId id) { return uint64_t{1} << (IndexOf(id) & 63); }

    uint64_t words_[2] = {};
};

#define QORVEX_INHERITED 1
#define QORVEX_RESET 0
#define QORVEX_ANIMATED 1
#define QORVEX_STEPPED 0

namespace detail {
consteval PropertySet CollectInherited() {
    PropertySet set;
#define QORVEX_ROW(id, name, type, parser, field, inheritance, ...) \
    if (QORVEX_##inheritance) set.Add(PropertyId::id);
    QORVEX_CSS_LONGHANDS(QORVEX_ROW)
#undef QORVEX_ROW
    return set;
}
consteval PropertySet CollectAnimatable() {
    PropertySet set;
#define QORVEX_ROW(id, name, type, parser, field, inheritance, animation, ...) \
    if (QORVEX_##animation) set.Add(PropertyId::id);
    QORVEX_CSS_LONGHANDS(QORVEX_ROW)
#undef QORVEX_ROW
    return set;
}
}  // namespace detail

inline constexpr PropertySet kInheritedProperties = detail::CollectInherited();
inline constexpr PropertySet kAnimatableProperties = detail::CollectAnimatable();
static_assert(kInheritedProperties.Count() == 19);
static_assert(kAnimatableProperties.Count() == 55);

}  // namespace qorvex::css
