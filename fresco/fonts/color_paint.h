// Glyphs of COLR version 1: a graph of clips, fills, gradients, transforms and composites, painted to a
// picture.
#pragma once
#include "fresco/fonts/font_face.h"

struct FT_FaceRec_;
struct hb_face_t;

namespace fresco {

class ColorTable;

// False, with `out` untouched, when the glyph has no such graph, paints nothing, or costs more than any
// honest one. Outlines come from one face, the palette from the other. Under the lock of the face.
bool PaintColorGraph(const ColorTable& table, FT_FaceRec_* face, hb_face_t* colors, uint32_t glyph,
                     uint32_t pixelsPerEm, ColorGlyph& out);

}  // namespace fresco
