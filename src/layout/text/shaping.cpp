#include "layout/text/shaping.h"

#include <algorithm>

#include "layout/text/complex_ranges.h"
#include "layout/text/direction_runs.h"

namespace qorvex::layout {

namespace {

bool IsLineFeed(uint32_t code) {
    return ClassOf(code) == CharacterClass::LineFeed;
}

// The end of the unit that starts at `first` and must not be split between fonts: a character, what extends
// it, and what joiners tie to it.
size_t UnitEnd(const TempVector<uint32_t>& codes, size_t first) {
    size_t end = first + 1;
    while (end < codes.size() && !IsLineFeed(codes[end]) &&
           (ExtendsCharacter(codes[end]) || codes[end - 1] == kZeroWidthJoiner))
        ++end;
    return end;
}

bool Covers(const fresco::IFont& font, const uint32_t* codes, size_t count) {
    for (size_t i = 0; i < count; ++i) {
        if (IsInvisible(codes[i])) continue;
        uint32_t glyph = 0;
        font.GetGlyphIndices(codes + i, 1, &glyph);
        if (glyph == 0) return false;
    }
    return true;
}

// All characters of a unit get the first font that has all of it, else that of its first character: a mark
// on a letter of another font stands beside it.
void KeepUnitsTogether(const Characters& characters, const LoadedTypefaces& typefaces, GlyphMap& map) {
    const auto& codes = characters.codes;
    for (size_t first = 0; first < codes.size();) {
        const size_t end = UnitEnd(codes, first);
        bool mixed = false;
        for (size_t i = first + 1; i < end; ++i)
            mixed |= map.fonts[i] != map.fonts[first];
        if (mixed) {
            uint8_t chosen = map.fonts[first];
            for (size_t font = 0; font < typefaces.fonts.size(); ++font) {
                if (!Covers(*typefaces.fonts[font], codes.data() + first, end - first)) continue;
                chosen = static_cast<uint8_t>(font);
                break;
            }
            std::fill(map.fonts.begin() + first, map.fonts.begin() + end, chosen);
        }
        first = end;
    }
}

void SplitSpans(const Characters& characters, const GlyphMap& map, const TempVector<uint8_t>& levels,
                TempVector<ShapedSpan>& out) {
    const size_t count = characters.codes.size();
    for (size_t first = 0; first < count;) {
        if (IsLineFeed(characters.codes[first])) {
            ++first;
            continue;
        }
        size_t end = first + 1;
        while (end < count && map.fonts[end] == map.fonts[first] && levels[end] == levels[first] &&
               !IsLineFeed(characters.codes[end]))
            ++end;
        out.push_back({static_cast<uint32_t>(first), static_cast<uint32_t>(end), 0, 0, map.fonts[first],
                       levels[first]});
        first = end;
    }
}

class GlyphSink final : public fresco::IShapeSink {
  public:
    GlyphSink(uint32_t first, TempVector<fresco::ShapedGlyph>& out) : first_(first), out_(out) {}
    void OnGlyphs(const fresco::ShapedGlyph* glyphs, size_t count) override {
        const size_t at = out_.size();
        out_.append(glyphs, glyphs + count);
        for (size_t i = at; i < out_.size(); ++i)
            out_[i].cluster += first_;
    }

  private:
    const uint32_t first_;
    TempVector<fresco::ShapedGlyph>& out_;
};

void ShapeSpan(ShapedSpan& span, const TempVector<uint32_t>& codes, const LoadedTypefaces& typefaces,
               const TextStyle& style, ShapedText& out) {
    fresco::ShapeRequest request;
    request.codePoints = codes.data() + span.first;
    request.count = span.end - span.first;
    request.size = style.usedSize;
    request.direction =
        span.IsRightToLeft() ? fresco::TextDirection::RightToLeft : fresco::TextDirection::LeftToRight;
    request.context = codes.data();
    request.contextCount = codes.size();
    request.contextOffset = span.first;
    GlyphSink sink(span.first, out.glyphs);
    span.firstGlyph = static_cast<uint32_t>(out.glyphs.size());
    typefaces.fonts[span.font]->Shape(request, sink);
    span.endGlyph = static_cast<uint32_t>(out.glyphs.size());
}

// Widths of clusters become those of their first characters.
void TakeAdvances(const TextStyle& style, GlyphMap& map, ShapedText& out) {
    std::fill(map.advances.begin(), map.advances.end(), 0.0f);
    for (const ShapedSpan& span : out.spans) {
        for (uint32_t i = span.firstGlyph; i < span.endGlyph; ++i) {
            fresco::ShapedGlyph& glyph = out.glyphs[i];
            glyph.cluster = std::clamp(glyph.cluster, span.first, span.end - 1);
            map.advances[glyph.cluster] += glyph.advance;
            out.clusterStarts[glyph.cluster] = 1;
        }
        // A run without glyphs is a row of empty clusters.
        if (span.firstGlyph == span.endGlyph)
            std::fill(out.clusterStarts.begin() + span.first, out.clusterStarts.begin() + span.end,
                      uint8_t{1});
        for (uint32_t i = span.first; i < span.end && style.letterSpacing != 0; ++i)
            if (out.clusterStarts[i]) map.advances[i] += style.letterSpacing;
    }
}

}  // namespace

void ShapeText(const TextRequest& request, const Characters& characters, const LoadedTypefaces& typefaces,
               GlyphMap& map, ShapedText& out) {
    const size_t count = characters.codes.size();
    MapFonts(characters, typefaces, map);
    if (map.mixed) KeepUnitsTogether(characters, typefaces, map);
    TempVector<uint8_t> levels;
    ResolveLevels(request, characters, levels);
    SplitSpans(characters, map, levels, out.spans);
    out.clusterStarts.resize(count, uint8_t{0});
    out.glyphs.reserve(count);
    for (ShapedSpan& span : out.spans)
        ShapeSpan(span, characters.codes, typefaces, request.style, out);
    TakeAdvances(request.style, map, out);
}

}  // namespace qorvex::layout
