// The outline of a glyph as FreeType has it.
#pragma once
#include "fresco/fonts/font_face.h"

struct FT_FaceRec_;

namespace fresco {

// Leaves `out` empty when there is none. Under the lock of the face.
void ReadOutline(FT_FaceRec_* face, uint32_t glyph, GlyphOutline& out);

}  // namespace fresco
