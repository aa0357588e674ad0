// Which text needs shaping or has a direction of its own.
#pragma once

#include <cstddef>
#include <cstdint>

namespace qorvex::layout {

// A text without a code from here on needs neither.
inline constexpr uint32_t kFirstComplexCode = 0x02E5;

[[nodiscard]] bool NeedsComplexText(const uint32_t* codes, size_t count);

// A character that stays with the one before it, whatever font has it: marks that combine with any script,
// joiners, variation selectors, emoji modifiers. Signs of one script need no mention: the font that has its
// letters has them too.
[[nodiscard]] bool ExtendsCharacter(uint32_t code);

inline constexpr uint32_t kSoftHyphen = 0x00AD;
// No code before it is invisible.
inline constexpr uint32_t kFirstInvisible = kSoftHyphen;
// Shows nothing by itself, so that a font need not have it.
[[nodiscard]] bool IsInvisible(uint32_t code);

inline constexpr uint32_t kZeroWidthJoiner = 0x200D;

}  // namespace qorvex::layout
