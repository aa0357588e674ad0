// A font of pictures: a glyph table in the text form of AngelCode's BMFont and the pages it points into.
#pragma once
#include <mutex>
#include <string_view>

#include "fresco/fonts/font_face.h"

namespace fresco {

class BitmapFace final : public FontFace {
  public:
    // False, with one line in the log, for a table without glyphs or without usable pages.
    bool Load(std::string_view table, const BitmapFontDescription& description, FontId id);

    void GetGlyphIndices(const uint32_t* codePoints, size_t count, uint32_t* glyphs) const override;
    FontMetrics GetMetrics(float size) const override;
    bool GetAdvances(const uint32_t* glyphs, size_t count, float size, float* advances) const override;
    // Kerning alone; a table of pictures knows no ligatures.
    bool Shape(const ShapeRequest& request, IShapeSink& sink) const override;
    void PreloadGlyphs(const uint32_t* codePoints, size_t count) const override;

    Vector<BitmapFontImage> GetPages() const override;
    const GlyphOutline& GetOutline(uint32_t) const override { return blank_; }
    const ColorGlyph* GetColorGlyph(uint32_t glyph) const override;
    const DistanceField* GetDistanceField(uint32_t) const override { return nullptr; }

  private:
    struct Page {
        Vector<uint32_t> pixels;
        uint32_t width = 0, height = 0;
    };
    // In pixels of the pages.
    struct Character {
        uint32_t code;
        int32_t x, y, width, height, offsetX, offsetY, advance;
        uint32_t page;
    };

    void ReadLine(std::string_view line);
    bool TakePages(const BitmapFontDescription& description);
    void Cut(const Character& character, ColorGlyph& out) const;
    int32_t Kerning(uint32_t first, uint32_t second) const;

    Vector<Page> pages_;
    Vector<Character> characters_;  // by code; glyph i is the character i - 1
    HashMap<uint64_t, int32_t> kernings_;
    float lineHeight_ = 0;
    float base_ = 0;
    GlyphOutline blank_;

    mutable std::mutex mutex_;
    mutable HashMap<uint32_t, std::unique_ptr<ColorGlyph, HeapDeleter<ColorGlyph>>> pictures_;
};

}  // namespace fresco
