// Complex path: characters to shaped glyphs, run by run of one font and one direction.
#pragma once

#include <fresco/font.h>

#include "layout/text/glyph_mapping.h"
#include "layout/text/text_layout.h"

namespace qorvex::layout {

// Characters of one font and one level; line feeds belong to none.
struct ShapedSpan {
    uint32_t first = 0;
    uint32_t end = 0;
    uint32_t firstGlyph = 0;
    uint32_t endGlyph = 0;
    uint8_t font = 0;
    uint8_t level = 0;
    bool IsRightToLeft() const { return level & 1; }
};

struct ShapedText {
    TempVector<ShapedSpan> spans;  // in the order of reading
    // Of each span in visual order; clusters count characters of the whole text.
    TempVector<fresco::ShapedGlyph> glyphs;
    // Whether a character begins a cluster: inside of one no line breaks.
    TempVector<uint8_t> clusterStarts;
};

// Fills the map's fonts and advances, where the first character of a cluster has all of its width, and the
// shaped glyphs.
void ShapeText(const TextRequest& request, const Characters& characters, const LoadedTypefaces& typefaces,
               GlyphMap& map, ShapedText& out);

}  // namespace qorvex::layout
