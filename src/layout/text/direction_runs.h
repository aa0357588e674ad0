// The direction of each character, from the client's international text services.
#pragma once

#include <span>

#include "layout/text/characters.h"
#include "layout/text/text_layout.h"

namespace qorvex::layout {

// Levels as in Unicode Annex 9: an odd one runs from right to left. One for each byte, all 0 before; that of
// a character is the one of its first byte.
void ResolveByteLevels(IInternationalizationManager& manager, std::string_view text, std::span<uint8_t> out);
// Of each character: those of the request, else the manager's. Without a manager all are 0.
void ResolveLevels(const TextRequest& request, const Characters& characters, TempVector<uint8_t>& levels);

// From the order of reading to the order on the line, left to right (Unicode Annex 9, rule L2). `Item` has
// a member `level`.
template <class Item>
void ReorderVisually(Item* items, size_t count) {
    uint8_t highest = 0, lowestOdd = 0xFF;
    for (size_t i = 0; i < count; ++i) {
        highest = std::max(highest, items[i].level);
        if (items[i].level & 1) lowestOdd = std::min(lowestOdd, items[i].level);
    }
    for (int level = highest; level >= lowestOdd; --level) {
        for (size_t first = 0; first < count;) {
            if (items[first].level < level) {
                ++first;
                continue;
            }
            size_t end = first + 1;
            while (end < count && items[end].level >= level)
                ++end;
            std::reverse(items + first, items + end);
            first = end;
        }
    }
}

}  // namespace qorvex::layout
