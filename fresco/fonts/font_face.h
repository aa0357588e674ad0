// One face: what IFont tells, and the outlines that back ends draw.
//
// Read-only after Load but for the outline cache. Glyph lookup, advances, metrics and shaping stand on
// immutable HarfBuzz objects and tables that were filled at load, so layout threads need no lock; FT_Face is
// not safe to share and is touched under `mutex_` alone, when an outline is asked for the first time.
#pragma once
#include <mutex>
#include <string>

#include <fresco/font.h>
#include "fresco/paths/path_data.h"

struct FT_FaceRec_;
struct FT_LibraryRec_;
struct hb_face_t;
struct hb_font_t;

namespace fresco {

using HeapString = std::basic_string<char, std::char_traits<char>, StdAllocator<char>>;

// The bytes of a font file, shared by its faces.
struct FontData {
    Vector<uint8_t> bytes;
};

// In font units, y downward. Empty for blanks and for glyphs that are not there.
struct GlyphOutline {
    PathData path;
    float left = 0, top = 0, right = 0, bottom = 0;
};

// A glyph that is a picture (emoji): straight from the font's largest strike, RGBA8 premultiplied.
struct ColorGlyph {
    Vector<uint32_t> pixels;
    uint32_t width = 0, height = 0;
    // Where it lies, in ems from the origin, y downward.
    float left = 0, top = 0, emWidth = 0, emHeight = 0;
};

class FontFace final : public IFont {
  public:
    FontFace() = default;
    ~FontFace();
    FontFace(const FontFace&) = delete;
    FontFace& operator=(const FontFace&) = delete;

    // `library` is used under the lock of the service.
    bool Load(FT_LibraryRec_* library, std::shared_ptr<FontData> data, uint32_t faceIndex, SdfMode sdf,
              FontId id);

    uint32_t GetFlags() const override { return flags_; }
    const char* GetFamilyName() const override { return family_.c_str(); }
    void GetGlyphIndices(const uint32_t* codePoints, size_t count, uint32_t* glyphs) const override;
    FontMetrics GetMetrics(float size) const override;
    bool GetAdvances(const uint32_t* glyphs, size_t count, float size, float* advances) const override;
    bool Shape(const ShapeRequest& request, IShapeSink& sink) const override;
    void MarkAsUserBitmapFont() override { userBitmapFont_.store(true, std::memory_order_relaxed); }
    void PreloadGlyphs(const uint32_t* codePoints, size_t count) const override;
    void PreloadText(const char* utf8, size_t length) const override;
    FontId GetId() const override { return id_; }

    float GetUnitsPerEm() const { return unitsPerEm_; }
    SdfMode GetSdfMode() const { return sdf_; }
    uint32_t GetFaceIndex() const { return faceIndex_; }
    const FontData& GetData() const { return *data_; }
    std::shared_ptr<FontData> ShareData() const { return data_; }
    // Stays valid as long as the face.
    const GlyphOutline& GetOutline(uint32_t glyph) const;
    // Null when the glyph is an outline.
    const ColorGlyph* GetColorGlyph(uint32_t glyph) const;
    bool HasColorGlyphs() const { return hasColor_; }

  private:
    void ReadNames();
    void ReadMetrics();
    void ReadAdvances();
    bool MakeShaper();

    std::shared_ptr<FontData> data_;
    FT_FaceRec_* face_ = nullptr;
    hb_face_t* hbFace_ = nullptr;
    hb_font_t* hbFont_ = nullptr;
    FontId id_ = kNoId;
    uint32_t faceIndex_ = 0;
    uint32_t flags_ = 0;
    SdfMode sdf_ = SdfMode::Never;
    float unitsPerEm_ = 1000;
    bool hasColor_ = false;
    FontMetrics unitMetrics_;  // in font units
    Vector<uint16_t> advances_;
    HeapString family_;
    std::atomic<bool> userBitmapFont_{false};

    mutable std::mutex mutex_;
    mutable HashMap<uint32_t, std::unique_ptr<GlyphOutline, HeapDeleter<GlyphOutline>>> outlines_;
    mutable HashMap<uint32_t, std::unique_ptr<ColorGlyph, HeapDeleter<ColorGlyph>>> colorGlyphs_;
};

// Code points of UTF-8 text; a malformed byte gives U+FFFD. Appends to `out`.
void DecodeUtf8(const char* text, size_t length, Vector<uint32_t>* out);

}  // namespace fresco
