// Reading the COLR table, version 1. The FreeType of the distributions comes without its reader, and HarfBuzz
// has one from version 7 on. Nothing of the table is trusted: what lies outside of it reads as 0.
#pragma once
#include <array>
#include <cstddef>
#include <cstdint>

namespace fresco {

// https://learn.microsoft.com/typography/opentype/spec/colr. The odd numbers between are the same with
// variations, of which the default values are taken.
enum class PaintFormat : uint8_t {
    ColrLayers = 1,
    Solid = 2,
    LinearGradient = 4,
    RadialGradient = 6,
    SweepGradient = 8,
    Glyph = 10,
    ColrGlyph = 11,
    Transform = 12,
    Translate = 14,
    Scale = 16,
    ScaleAround = 18,
    ScaleUniform = 20,
    ScaleUniformAround = 22,
    Rotate = 24,
    RotateAround = 26,
    Skew = 28,
    SkewAround = 30,
    Composite = 32,
};

class ColorTable {
  public:
    ColorTable(const void* data, size_t size);

    // Version 1 with glyphs in it.
    bool HasGraphs() const { return glyphCount_ > 0; }
    // The place of the glyph's first paint; 0 when it has none.
    uint32_t FindGlyph(uint32_t glyph) const;
    // Left, bottom, right, top. False when the glyph has no box.
    bool FindClipBox(uint32_t glyph, std::array<double, 4>* box) const;
    // The place of a paint of the list that all glyphs share; 0 when there is none.
    uint32_t FindLayer(uint32_t index) const;

    // Numbers at a place of the table.
    uint32_t Byte(size_t at) const { return at < size_ ? data_[at] : 0; }
    uint32_t Word(size_t at) const { return Byte(at) << 8 | Byte(at + 1); }
    uint32_t Long(size_t at) const { return Word(at) << 16 | Word(at + 2); }
    double Signed(size_t at) const { return int16_t(Word(at)); }
    double F2Dot14(size_t at) const { return double(int16_t(Word(at))) / 16384; }
    double Fixed(size_t at) const { return double(int32_t(Long(at))) / 65536; }
    // Where a 24-bit offset leads to that counts from `base`; 0 when out of the table.
    uint32_t Follow(uint32_t base, size_t at) const { return Inside(base, Byte(at) << 16 | Word(at + 1)); }

  private:
    uint32_t Inside(uint32_t base, uint32_t offset) const {
        return offset != 0 && uint64_t(base) + offset < size_ ? base + offset : 0;
    }

    const uint8_t* data_;
    size_t size_;
    uint32_t glyphs_ = 0, glyphCount_ = 0;
    uint32_t layers_ = 0, layerCount_ = 0;
    uint32_t clips_ = 0, clipCount_ = 0;
};

}  // namespace fresco
