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
    const int reach = int(std::ceil(size * kReach));
    const IRect bounds =
        Intersect(OutlineBuilder::DeviceBounds(outline.path, transform), {-reach, -reach, reach, reach});
    if (bounds.IsEmpty()) return bitmap;
    uint8_t* bytes = TakeBytes(size_t(bounds.Width()) * size_t(bounds.Height()));
    bitmap = {bounds.x0, bounds.y0, bounds.Width(), bounds.Height(), bytes};
    BitmapSink sink(bytes, bounds);
    rasterizer_.Begin(bounds);
    builder_.AddFill(outline.path, transform, rasterizer_);
    rasterizer_.Sweep(kFillNonZero, sink);
    return bitmap;
}

Texture* GlyphCache::GetPicture(const FontFace& face, uint32_t glyph, const ColorGlyph& picture) {
    Texture& texture = pictures_[uint64_t(face.GetId()) << 32 | glyph];
    if (texture.width == 0) {
        if (!texture.pixels.Allocate(int(picture.width), int(picture.height))) return nullptr;
        texture.width = picture.width, texture.height = picture.height;
        std::memcpy(texture.pixels.pixels(), picture.pixels.data(), picture.pixels.size() * 4);
    }
    return &texture;
}

uint8_t* GlyphCache::TakeBytes(size_t count) {
    if (blocks_.empty() || blockUsed_ + count > blocks_.back().size()) {
        blocks_.emplace_back(std::max(count, kBlockSize), uint8_t(0));
        blockUsed_ = 0;
        bytes_ += blocks_.back().size();
    }
    uint8_t* bytes = blocks_.back().data() + blockUsed_;
    blockUsed_ += count;
    return bytes;
}

void GlyphCache::Trim(size_t maxBytes) {
    if (bytes_ > maxBytes) Clear();
}

void GlyphCache::Clear() {
    bitmaps_.clear();
    pictures_.clear();
    blocks_.clear();
    blockUsed_ = bytes_ = 0;
}

}  // namespace fresco::cpu
