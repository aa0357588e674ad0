#include "fresco/cpu/glyph_cache.h"

#include <algorithm>
#include <cmath>
#include <cstring>

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

// The value between the samples of a field; outside of them it is far from any outline.
double Sample(const DistanceField& field, double x, double y) {
    const double left = std::floor(x), top = std::floor(y);
    const auto at = [&](int column, int row) -> double {
        if (column < 0 || row < 0 || column >= field.width || row >= field.height) return 0;
        return field.values[size_t(row) * size_t(field.width) + size_t(column)];
    };
    const int column = int(left), row = int(top);
    const double u = x - left, v = y - top;
    const double upper = at(column, row) * (1 - u) + at(column + 1, row) * u;
    const double lower = at(column, row + 1) * (1 - u) + at(column + 1, row + 1) * u;
    return upper * (1 - v) + lower * v;
}

}  // namespace

const GlyphBitmap& GlyphCache::Get(const FontFace& face, uint32_t glyph, float size, int subpixel,
                                   bool field) {
    const uint32_t quantized = uint32_t(size * 64 + 0.5f);
    const auto [slot, fresh] = bitmaps_.try_emplace(
        Key{face.GetId(), glyph, quantized << 3 | uint32_t(field) << 2 | uint32_t(subpixel)});
    GlyphBitmap& bitmap = slot->second;
    if (!fresh) return bitmap;
    const DistanceField* distances = field ? face.GetDistanceField(glyph) : nullptr;
    if (distances)
        FromField(*distances, double(quantized) / 64, subpixel, bitmap);
    else
        FromOutline(face, glyph, double(quantized) / 64, subpixel, bitmap);
    return bitmap;
}

uint8_t* GlyphCache::Reserve(const IRect& wanted, double size, GlyphBitmap& out) {
    const int reach = int(std::ceil(size * kReach));
    const IRect bounds = Intersect(wanted, {-reach, -reach, reach, reach});
    if (bounds.IsEmpty()) return nullptr;
    uint8_t* bytes = TakeBytes(size_t(bounds.Width()) * size_t(bounds.Height()));
    out = {bounds.x0, bounds.y0, bounds.Width(), bounds.Height(), bytes};
    return bytes;
}

void GlyphCache::FromOutline(const FontFace& face, uint32_t glyph, double size, int subpixel,
                             GlyphBitmap& out) {
    const GlyphOutline& outline = face.GetOutline(glyph);
    if (outline.path.points.empty()) return;
    Homography transform;
    transform.xx = transform.yy = size / face.GetUnitsPerEm();
    transform.x0 = double(subpixel) / kSubpixels;
    const Vec2 first = transform.Apply(outline.left, outline.top);
    const Vec2 last = transform.Apply(outline.right, outline.bottom);
    // Rounding may carry a point over the edge of its pixel.
    constexpr double kSlack = 1e-3;
    const IRect wanted = RoundOut(first.x - kSlack, first.y - kSlack, last.x + kSlack, last.y + kSlack);
    uint8_t* bytes = Reserve(wanted, size, out);
    if (!bytes) return;
    const IRect bounds{out.left, out.top, out.left + out.width, out.top + out.height};
    if (Rasterizer::IsSmall(bounds)) {
        rasterizer_.BeginSmall(bounds);
        builder_.AddFill(outline.path, transform, rasterizer_);
        rasterizer_.SweepInto(bytes);
        return;
    }
    BitmapSink sink(bytes, bounds);
    rasterizer_.Begin(bounds);
    builder_.AddFill(outline.path, transform, rasterizer_);
    rasterizer_.Sweep(kFillNonZero, sink);
}

// The distance to the outline, in pixels of the device, is the coverage of a straight edge at that distance.
void GlyphCache::FromField(const DistanceField& field, double size, int subpixel, GlyphBitmap& out) {
    const double scale = size / DistanceField::kSize;
    const double shift = double(subpixel) / kSubpixels;
    const IRect wanted{int(std::floor(field.left * scale)), int(std::floor(field.top * scale)),
                       int(std::ceil((field.left + field.width) * scale + shift)),
                       int(std::ceil((field.top + field.height) * scale))};
    uint8_t* row = Reserve(wanted, size, out);
    if (!row) return;
    const IRect bounds{out.left, out.top, out.left + out.width, out.top + out.height};
    const double perStep = DistanceField::kSpread / 128.0 * scale;
    for (int y = bounds.y0; y < bounds.y1; ++y, row += bounds.Width()) {
        const double v = (y + 0.5) / scale - field.top - 0.5;
        for (int x = bounds.x0; x < bounds.x1; ++x) {
            const double u = (x + 0.5 - shift) / scale - field.left - 0.5;
            const double coverage = (Sample(field, u, v) - 128) * perStep + 0.5;
            row[x - bounds.x0] = uint8_t(std::clamp(coverage, 0.0, 1.0) * 255 + 0.5);
        }
    }
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
    if (blocks_.empty() || blocks_.back().size() + count > blocks_.back().capacity()) {
        blocks_.emplace_back().reserve(std::max(count, kBlockSize));
        bytes_ += blocks_.back().capacity();
    }
    // Zeroed piece by piece: a few glyphs touch a few pages of the block, not all.
    Vector<uint8_t>& block = blocks_.back();
    block.resize(block.size() + count);
    return block.data() + block.size() - count;
}

void GlyphCache::Trim(size_t maxBytes) {
    if (bytes_ > maxBytes) Clear();
}

void GlyphCache::Clear() {
    bitmaps_.clear();
    pictures_.clear();
    blocks_.clear();
    bytes_ = 0;
}

}  // namespace fresco::cpu
