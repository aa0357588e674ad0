// The text of one layout as code points, with white space collapsed as the style asks.
#pragma once

#include <string_view>

#include "core/memory/temp_vector.h"
#include "css/values/keywords.h"

namespace qorvex::layout {

enum class CharacterClass : uint8_t {
    Space = 0,     // tab and its like, the blank: a line may end behind it
    LineFeed = 1,  // ends the line
    Other = 2,
};

[[nodiscard]] inline CharacterClass ClassOf(uint32_t code) {
    switch (code) {
        case 0x00:
        case 0x09:
        case 0x0B:
        case 0x0C:
        case 0x20:
            return CharacterClass::Space;
        case 0x0A:
        case 0x85:
            return CharacterClass::LineFeed;
        default:
            return CharacterClass::Other;
    }
}

// In the thread's temporary memory.
struct Characters {
    TempVector<uint32_t> codes;    // tabs and their like are blanks: they have no glyph of their own
    TempVector<uint32_t> offsets;  // where each code point starts in the UTF-8 text
    bool endedInSpace = false;     // a collapsed text lost one space at its end
    bool hasLineFeeds = false;
    uint32_t highest = 0;  // at least the largest code
};

// Bytes that are no UTF-8 become U+FFFD.
void DecodeCharacters(std::string_view utf8, css::WhiteSpaceMode whiteSpace, Characters& out);

}  // namespace qorvex::layout
