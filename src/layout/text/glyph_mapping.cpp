#include "layout/text/glyph_mapping.h"

#include <fresco/font.h>

#include <algorithm>

#include "layout/text/complex_ranges.h"

namespace qorvex::layout {

namespace {

// Typefaces beyond this many are not looked at: their index is a byte.
constexpr size_t kMostTypefaces = 255;
constexpr uint8_t kNoFont = 0xFF;

LineMetrics MetricsOf(const fresco::IFont& font, const TextStyle& style, bool applyLineHeight) {
    const fresco::FontMetrics metrics = font.GetMetrics(style.usedSize);
    const float content = std::ceil(metrics.descent - metrics.ascent + metrics.lineGap);
    if (!applyLineHeight || style.lineHeight < 0) {
        return {std::round(metrics.lineGap - metrics.ascent), std::round(content)};
    }
    const float scale = style.fontSize > 0 ? style.usedSize / style.fontSize : 1;
    const float height = std::ceil(scale * style.lineHeight);
    return {std::round(-metrics.ascent + metrics.lineGap + (height - content) * 0.5f), std::round(height)};
}

// Gives the font's glyphs to the characters from first to end that have none yet; returns how many stay
// without.
size_t MapSpan(const Characters& characters, const fresco::IFont& font, uint8_t index, size_t first,
               size_t end, GlyphMap& out) {
    font.GetGlyphIndices(characters.codes.data() + first, end - first, out.glyphs.data() + first);
    size_t missing = 0;
    for (size_t i = first; i < end; ++i) {
        if (out.glyphs[i] == 0)
            ++missing;
        else
            out.fonts[i] = index;
    }
    return missing;
}

// A space between two characters of one font takes that font, so that it does not split their run.
void JoinSpaces(const Characters& characters, const LoadedTypefaces& typefaces, GlyphMap& map) {
    for (size_t i = 1; i + 1 < map.fonts.size(); ++i) {
        if (ClassOf(characters.codes[i]) != CharacterClass::Space) continue;
        const uint8_t font = map.fonts[i - 1];
        if (font == map.fonts[i] || font != map.fonts[i + 1]) continue;
        const uint32_t code = 0x20;
        uint32_t glyph = 0;
        typefaces.fonts[font]->GetGlyphIndices(&code, 1, &glyph);
        if (glyph == 0) continue;
        map.glyphs[i] = glyph;
        map.fonts[i] = font;
    }
}

// Joiners, marks of direction and places for a hyphen show nothing, whether a font has a sign for them or
// not.
void HideInvisible(const Characters& characters, const LoadedTypefaces& typefaces, const TextStyle& style,
                   GlyphMap& map) {
    for (size_t i = 0; i < map.glyphs.size(); ++i) {
        if (!IsInvisible(characters.codes[i])) continue;
        if (characters.codes[i] == kSoftHyphen)
            map.hyphen = std::max(map.hyphen, HyphenOf(*typefaces.fonts[map.fonts[i]], style).x);
        const uint32_t space = 0x20;
        typefaces.fonts[map.fonts[i]]->GetGlyphIndices(&space, 1, &map.glyphs[i]);
        map.advances[i] = 0;
    }
}

void MeasureAdvances(const Characters& characters, const LoadedTypefaces& typefaces, const TextStyle& style,
                     GlyphMap& map) {
    const size_t count = map.glyphs.size();
    for (size_t first = 0; first < count;) {
        size_t end = first + 1;
        while (end < count && map.fonts[end] == map.fonts[first])
            ++end;
        typefaces.fonts[map.fonts[first]]->GetAdvances(map.glyphs.data() + first, end - first, style.usedSize,
                                                       map.advances.data() + first);
        first = end;
    }
    if (style.letterSpacing == 0 && !characters.hasLineFeeds) return;
    for (size_t i = 0; i < count; ++i) {
        const bool lineFeed = ClassOf(characters.codes[i]) == CharacterClass::LineFeed;
        map.advances[i] = lineFeed ? 0 : map.advances[i] + style.letterSpacing;
    }
}

}  // namespace

void LoadTypefaces(const TextStyle& style, fresco::IFontService& service, bool applyLineHeight,
                   LoadedTypefaces& out) {
    for (const uint32_t id : style.typefaces) {
        fresco::IFont* font = id == css::kNoTypeface ? nullptr : service.GetFont(id);
        if (font == nullptr || out.fonts.size() == kMostTypefaces) continue;
        out.fonts.push_back(font);
        out.ids.push_back(id);
        out.metrics.push_back(MetricsOf(*font, style, applyLineHeight));
    }
}

void MapFonts(const Characters& characters, const LoadedTypefaces& typefaces, GlyphMap& out) {
    const size_t count = characters.codes.size();
    out.glyphs.resize(count, 0u);
    out.fonts.resize(count, kNoFont);
    out.advances.resize(count, 0.0f);
    for (size_t i = 0; i < count && characters.hasLineFeeds; ++i) {
        if (ClassOf(characters.codes[i]) == CharacterClass::LineFeed) out.fonts[i] = 0;
    }
    size_t missing = count;
    for (size_t font = 0; font < typefaces.fonts.size() && missing > 0; ++font) {
        missing = 0;
        for (size_t first = 0; first < count;) {
            if (out.fonts[first] != kNoFont) {
                ++first;
                continue;
            }
            size_t end = first + 1;
            while (end < count && out.fonts[end] == kNoFont)
                ++end;
            missing +=
                MapSpan(characters, *typefaces.fonts[font], static_cast<uint8_t>(font), first, end, out);
            first = end;
        }
    }
    std::replace(out.fonts.begin(), out.fonts.end(), kNoFont, uint8_t{0});
    const auto other = [&](uint8_t font) { return font != out.fonts[0]; };
    out.mixed = std::any_of(out.fonts.begin(), out.fonts.end(), other);
    if (out.mixed) JoinSpaces(characters, typefaces, out);
}

fresco::Glyph HyphenOf(const fresco::IFont& font, const TextStyle& style) {
    const uint32_t code = '-';
    fresco::Glyph hyphen{};
    font.GetGlyphIndices(&code, 1, &hyphen.index);
    font.GetAdvances(&hyphen.index, 1, style.usedSize, &hyphen.x);
    return hyphen;
}

void MapGlyphs(const Characters& characters, const LoadedTypefaces& typefaces, const TextStyle& style,
               GlyphMap& out) {
    MapFonts(characters, typefaces, out);
    MeasureAdvances(characters, typefaces, style, out);
    if (characters.highest >= kFirstInvisible) HideInvisible(characters, typefaces, style, out);
}

}  // namespace qorvex::layout
