#include "fresco/cpu/glyph_cache.h"

namespace fresco::cpu {
namespace {

class BitmapSink final : public CoverageSink {
  public:
    BitmapSink(uint8_t* bytes, const IRect& bounds) : bytes_(bytes), bounds_(bounds) {}
    void Span(int y, int x0, int x1, uint8_t coverage) override {
        std::memset(At(x0, y), coverage, size_t(x1 - x0));
    }
    void Mask(int y, int x0, const uint8_t* coverage, int count) override {
        std::memcpy(At(x0, y), coverage, size_t(count));
    }

  private:
    uint8_t* At(int x, int y) {
        return bytes_ + size_t(y - bounds_.y0) * size_t(bounds_.Width()) + size_t(x - bounds_.x0);
    }
    uint8_t* bytes_;
    IRect bounds_;
};

}  // namespace

const GlyphBitmap& GlyphCache::Get(const FontFace& face, uint32_t glyph, float size, int subpixel) {
    const uint32_t quantized = uint32_t(size * 64 + 0.5f);
    const auto [slot, fresh] =
        bitmaps_.try_emplace(Key{face.GetId(), glyph, quantized << 2 | uint32_t(subpixel)});
    GlyphBitmap& bitmap = slot->second;
    if (!fresh) return bitmap;
    const GlyphOutline& outline = face.GetOutline(glyph);
    if (outline.path.points.empty()) return bitmap;
    Homography transform;
    transform.xx = transform.yy = double(quantized) / 64 / face.GetUnitsPerEm();
    transform.x0 = double(subpixel) / kSubpixels;
    const IRect bounds = OutlineBuilder::DeviceBounds(outline.path, transform);
    // A hostile font may claim any extent.
    const int limit = int(kMaxSize) * 8;
    if (bounds.IsEmpty() || bounds.Width() > limit || bounds.Height() > limit) return bitmap;
    bitmap = {bounds.x0, bounds.y0, bounds.Width(), bounds.Height(), bytes_.size()};
    bytes_.resize(bytes_.size() + size_t(bounds.Width()) * size_t(bounds.Height()), 0);
    BitmapSink sink(bytes_.data() + bitmap.offset, bounds);
    rasterizer_.Begin(bounds);
    builder_.AddFill(outline.path, transform, rasterizer_);
    rasterizer_.Sweep(kFillNonZero, sink);
    return bitmap;
}

void GlyphCache::Trim(size_t maxBytes) {
    if (bytes_.size() > maxBytes) Clear();
}

void GlyphCache::Clear() {
    bitmaps_.clear();
    bytes_.clear();
}

}  // namespace fresco::cpu
