// The lexical readers that all value parsers share. No exponents, no "inf", no locale; a number out of the
// range of a float is refused. Linear in the text, no allocation.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "css/values/length.h"

namespace qorvex::css {

// Reads a number from the start of the text (sign, digits, fraction); returns its length, 0 when there is
// none.
[[nodiscard]] size_t ReadFloat(std::string_view text, float& out);

// These must consume every character.
[[nodiscard]] bool ParseFloat(std::string_view text, float& out);
[[nodiscard]] bool ParseInt(std::string_view text, int32_t& out);
// A number and a lower-case unit; a bare number only if it is 0.
[[nodiscard]] bool ParseLength(std::string_view text, Length& out);
// Degrees, or a bare 0.
[[nodiscard]] bool ParseAngle(std::string_view text, float& degrees);
// "s" or "ms".
[[nodiscard]] bool ParseTime(std::string_view text, float& seconds);

}  // namespace qorvex::css
