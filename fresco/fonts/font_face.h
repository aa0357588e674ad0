// One face: what IFont tells the engine, and the shapes that back ends draw.
//
// Read-only after it was loaded but for caches, which only ever gain entries: layout threads and the render
// thread share a face without a lock of their own.
#pragma once
#include <atomic>
#include <memory>
#include <string>

#include <fresco/font.h>
#include "fresco/fonts/font_data.h"
#include "fresco/paths/path_data.h"

namespace fresco {

using HeapString = std::basic_string<char, std::char_traits<char>, StdAllocator<char>>;

// Sizes beyond this are no text any more and would only overflow further down.
inline constexpr float kMaxFontSize = 16384;
inline bool IsValidFontSize(float size) {
    return size > 0 && size <= kMaxFontSize;
}

// In font units, y downward. Empty for blanks and for glyphs that are not there.
struct GlyphOutline {
    PathData path;
    float left = 0, top = 0, right = 0, bottom = 0;
};

// A glyph that is a picture: RGBA8 premultiplied.
struct ColorGlyph {
    Vector<uint32_t> pixels;
    uint32_t width = 0, height = 0;
    // Where it lies, in ems from the origin, y downward.
    float left = 0, top = 0, emWidth = 0, emHeight = 0;
    // Its colours are multiplied by the colour of the text; emoji keep their own.
    bool tinted = false;
};

// Distances to a glyph's outline, sampled at kSize pixels per em: 128 on the outline, more inside, and
// kSpread pixels from one end of the range to the middle.
struct DistanceField {
    static constexpr int kSize = 48;
    static constexpr int kSpread = 8;
    Vector<uint8_t> values;
    int left = 0, top = 0, width = 0, height = 0;  // in field pixels from the origin, y downward
};

class FontFace : public IFont {
  public:
    virtual ~FontFace() = default;
    FontFace(const FontFace&) = delete;
    FontFace& operator=(const FontFace&) = delete;

    uint32_t GetFlags() const override { return flags_; }
    const char* GetFamilyName() const override { return family_.c_str(); }
    void MarkAsUserBitmapFont() override { userBitmapFont_.store(true, std::memory_order_relaxed); }
    void PreloadText(const char* utf8, size_t length) const override;
    FontId GetId() const override { return id_; }

    float GetUnitsPerEm() const { return unitsPerEm_; }
    SdfMode GetSdfMode() const { return sdf_; }
    uint32_t GetFaceIndex() const { return faceIndex_; }
    std::span<const uint8_t> GetBytes() const { return data_->bytes(); }
    FontDataPtr ShareData() const { return data_; }
    // Of a font of pictures, valid as long as the face; none otherwise.
    virtual Vector<BitmapFontImage> GetPages() const { return {}; }
    // Whether a glyph may be a picture at all.
    bool HasColorGlyphs() const { return hasColor_; }
    // What these return stays valid as long as the face.
    virtual const GlyphOutline& GetOutline(uint32_t glyph) const = 0;
    // Null when the glyph is an outline.
    virtual const ColorGlyph* GetColorGlyph(uint32_t glyph) const = 0;
    // Null when there is none: blanks, pictures.
    virtual const DistanceField* GetDistanceField(uint32_t glyph) const = 0;

  protected:
    FontFace() = default;

    FontDataPtr data_;
    FontId id_ = kNoId;
    uint32_t faceIndex_ = 0;
    uint32_t flags_ = 0;
    SdfMode sdf_ = SdfMode::Never;
    float unitsPerEm_ = 1000;
    bool hasColor_ = false;
    HeapString family_;

  private:
    std::atomic<bool> userBitmapFont_{false};
};

// Code points of UTF-8 text; a malformed byte gives U+FFFD. Appends to `out`.
void DecodeUtf8(const char* text, size_t length, Vector<uint32_t>* out);

}  // namespace fresco
