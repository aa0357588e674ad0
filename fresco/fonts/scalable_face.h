// A face of a font file (TrueType, CFF, WOFF, WOFF2, collections, named instances of variable fonts): tables
// through HarfBuzz, shapes through FreeType.
//
// Glyph lookup, advances, metrics and shaping stand on immutable HarfBuzz objects, so layout threads need no
// lock for them; FT_Face is not safe to share and is touched under `mutex_` alone, when a shape is asked for
// the first time.
#pragma once
#include <mutex>

#include "fresco/fonts/color_table.h"
#include "fresco/fonts/font_face.h"
#include "fresco/fonts/glyph_table.h"
#include "fresco/fonts/shape_cache.h"

struct FT_FaceRec_;
struct FT_LibraryRec_;
struct hb_blob_t;
struct hb_face_t;

namespace fresco {

class ScalableFace final : public FontFace {
  public:
    explicit ScalableFace(const ShapeSettings& settings) : shapes_(settings) {}
    ~ScalableFace() override;

    // `library` is used under the lock of the service. The high half of the index names an instance of a
    // variable font, from 1.
    bool Load(FT_LibraryRec_* library, FontDataPtr data, uint32_t faceIndex, SdfMode sdf, FontId id);
    // The index, with an instance in its high half, whose style comes nearest to a flag word.
    uint32_t FindInstance(uint32_t flags) const;
    uint32_t GetInstanceCount() const;
    // Of the file.
    uint32_t GetFaceCount() const { return faceCount_; }

    void GetGlyphIndices(const uint32_t* codePoints, size_t count, uint32_t* glyphs) const override;
    FontMetrics GetMetrics(float size) const override;
    bool GetAdvances(const uint32_t* glyphs, size_t count, float size, float* advances) const override;
    bool Shape(const ShapeRequest& request, IShapeSink& sink) const override;
    void PreloadGlyphs(const uint32_t* codePoints, size_t count) const override;
    void PreloadText(const char* utf8, size_t length) const override;

    const GlyphOutline& GetOutline(uint32_t glyph) const override;
    const ColorGlyph* GetColorGlyph(uint32_t glyph) const override;
    const DistanceField* GetDistanceField(uint32_t glyph) const override;

  private:
    // The table keeps an advance with one added to it.
    static constexpr uint32_t kUnknownAdvance = 0, kLargestAdvance = 0xFFFE;

    template <class T>
    using ShapeMap = HashMap<uint32_t, std::unique_ptr<T, HeapDeleter<T>>>;

    bool MakeShaper();
    void ReadColorGraphs();
    void ReadNames();
    void ReadMetrics();
    uint32_t StyleOfInstance(uint32_t instance) const;
    uint32_t Advance(uint32_t glyph) const;
    bool LoadGraph(uint32_t glyph, ColorGlyph& out) const;
    void LoadShape(uint32_t glyph) const;
    void LoadPicture(uint32_t glyph, ColorGlyph& out) const;
    void LoadDistances(uint32_t glyph, DistanceField& out) const;

    FT_FaceRec_* face_ = nullptr;
    hb_face_t* hbFace_ = nullptr;
    hb_font_t* hbFont_ = nullptr;
    bool hasLayers_ = false;  // COLR version 0
    hb_blob_t* colr_ = nullptr;
    ColorTable graphs_{nullptr, 0};  // COLR version 1
    FontMetrics unitMetrics_;        // in font units
    GlyphTable glyphs_;
    // In font units, filled as they are asked for: a font of all Chinese characters has 65,535.
    mutable Vector<std::atomic<uint16_t>> advances_;
    uint32_t faceCount_ = 1;
    mutable ShapeCache shapes_;

    mutable std::mutex mutex_;
    mutable bool graphsRefused_ = false;
    mutable ShapeMap<GlyphOutline> outlines_;
    mutable ShapeMap<ColorGlyph> pictures_;
    mutable ShapeMap<DistanceField> fields_;
};

}  // namespace fresco
