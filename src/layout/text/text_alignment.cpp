#include "layout/text/text_alignment.h"

#include <algorithm>

namespace qorvex::layout {

namespace {

using css::TextAlignType;

void MoveLine(TextInfo& info, TextLineInfo& line, float distance) {
    if (distance == 0) return;
    line.x += distance;
    line.extent += distance;
    for (uint32_t i = 0; i < line.runCount; ++i)
        info.runs[line.firstRun + i].x += distance;
    line.ellipsis.x += distance;
}

// The characters of a run whose gaps are widened, by their place in TextInfo::gaps.
class WidenedGaps {
  public:
    WidenedGaps(const TextInfo& info, const LinePlacement& placement)
        : first_(info.gaps.data() + placement.firstGap), end_(info.gaps.data() + placement.endGap) {}
    uint32_t CountBefore(uint32_t character) const {
        return static_cast<uint32_t>(std::lower_bound(first_, end_, character) - first_);
    }
    uint32_t CountIn(uint32_t first, uint32_t end) const { return CountBefore(end) - CountBefore(first); }

  private:
    const uint32_t* first_;
    const uint32_t* end_;
};

void SpreadRun(TextInfo& info, TextRun& run, const WidenedGaps& gaps, float extra) {
    // What stands to the left of a character: in a run from right to left all that is read after it.
    const auto shiftOf = [&](uint32_t character) {
        const uint32_t count = run.rightToLeft ? gaps.CountIn(character + 1, run.endCharacter)
                                               : gaps.CountIn(run.firstCharacter, character);
        return extra * static_cast<float>(count);
    };
    for (uint32_t i = 0; i < run.glyphCount; ++i) {
        const uint32_t glyph = run.firstGlyph + i;
        info.glyphs[glyph].x +=
            shiftOf(info.clusters.empty() ? run.firstCharacter + i : info.clusters[glyph]);
    }
    for (uint32_t i = run.firstCharacter; i < run.endCharacter && !info.positions.empty(); ++i) {
        // Reading from right to left begins at a character's right edge, its own gap included.
        const bool isGap = run.rightToLeft && gaps.CountIn(i, i + 1) > 0;
        info.positions[i] += shiftOf(i) + (isGap ? extra : 0);
    }
    run.width += extra * static_cast<float>(gaps.CountIn(run.firstCharacter, run.endCharacter));
}

}  // namespace

void SpreadLine(TextInfo& info, TextLineInfo& line, const LinePlacement& placement) {
    const WidenedGaps gaps(info, placement);
    float moved = 0;
    for (uint32_t i = 0; i < line.runCount; ++i) {
        TextRun& run = info.runs[line.firstRun + i];
        const float before = run.width;
        run.x += moved;
        SpreadRun(info, run, gaps, placement.gap);
        moved += run.width - before;
    }
    line.extent += moved;
}

void AlignLines(const TextStyle& style, float availableWidth, TextInfo& info) {
    float widest = 0;
    for (const TextLineInfo& line : info.lines)
        widest = std::max(widest, line.width);
    const bool known = !std::isnan(availableWidth);
    if (style.align == TextAlignType::Justify && known) widest = availableWidth;
    const float shift = known ? std::max(widest - availableWidth, 0.0f) : 0;
    const float inner = widest - shift;
    const float part = style.align == TextAlignType::Center  ? 0.5f
                       : style.align == TextAlignType::Right ? 1.0f
                                                             : 0.0f;
    for (TextLineInfo& line : info.lines) {
        if (part > 0) {
            const float rest = Near(line.width, widest) ? 0 : std::max(inner - line.width, 0.0f);
            MoveLine(info, line, (shift + rest) * part);
        }
        line.width = widest;
    }
    info.width = widest;
}

}  // namespace qorvex::layout
