#include "layout/text/characters.h"

#include <algorithm>

#include "layout/text/text_style.h"
#include "qsl/utf8.h"

namespace qorvex::layout {

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
        uint32_t code = qsl::NextCodePoint(utf8, at);
        // A carriage return and the line feed behind it are one line end; a lone return is one too.
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
