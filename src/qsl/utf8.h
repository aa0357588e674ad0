// UTF-8, well formed or not.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace qsl {

inline constexpr uint32_t kReplacementCharacter = 0xFFFD;
/// The same in UTF-8.
inline constexpr std::string_view kReplacementText = "\xEF\xBF\xBD";

/// The code point at `at`, which moves behind it; kReplacementCharacter for bytes that are none. Maximal
/// subparts of a bad sequence count as one, as the Unicode standard (chapter 3, "U+FFFD Substitution of
/// Maximal Subparts") asks.
inline uint32_t NextCodePoint(std::string_view text, size_t& at) {
    const auto byte = [&](size_t i) { return static_cast<uint8_t>(text[i]); };
    const uint8_t lead = byte(at++);
    if (lead < 0x80) return lead;
    if (lead < 0xC2 || lead > 0xF4) return kReplacementCharacter;
    const int more = lead < 0xE0 ? 1 : lead < 0xF0 ? 2 : 3;
    uint8_t low = lead == 0xE0 ? 0xA0 : lead == 0xF0 ? 0x90 : 0x80;
    uint8_t high = lead == 0xED ? 0x9F : lead == 0xF4 ? 0x8F : 0xBF;
    uint32_t code = lead & (0x3F >> more);
    for (int i = 0; i < more; ++i) {
        if (at == text.size() || byte(at) < low || byte(at) > high) return kReplacementCharacter;
        code = code << 6 | (byte(at++) & 0x3F);
        low = 0x80;
        high = 0xBF;
    }
    return code;
}

}  // namespace qsl
