#include "layout/text/line_builder.h"

#include <qorvex/text_services.h>

#include <algorithm>

#include "layout/text/complex_ranges.h"
#include "layout/text/direction_runs.h"

namespace qorvex::layout {

namespace {

constexpr uint32_t kEllipsisCode = 0x2026;

// What one shaped span shows on one line.
struct LinePiece {
    const ShapedSpan* span;
    uint32_t first;  // characters
    uint32_t end;
    uint8_t level;
};

// Lives for one layout.
class LineBuilder {
  public:
    LineBuilder(const LineSource& source, TextInfo& out)
        : request_(source.request),
          characters_(source.characters),
          typefaces_(source.typefaces),
          map_(source.map),
          shaped_(source.shaped),
          out_(out) {
        const bool cuts = request_.style.overflow == css::TextOverflowMode::Ellipsis &&
                          (request_.style.whiteSpace == css::WhiteSpaceMode::NoWrap ||
                           request_.style.whiteSpace == css::WhiteSpaceMode::Pre);
        if (cuts && !std::isnan(request_.availableWidth)) FindEllipsis();
    }

    void Build(const TempVector<LineSpan>& spans) {
        if (request_.notesGaps) NoteGaps();
        out_.lines.reserve(spans.size());
        out_.glyphs.reserve(shaped_ ? shaped_->glyphs.size() : characters_.codes.size());
        if (shaped_) {
            out_.clusters.reserve(shaped_->glyphs.size());
            out_.positions.resize(characters_.codes.size(), 0.0f);
        }
        for (size_t i = 0; i < spans.size(); ++i) {
            LineSpan span = spans[i];
            TextLineInfo line;
            if (ellipsis_.font != css::kNoTypeface && span.width > request_.availableWidth) Cut(span, line);
            if (map_.hyphen > 0 && !span.endsParagraph) ShowHyphen(span);
            if (Justifies() && !span.endsParagraph) Spread(span);
            AddLine(span, line);
            out_.wrapped |= !span.endsParagraph;
        }
    }

  private:
    bool Justifies() const {
        return request_.style.align == css::TextAlignType::Justify && !std::isnan(request_.availableWidth);
    }
    bool StartsCluster(uint32_t character) const {
        return shaped_ == nullptr || shaped_->clusterStarts[character] != 0;
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
            break;
        }
        ellipsisInFront_ = shaped_ != nullptr && request_.i18n != nullptr &&
                           request_.i18n->ComputeBaseDirection(request_.text.data(),
                                                               static_cast<unsigned>(request_.text.size())) ==
                               TextDirection::RightToLeft;
    }

    // Takes characters off the end until the sign fits; one stays.
    void Cut(LineSpan& span, TextLineInfo& line) {
        while (span.end > span.first + 1 &&
               (request_.availableWidth - span.width < ellipsis_.advance || !StartsCluster(span.end))) {
            span.width -= map_.advances[--span.end];
        }
        line.ellipsis = ellipsis_;
        line.ellipsis.x = ellipsisInFront_ ? 0 : span.width;
        span.width += ellipsis_.advance;
    }

    // A word that was parted at a soft hyphen shows it.
    void ShowHyphen(LineSpan& span) {
        if (span.end == span.first || characters_.codes[span.end - 1] != kSoftHyphen) return;
        const uint32_t last = span.end - 1;
        const fresco::Glyph hyphen = HyphenOf(*typefaces_.fonts[map_.fonts[last]], request_.style);
        map_.glyphs[last] = hyphen.index;
        map_.advances[last] = hyphen.x;
        span.width += hyphen.x;
    }

    bool IsGap(uint32_t character) const {
        return ClassOf(characters_.codes[character]) != CharacterClass::Other && StartsCluster(character);
    }
    void NoteGaps() {
        for (uint32_t i = 0; i < characters_.codes.size(); ++i)
            if (IsGap(i)) out_.gaps.push_back(i);
    }

    // Shares the free width among the gaps between words.
    void Spread(LineSpan& span) {
        uint32_t gaps = 0;
        for (uint32_t i = span.first + 1; i + 1 < span.end; ++i)
            gaps += IsGap(i);
        const float extra = request_.availableWidth - span.width;
        if (gaps == 0 || extra <= 0) return;
        for (uint32_t i = span.first + 1; i + 1 < span.end; ++i) {
            if (IsGap(i)) map_.advances[i] += extra / static_cast<float>(gaps);
        }
        span.width = request_.availableWidth;
    }

    void AddLine(const LineSpan& span, TextLineInfo& line) {
        line.firstRun = static_cast<uint32_t>(out_.runs.size());
        line.firstCharacter = span.first;
        line.endCharacter = span.end;
        line.width = span.width;
        line.endsParagraph = span.endsParagraph;
        float x = out_.lines.empty() ? request_.firstLineOffset : 0;
        line.extent = x + span.width;
        if (line.ellipsis.font != css::kNoTypeface && ellipsisInFront_) x += ellipsis_.advance;
        if (shaped_ != nullptr)
            AddShapedRuns(span, line, x);
        else
            AddPlainRuns(span, line, x);
        line.runCount = static_cast<uint32_t>(out_.runs.size()) - line.firstRun;
        // An empty line is as tall as one of the first typeface.
        if (line.runCount == 0) Grow(line, 0);
        out_.height += line.height;
        out_.lines.push_back(line);
    }

    void Grow(TextLineInfo& line, uint8_t font) const {
        line.baseline = std::max(line.baseline, typefaces_.metrics[font].baseline);
        line.height = std::max(line.height, typefaces_.metrics[font].height);
    }

    void AddPlainRuns(const LineSpan& span, TextLineInfo& line, float x) {
        for (uint32_t first = span.first; first < span.end;) {
            uint32_t end = first + 1;
            while (end < span.end && map_.fonts[end] == map_.fonts[first])
                ++end;
            Grow(line, map_.fonts[first]);
            TextRun& run = StartRun(map_.fonts[first], first, end, x);
            out_.glyphs.resize(run.firstGlyph + (end - first));
            fresco::Glyph* glyph = out_.glyphs.data() + run.firstGlyph;
            for (uint32_t i = first; i < end; ++i) {
                *glyph++ = {map_.glyphs[i], run.width, 0};
                run.width += map_.advances[i];
            }
            run.glyphCount = end - first;
            x += run.width;
            first = end;
        }
    }

    void AddShapedRuns(const LineSpan& span, TextLineInfo& line, float x) {
        const TempMark mark;
        TempVector<LinePiece> pieces;
        const auto& all = shaped_->spans;
        const ShapedSpan* next = std::partition_point(
            all.begin(), all.end(), [&](const ShapedSpan& s) { return s.end <= span.first; });
        for (; next != all.end() && next->first < span.end; ++next)
            pieces.push_back(
                {next, std::max(next->first, span.first), std::min(next->end, span.end), next->level});
        ReorderVisually(pieces.data(), pieces.size());
        for (const LinePiece& piece : pieces) {
            Grow(line, piece.span->font);
            x += AddShapedRun(piece, x);
        }
    }

    // The glyphs whose clusters lie in the piece; they stand together, since clusters go one way in a span.
    std::pair<uint32_t, uint32_t> GlyphsOf(const LinePiece& piece) const {
        const auto* begin = shaped_->glyphs.data() + piece.span->firstGlyph;
        const auto* end = shaped_->glyphs.data() + piece.span->endGlyph;
        const bool backward = piece.span->IsRightToLeft();
        const auto place = [&](uint32_t character) {
            return static_cast<uint32_t>(std::partition_point(begin, end,
                                                              [&](const fresco::ShapedGlyph& glyph) {
                                                                  return backward ? glyph.cluster >= character
                                                                                  : glyph.cluster < character;
                                                              }) -
                                         shaped_->glyphs.data());
        };
        return backward ? std::pair(place(piece.end), place(piece.first))
                        : std::pair(place(piece.first), place(piece.end));
    }

    float AddShapedRun(const LinePiece& piece, float x) {
        TextRun& run = StartRun(piece.span->font, piece.first, piece.end, x);
        run.level = piece.level;
        run.rightToLeft = piece.span->IsRightToLeft();
        const auto [first, end] = GlyphsOf(piece);
        uint32_t following = piece.end;  // the cluster that is read after this one, in a backward run
        for (uint32_t i = first; i < end;) {
            const uint32_t cluster = shaped_->glyphs[i].cluster;
            float pen = run.width;
            for (; i < end && shaped_->glyphs[i].cluster == cluster; ++i) {
                const fresco::ShapedGlyph& glyph = shaped_->glyphs[i];
                out_.glyphs.push_back({glyph.index, pen + glyph.offsetX, glyph.offsetY});
                out_.clusters.push_back(cluster);
                pen += glyph.advance;
            }
            const float width = map_.advances[cluster];
            if (run.rightToLeft) {
                Divide(cluster, following, run.width + width, -width);
                following = cluster;
            } else {
                Divide(cluster, i < end ? shaped_->glyphs[i].cluster : piece.end, run.width, width);
            }
            run.width += width;
        }
        run.glyphCount = end - first;
        return run.width;
    }

    // The characters of a cluster share its width: a caret goes into a ligature step by step.
    void Divide(uint32_t cluster, uint32_t end, float x, float width) {
        const float step = end > cluster ? width / static_cast<float>(end - cluster) : 0;
        for (uint32_t i = cluster; i < end; ++i, x += step)
            out_.positions[i] = x;
    }

    TextRun& StartRun(uint8_t font, uint32_t first, uint32_t end, float x) {
        TextRun run;
        run.font = typefaces_.ids[font];
        run.firstGlyph = static_cast<uint32_t>(out_.glyphs.size());
        run.firstCharacter = first;
        run.endCharacter = end;
        run.x = x;
        out_.runs.push_back(run);
        return out_.runs.back();
    }

    const TextRequest& request_;
    const Characters& characters_;
    const LoadedTypefaces& typefaces_;
    GlyphMap& map_;
    const ShapedText* shaped_;
    TextInfo& out_;
    TextEllipsis ellipsis_;
    bool ellipsisInFront_ = false;  // of a text that runs from right to left
};

}  // namespace

void BuildLines(const LineSource& source, const TempVector<LineSpan>& spans, TextInfo& out) {
    LineBuilder(source, out).Build(spans);
}

}  // namespace qorvex::layout
