// Plain path: characters to glyphs, font by font, without shaping.
#pragma once

#include "layout/text/characters.h"
#include "layout/text/text_style.h"

#include <fresco/paint.h>

namespace fresco {
class IFont;
class IFontService;
}  // namespace fresco

namespace qorvex::layout {

// How tall a line is that holds glyphs of one typeface, in pixels.
struct LineMetrics {
    float baseline = 0;
    float height = 0;
};

// The loaded typefaces of a style, in priority order.
struct LoadedTypefaces {
    TempVector<fresco::IFont*> fonts;
    TempVector<uint32_t> ids;
    TempVector<LineMetrics> metrics;
};

struct GlyphMap {
    TempVector<uint32_t> glyphs;
    TempVector<uint8_t> fonts;   // index into LoadedTypefaces
    TempVector<float> advances;  // letter spacing included
    bool mixed = false;          // not all characters have the same font
    float hyphen = 0;            // advance of what a soft hyphen becomes; 0 without one in the text
};

// Empty when nothing is loaded.
void LoadTypefaces(const TextStyle& style, fresco::IFontService& service, bool applyLineHeight,
                   LoadedTypefaces& out);

// Every character gets the first font that has it, else the box of the first font. Advances stay 0.
void MapFonts(const Characters& characters, const LoadedTypefaces& typefaces, GlyphMap& out);
// The glyph and the advance that a soft hyphen has where a line ends behind it.
fresco::Glyph HyphenOf(const fresco::IFont& font, const TextStyle& style);

// The same with advances.
void MapGlyphs(const Characters& characters, const LoadedTypefaces& typefaces, const TextStyle& style,
               GlyphMap& out);

}  // namespace qorvex::layout
