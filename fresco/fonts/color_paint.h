// Glyphs of COLR version 1: a graph of clips, fills, gradients, transforms and composites, painted to a
// picture.
#pragma once
#include "fresco/fonts/font_face.h"

struct FT_FaceRec_;
struct hb_face_t;

namespace fresco {

class ColorTable;

enum class GraphResult {
    Painted,
    Nothing,  // no graph, or one that paints nothing
    TooMuch,  // it costs more than any honest one
};

// `out` is filled when the glyph was painted. Outlines come from one face, the palette from the other. Under
// the lock of the face.
GraphResult PaintColorGraph(const ColorTable& table, FT_FaceRec_* face, hb_face_t* colors, uint32_t glyph,
                            uint32_t pixelsPerEm, ColorGlyph& out);

}  // namespace fresco
