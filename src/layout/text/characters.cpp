#include "layout/text/characters.h"

#include <algorithm>

#include "layout/text/text_style.h"

namespace qorvex::layout {

namespace {

constexpr uint32_t kReplacement = 0xFFFD;

// The code point at `at`, which moves behind it. Maximal subparts of a bad sequence count as one, as the
// Unicode standard (chapter 3, "U+FFFD Substitution of Maximal Subparts") asks.
uint32_t NextCode(std::string_view text, size_t& at) {
    const auto byte = [&](size_t i) { return static_cast<uint8_t>(text[i]); };
    const uint8_t lead = byte(at++);
    if (lead < 0x80) return lead;
    if (lead < 0xC2 || lead > 0xF4) return kReplacement;
    const int more = lead < 0xE0 ? 1 : lead < 0xF0 ? 2 : 3;
    uint8_t low = lead == 0xE0 ? 0xA0 : lead == 0xF0 ? 0x90 : 0x80;
    uint8_t high = lead == 0xED ? 0x9F : lead == 0xF4 ? 0x8F : 0xBF;
    uint32_t code = lead & (0x3F >> more);
    for (int i = 0; i < more; ++i) {
        if (at == text.size() || byte(at) < low || byte(at) > high) return kReplacement;
        code = code << 6 | (byte(at++) & 0x3F);
        low = 0x80;
        high = 0xBF;
    }
    return code;
}

}  // namespace

void DecodeCharacters(std::string_view utf8, css::WhiteSpaceMode whiteSpace, Characters& out) {
    const bool collapse = CollapsesSpaces(whiteSpace);
    out.codes.resize(utf8.size());
    out.offsets.resize(utf8.size());
    uint32_t* codes = out.codes.data();
    uint32_t* offsets = out.offsets.data();
    size_t count = 0;
    uint32_t highest = 0;
    bool lineFeeds = false;
    for (size_t at = 0; at < utf8.size();) {
        const auto offset = static_cast<uint32_t>(at);
        uint32_t code = NextCode(utf8, at);
        // A line feed that belongs to a carriage return before it is one line end; a lone return is a blank.
        if (code == 0x0D) code = at < utf8.size() && utf8[at] == '\n' ? 0x20 : 0x0A;
        if (code <= 0x85) {
            const CharacterClass kind = ClassOf(code);
            if (collapse && kind != CharacterClass::Other && count > 0 && codes[count - 1] == ' ') continue;
            if (kind == CharacterClass::Space || (collapse && kind == CharacterClass::LineFeed)) code = ' ';
            lineFeeds |= !collapse && kind == CharacterClass::LineFeed;
        }
        highest = std::max(highest, code);
        codes[count] = code;
        offsets[count++] = offset;
    }
    out.codes.resize(count);
    out.offsets.resize(count);
    out.highest = highest;
    out.hasLineFeeds = lineFeeds;
    // The width of a space at the end is added to the line instead, so that it neither wraps nor draws.
    if (collapse && !out.codes.empty() && out.codes.back() == ' ') {
        out.codes.pop_back();
        out.offsets.pop_back();
        out.endedInSpace = true;
    }
}

}  // namespace qorvex::layout
