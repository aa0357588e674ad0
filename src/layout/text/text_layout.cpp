#include "layout/text/text_layout.h"

#include <fresco/font.h>

#include <algorithm>

#include "layout/text/characters.h"
#include "layout/text/glyph_mapping.h"
#include "layout/text/line_breaking.h"
#include "layout/text/text_alignment.h"

namespace qorvex::layout {

namespace {

constexpr uint32_t kEllipsisCode = 0x2026;
// The width of a space at the end of a collapsed text, as a part of the font size.
constexpr float kTrailingSpace = 0.25f;

// Turns line spans into runs of glyphs. Lives for one layout.
class LineBuilder {
  public:
    LineBuilder(const TextRequest& request, const Characters& characters, const LoadedTypefaces& typefaces,
                GlyphMap& map, TextInfo& out)
        : request_(request), characters_(characters), typefaces_(typefaces), map_(map), out_(out) {
        const bool cuts = request.style.overflow == css::TextOverflowMode::Ellipsis &&
                          (request.style.whiteSpace == css::WhiteSpaceMode::NoWrap ||
                           request.style.whiteSpace == css::WhiteSpaceMode::Pre);
        if (cuts && !std::isnan(request.availableWidth)) FindEllipsis();
    }

    void Build(const TempVector<LineSpan>& spans) {
        out_.lines.reserve(spans.size());
        out_.glyphs.reserve(characters_.codes.size());
        for (size_t i = 0; i < spans.size(); ++i) {
            LineSpan span = spans[i];
            TextLineInfo line;
            if (ellipsis_.font != css::kNoTypeface && span.width > request_.availableWidth) Cut(span, line);
            if (Justifies() && !span.endsParagraph) Spread(span);
            AddLine(span, line);
            out_.wrapped |= !span.endsParagraph;
        }
    }

  private:
    bool Justifies() const {
        return request_.style.align == css::TextAlignType::Justify && !std::isnan(request_.availableWidth);
    }

    // The first typeface that has the sign.
    void FindEllipsis() {
        for (size_t i = 0; i < typefaces_.fonts.size(); ++i) {
            uint32_t glyph = 0;
            typefaces_.fonts[i]->GetGlyphIndices(&kEllipsisCode, 1, &glyph);
            if (glyph == 0) continue;
            ellipsis_.glyph = glyph;
            ellipsis_.font = typefaces_.ids[i];
            typefaces_.fonts[i]->GetAdvances(&glyph, 1, request_.style.usedSize, &ellipsis_.advance);
            return;
        }
    }

    // Takes characters off the end until the sign fits; one stays.
    void Cut(LineSpan& span, TextLineInfo& line) {
        while (span.end > span.first + 1 && request_.availableWidth - span.width < ellipsis_.advance) {
            span.width -= map_.advances[--span.end];
        }
        line.ellipsis = ellipsis_;
        line.ellipsis.x = span.width;
        span.width += ellipsis_.advance;
    }

    // Shares the free width among the gaps between words.
    void Spread(LineSpan& span) {
        uint32_t gaps = 0;
        const auto isGap = [&](uint32_t i) { return ClassOf(characters_.codes[i]) != CharacterClass::Other; };
        for (uint32_t i = span.first + 1; i + 1 < span.end; ++i)
            gaps += isGap(i);
        const float extra = request_.availableWidth - span.width;
        if (gaps == 0 || extra <= 0) return;
        for (uint32_t i = span.first + 1; i + 1 < span.end; ++i) {
            if (isGap(i)) map_.advances[i] += extra / static_cast<float>(gaps);
        }
        span.width = request_.availableWidth;
    }

    void AddLine(const LineSpan& span, TextLineInfo& line) {
        line.firstRun = static_cast<uint32_t>(out_.runs.size());
        line.firstCharacter = span.first;
        line.endCharacter = span.end;
        line.width = span.width;
        line.endsParagraph = span.endsParagraph;
        // An empty line is as tall as one of the first typeface.
        LineMetrics metrics = typefaces_.metrics[0];
        float x = out_.lines.empty() ? request_.firstLineOffset : 0;
        for (uint32_t first = span.first; first < span.end;) {
            uint32_t end = first + 1;
            while (end < span.end && map_.fonts[end] == map_.fonts[first])
                ++end;
            const LineMetrics& own = typefaces_.metrics[map_.fonts[first]];
            metrics.baseline = first == span.first ? own.baseline : std::max(metrics.baseline, own.baseline);
            metrics.height = first == span.first ? own.height : std::max(metrics.height, own.height);
            x += AddRun(first, end, x);
            first = end;
        }
        line.runCount = static_cast<uint32_t>(out_.runs.size()) - line.firstRun;
        line.baseline = metrics.baseline;
        line.height = metrics.height;
        out_.height += line.height;
        out_.lines.push_back(line);
    }

    float AddRun(uint32_t first, uint32_t end, float x) {
        TextRun run;
        run.font = typefaces_.ids[map_.fonts[first]];
        run.firstGlyph = static_cast<uint32_t>(out_.glyphs.size());
        run.glyphCount = end - first;
        run.firstCharacter = first;
        run.endCharacter = end;
        run.x = x;
        for (uint32_t i = first; i < end; ++i) {
            out_.glyphs.push_back({map_.glyphs[i], run.width, 0});
            run.width += map_.advances[i];
        }
        out_.runs.push_back(run);
        return run.width;
    }

    const TextRequest& request_;
    const Characters& characters_;
    const LoadedTypefaces& typefaces_;
    GlyphMap& map_;
    TextInfo& out_;
    TextEllipsis ellipsis_;
};

}  // namespace

bool CalculateTextRunsAndGlyphs(const TextRequest& request, TextInfo& out) {
    out.Clear();
    out.usedSize = request.style.usedSize;
    const TempMark mark;
    LoadedTypefaces typefaces;
    LoadTypefaces(request.style, request.fonts, request.applyLineHeight, typefaces);
    if (typefaces.fonts.empty()) return false;
    if (request.text.empty()) return true;

    Characters characters;
    DecodeCharacters(request.text, request.style.whiteSpace, characters);
    GlyphMap map;
    MapGlyphs(characters, typefaces, request.style, map);
    TempVector<LineSpan> spans;
    BreakLines({characters, map.advances.data(), request.style, request.availableWidth,
                request.firstLineOffset, request.iterator},
               spans);
    LineBuilder(request, characters, typefaces, map, out).Build(spans);
    if (characters.endedInSpace && !out.lines.empty()) {
        out.lines.back().width += request.style.fontSize * kTrailingSpace + request.style.letterSpacing;
    }
    AlignLines(request.style, request.availableWidth, out);
    return true;
}

}  // namespace qorvex::layout
