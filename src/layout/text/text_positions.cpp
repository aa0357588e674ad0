#include "layout/text/text_positions.h"

#include "layout/text/characters.h"

namespace qorvex::layout {

namespace {

void TakeRun(const TextInfo& info, const TextRun& run, float left, TextPositions& out) {
    for (uint32_t i = run.firstCharacter; i < run.endCharacter; ++i) {
        const float inRun = info.positions.empty() ? info.glyphs[run.firstGlyph + (i - run.firstCharacter)].x
                                                   : info.positions[i];
        out.x[i] = left + run.x + inRun;
    }
}

}  // namespace

void ComputeTextPositions(const TextInfo& info, std::string_view text, css::WhiteSpaceMode whiteSpace,
                          const LinePlacement* placements, TextPositions& out) {
    const TempMark mark;
    Characters characters;
    DecodeCharacters(text, whiteSpace, characters);
    const size_t count = characters.codes.size();
    out.offsets.clear();
    if (count != text.size()) {
        out.offsets.reserve(count + 1);
        out.offsets.append(characters.offsets.begin(), characters.offsets.end());
        out.offsets.push_back(static_cast<uint32_t>(text.size()));
    }
    out.x.resize(count + 1, 0.0f);
    out.lines.reserve(info.lines.size());
    float top = 0;
    uint32_t known = 0;  // characters that have a place
    float end = 0;
    for (size_t i = 0; i < info.lines.size(); ++i) {
        const TextLineInfo& line = info.lines[i];
        const float left = placements ? placements[i].x : 0;
        if (placements) top = placements[i].baseline - line.baseline;
        // Spaces and line feeds between two lines stand at the end of the first.
        for (; known < line.firstCharacter; ++known)
            out.x[known] = end;
        for (uint32_t run = 0; run < line.runCount; ++run)
            TakeRun(info, info.runs[line.firstRun + run], left, out);
        known = std::max(known, line.endCharacter);
        end = left + line.extent;
        out.lines.push_back({line.firstCharacter, line.endCharacter, top, line.height});
        top += line.height;
    }
    for (; known <= count; ++known)
        out.x[known] = end;
}

}  // namespace qorvex::layout
