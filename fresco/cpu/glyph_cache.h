// Coverage bitmaps of glyphs for text that stands upright. Keyed by face, glyph, size and a quarter pixel of
// horizontal position; vertically text sits on whole pixels, which keeps its horizontals sharp. Render
// thread.
#pragma once
#include "fresco/cpu/outline.h"
#include "fresco/fonts/font_face.h"

namespace fresco::cpu {

struct GlyphBitmap {
    int left = 0, top = 0, width = 0, height = 0;  // from the glyph's pixel origin
    size_t offset = 0;                             // into the cache's bytes
};

class GlyphCache {
  public:
    static constexpr int kSubpixels = 4;
    // Beyond this, glyphs are drawn as outlines: they are rare, and their bitmaps would push out the others.
    static constexpr float kMaxSize = 160;

    // `size` in device pixels per em. `field`: from the glyph's distance field, where it has one.
    const GlyphBitmap& Get(const FontFace& face, uint32_t glyph, float size, int subpixel, bool field);
    const uint8_t* Coverage(const GlyphBitmap& bitmap) const { return bytes_.data() + bitmap.offset; }
    // Between frames: bitmaps must not move while a run is drawn.
    void Trim(size_t maxBytes);
    void Clear();

  private:
    void FromOutline(const FontFace& face, uint32_t glyph, double size, int subpixel, GlyphBitmap& out);
    void FromField(const DistanceField& field, double size, int subpixel, GlyphBitmap& out);
    // Room for the coverage; false when a hostile font asks for too much.
    bool Reserve(const IRect& bounds, GlyphBitmap& out);

    struct Key {
        uint32_t font, glyph, size;  // size in 64ths, with field and subpixel in the low bits
        bool operator==(const Key&) const = default;
    };
    struct KeyHash {
        size_t operator()(const Key& k) const {
            return size_t(
                (uint64_t(k.font) << 32 ^ uint64_t(k.glyph) << 20 ^ k.size) * 0x9E3779B97F4A7C15ull >> 16);
        }
    };
    HashMap<Key, GlyphBitmap, KeyHash> bitmaps_;
    Vector<uint8_t> bytes_;
    Rasterizer rasterizer_;
    OutlineBuilder builder_;
};

}  // namespace fresco::cpu
