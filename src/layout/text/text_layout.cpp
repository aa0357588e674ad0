#include "layout/text/text_layout.h"

#include <algorithm>

#include "layout/text/complex_ranges.h"
#include "layout/text/line_builder.h"
#include "layout/text/text_alignment.h"

namespace qorvex::layout {

namespace {

// The width of a space at the end of a collapsed text, as a part of the font size.
constexpr float kTrailingSpace = 0.25f;

enum class Path { AsNeeded, Complex };

bool LayOut(const TextRequest& request, Path path, TextInfo& out) {
    out.Clear();
    out.usedSize = request.style.usedSize;
    const TempMark mark;
    LoadedTypefaces typefaces;
    LoadTypefaces(request.style, request.fonts, request.applyLineHeight, typefaces);
    if (typefaces.fonts.empty()) return false;
    if (request.text.empty()) return true;

    Characters characters;
    DecodeCharacters(request.text, request.style.whiteSpace, characters);
    // In a line that runs from right to left, or between words that do, even plain text has parts that do:
    // its punctuation.
    const bool backward = request.base == BaseDirection::RightToLeft;
    const bool leveled =
        request.levels != nullptr && std::any_of(request.levels, request.levels + request.text.size(),
                                                 [](uint8_t level) { return level != 0; });
    const bool needed = backward || leveled ||
                        (characters.highest >= kFirstComplexCode &&
                         NeedsComplexText(characters.codes.data(), characters.codes.size()));
    const bool complex = path == Path::Complex || (request.style.complexText && needed);
    GlyphMap map;
    ShapedText shaped;
    if (complex)
        ShapeText(request, characters, typefaces, map, shaped);
    else
        MapGlyphs(characters, typefaces, request.style, map);
    TempVector<LineSpan> spans;
    BreakLines(
        {characters, map.advances.data(), request.style, request.availableWidth, request.firstLineOffset,
         request.iterator, complex ? shaped.clusterStarts.data() : nullptr, map.hyphen},
        spans);
    BuildLines({request, characters, typefaces, map, complex ? &shaped : nullptr}, spans, out);
    if (characters.endedInSpace && !out.lines.empty()) {
        const float space = request.style.fontSize * kTrailingSpace + request.style.letterSpacing;
        TextLineInfo& last = out.lines.back();
        last.width += space;
        last.extent += space;
        for (uint32_t i = 0; i < last.runCount && backward; ++i)
            out.runs[last.firstRun + i].x += space;
    }
    AlignLines(request.style, request.availableWidth, out);
    return true;
}

}  // namespace

bool CalculateTextRunsAndGlyphs(const TextRequest& request, TextInfo& out) {
    return LayOut(request, Path::AsNeeded, out);
}

bool CalculateTextRunsAndGlyphsForComplexText(const TextRequest& request, TextInfo& out) {
    return LayOut(request, Path::Complex, out);
}

}  // namespace qorvex::layout
