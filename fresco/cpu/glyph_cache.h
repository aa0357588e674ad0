// Coverage bitmaps of glyphs for text that stands upright. Keyed by face, glyph, size and a quarter pixel of
// horizontal position; vertically text sits on whole pixels, which keeps its horizontals sharp.
#pragma once
#include <mutex>

#include "fresco/cpu/outline.h"
#include "fresco/cpu/resources.h"
#include "fresco/fonts/font_face.h"

namespace fresco::cpu {

struct GlyphBitmap {
    int left = 0, top = 0, width = 0, height = 0;  // from the glyph's pixel origin
    const uint8_t* coverage = nullptr;
};

// A bitmap in its place, cut to what is visible.
struct PlacedGlyph {
    const uint8_t* coverage;
    int pitch;
    IRect box;
};

class GlyphCache {
  public:
    static constexpr int kSubpixels = 4;
    // Beyond this, glyphs are drawn as outlines: they are rare, and their bitmaps would push out the others.
    static constexpr float kMaxSize = 160;
    // No bitmap reaches further from its origin than this many ems, whatever the font says.
    static constexpr float kReach = 4;

    // Threads that paint one frame share the cache: one of them reads at a time, a whole run. Bitmaps stay
    // until Trim.
    class Reader {
      public:
        explicit Reader(GlyphCache& cache) : cache_(cache), lock_(cache.mutex_) {}
        // `size` in device pixels per em. `field`: from the glyph's distance field, where it has one.
        const GlyphBitmap& Get(const FontFace& face, uint32_t glyph, float size, int subpixel, bool field) {
            return cache_.Get(face, glyph, size, subpixel, field);
        }
        // A glyph that is a picture; null without memory.
        Texture* GetPicture(const FontFace& face, uint32_t glyph, const ColorGlyph& picture) {
            return cache_.GetPicture(face, glyph, picture);
        }

      private:
        GlyphCache& cache_;
        std::lock_guard<std::mutex> lock_;
    };

    // Between frames.
    void Trim(size_t maxBytes);
    void Clear();

  private:
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

    const GlyphBitmap& Get(const FontFace& face, uint32_t glyph, float size, int subpixel, bool field);
    void FromOutline(const FontFace& face, uint32_t glyph, double size, int subpixel, GlyphBitmap& out);
    void FromField(const DistanceField& field, double size, int subpixel, GlyphBitmap& out);
    // Room for the coverage, cut to what a glyph may reach; null when nothing is left.
    uint8_t* Reserve(const IRect& wanted, double size, GlyphBitmap& out);
    Texture* GetPicture(const FontFace& face, uint32_t glyph, const ColorGlyph& picture);
    uint8_t* TakeBytes(size_t count);

    std::mutex mutex_;
    HashMap<Key, GlyphBitmap, KeyHash> bitmaps_;
    HashMap<uint64_t, Texture> pictures_;
    // Never grown beyond what was reserved, so that glyphs stay in their place.
    static constexpr size_t kBlockSize = 16 << 10;
    Vector<Vector<uint8_t>> blocks_;
    size_t bytes_ = 0;
    Rasterizer rasterizer_;
    OutlineBuilder builder_;
};

}  // namespace fresco::cpu
