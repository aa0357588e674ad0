// The key of all font lookups, and its form in the rendering library's flag word.
#pragma once

#include <cstdint>

#include "core/memory/atom.h"
#include "css/values/keywords.h"

namespace qorvex::layout {

struct FontDescription {
    Atom family;         // empty: taken from the file
    uint8_t style = 0;   // 1 normal, 2 italic, 3 oblique; 0: taken from the file
    uint8_t weight = 0;  // hundreds, 1 to 9; 0: taken from the file

    // Everything is said, so that the file has nothing to add.
    bool IsExplicit() const { return !family.empty() && style != 0 && weight != 0; }
    uint64_t HashValue() const { return family.HashValue() * 31 + style * 16u + weight; }
    friend bool operator==(const FontDescription&, const FontDescription&) = default;
};

inline constexpr uint8_t kNormalStyle = 1;
inline constexpr uint8_t kItalicStyle = 2;
inline constexpr uint8_t kObliqueStyle = 3;
inline constexpr uint8_t kNormalWeight = 4;
inline constexpr uint8_t kLightestWeight = 1;
inline constexpr uint8_t kHeaviestWeight = 9;

uint8_t StyleCode(css::FontStyle style);
// What the rendering library is asked for. Italic and oblique ask for the same face.
uint32_t ToFontFlags(const FontDescription& description);
uint8_t StyleFromFlags(uint32_t flags);
uint8_t WeightFromFlags(uint32_t flags);

// One of the names that stand for a kind of font and have no font of their own.
bool IsGenericFamily(std::string_view family);

// The weights to try for a wanted one, in order (CSS Fonts Module Level 4, 5.2, without the width step).
// Calls visit(weight) until it returns true.
template <class Visit>
void SearchWeights(uint8_t wanted, Visit&& visit) {
    const auto down = [&](int from) {
        for (int w = from; w >= kLightestWeight; --w) {
            if (visit(static_cast<uint8_t>(w))) return true;
        }
        return false;
    };
    const auto up = [&](int from) {
        for (int w = from; w <= kHeaviestWeight; ++w) {
            if (visit(static_cast<uint8_t>(w))) return true;
        }
        return false;
    };
    if (wanted == kNormalWeight) {
        if (!visit(uint8_t{4}) && !visit(uint8_t{5}) && !down(3)) up(6);
    } else if (wanted < 6) {
        if (!down(wanted)) up(wanted + 1);
    } else {
        if (!up(wanted)) down(wanted - 1);
    }
}

}  // namespace qorvex::layout
