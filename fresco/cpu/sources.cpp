#include "fresco/cpu/sources.h"

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace fresco::cpu {
namespace {

// x' = (x - x0) * sx and so on, as a homography to compose with.
Homography Affine(double sx, double x0, double sy, double y0) {
    Homography h;
    h.xx = sx, h.x0 = -x0 * sx, h.yy = sy, h.y0 = -y0 * sy;
    return h;
}

// Walks a row of pixel centres through a homography.
template <class Use>
void WalkRow(const Homography& h, int x, int y, int count, Use use) {
    const double px = x + 0.5, py = y + 0.5;
    if (h.IsAffine()) {
        const double u0 = h.xy * py + h.x0, v0 = h.yy * py + h.y0;
        for (int i = 0; i < count; ++i)
            use(i, h.xx * (px + i) + u0, h.yx * (px + i) + v0);
        return;
    }
    for (int i = 0; i < count; ++i) {
        const Vec2 p = h.Project(px + i, py);
        const bool finite = std::abs(p.x) < 1e9 && std::abs(p.y) < 1e9;
        use(i, finite ? p.x : 0, finite ? p.y : 0);
    }
}

#if !defined(__SSE2__)
// Weights of 8 bits between two and then two pixels.
inline uint32_t Lerp(uint32_t a, uint32_t b, uint32_t weight) {
    const uint32_t inverse = 256 - weight;
    const uint32_t even = ((a & 0x00FF00FF) * inverse + (b & 0x00FF00FF) * weight + 0x00800080) >> 8;
    const uint32_t odd = ((a >> 8) & 0x00FF00FF) * inverse + ((b >> 8) & 0x00FF00FF) * weight + 0x00800080;
    return (even & 0x00FF00FF) | (odd & 0xFF00FF00);
}
#endif

// Two by two texels, weights of 8 bits: between the rows first, then between the columns. The vector form
// rounds as the scalar one does.
inline uint32_t Bilinear(const uint32_t* upper, const uint32_t* lower, int x0, int x1, uint32_t wu,
                         uint32_t wv) {
#if defined(__SSE2__)
    const __m128i zero = _mm_setzero_si128(), half = _mm_set1_epi16(128);
    const auto pair = [&](const uint32_t* row) {
        const __m128i texels =
            _mm_unpacklo_epi32(_mm_cvtsi32_si128(int(row[x0])), _mm_cvtsi32_si128(int(row[x1])));
        return _mm_unpacklo_epi8(texels, zero);
    };
    const auto weigh = [&](__m128i a, __m128i b, uint32_t weight) {
        const __m128i sum = _mm_add_epi16(_mm_mullo_epi16(a, _mm_set1_epi16(short(256 - weight))),
                                          _mm_mullo_epi16(b, _mm_set1_epi16(short(weight))));
        return _mm_srli_epi16(_mm_add_epi16(sum, half), 8);
    };
    const __m128i columns = weigh(pair(upper), pair(lower), wv);
    const __m128i pixel = weigh(columns, _mm_srli_si128(columns, 8), wu);
    return uint32_t(_mm_cvtsi128_si32(_mm_packus_epi16(pixel, zero)));
#else
    return Lerp(Lerp(upper[x0], lower[x0], wv), Lerp(upper[x1], lower[x1], wv), wu);
#endif
}

}  // namespace

void GradientTable::Build(const GradientStop* stops, uint32_t count, float opacity) {
    const auto pack = [opacity](const Color& c) {
        return PackPixel(std::min(c.r, c.a) * opacity, std::min(c.g, c.a) * opacity,
                         std::min(c.b, c.a) * opacity, c.a * opacity);
    };
    if (count == 0) {
        std::memset(colors, 0, sizeof(colors));
        return;
    }
    uint32_t next = 0;
    float last = stops[0].offset;
    for (int i = 0; i < kSize; ++i) {
        const float t = float(i) / (kSize - 1);
        // An offset below an earlier one counts as equal to it.
        while (next < count && std::max(last, stops[next].offset) <= t)
            last = std::max(last, stops[next++].offset);
        if (next == 0) {
            colors[i] = pack(stops[0].color);
        } else if (next == count) {
            colors[i] = pack(stops[count - 1].color);
        } else {
            const Color &a = stops[next - 1].color, &b = stops[next].color;
            const float f = (t - last) / (stops[next].offset - last);
            colors[i] = pack(
                {a.r + (b.r - a.r) * f, a.g + (b.g - a.g) * f, a.b + (b.b - a.b) * f, a.a + (b.a - a.a) * f});
        }
    }
}

GradientSource::GradientSource(const LinearGradient& geometry, const Homography& toPlane,
                               const GradientTable& table)
    : spread_(geometry.spread), table_(table) {
    const double dx = geometry.end.x - geometry.start.x, dy = geometry.end.y - geometry.start.y;
    const double squared = dx * dx + dy * dy;
    Homography project;
    if (squared > 1e-12) {
        project.xx = dx / squared, project.xy = dy / squared;
        project.x0 = -(geometry.start.x * dx + geometry.start.y * dy) / squared;
    } else {
        // Start and end in one point: all of it is the last colour.
        project.xx = project.xy = 0, project.x0 = 1;
    }
    project.yx = project.yy = project.y0 = 0;
    toUnit_ = project * toPlane;
}

GradientSource::GradientSource(const RadialGradient& geometry, const Homography& toPlane,
                               const GradientTable& table)
    : radial_(true), spread_(geometry.spread), table_(table) {
    const double rx = std::max<double>(std::abs(geometry.radius.x), 1e-6);
    const double ry = std::max<double>(std::abs(geometry.radius.y), 1e-6);
    toUnit_ = Affine(1 / rx, geometry.center.x, 1 / ry, geometry.center.y) * toPlane;
}

uint32_t GradientSource::Lookup(double t) const {
    if (spread_ == kSpreadRepeat) {
        t -= std::floor(t);
    } else if (spread_ == kSpreadReflect) {
        t = std::abs(t - 2 * std::floor(t / 2 + 0.5));
    }
    const double index = std::clamp(t, 0.0, 1.0) * (GradientTable::kSize - 1) + 0.5;
    return table_.colors[size_t(index)];
}

void GradientSource::Fetch(int x, int y, int count, uint32_t* out) {
    if (radial_) {
        WalkRow(toUnit_, x, y, count,
                [&](int i, double u, double v) { out[i] = Lookup(std::sqrt(u * u + v * v)); });
    } else {
        WalkRow(toUnit_, x, y, count, [&](int i, double u, double) { out[i] = Lookup(u); });
    }
}

ImageSource::ImageSource(Texture& texture, const Placement& placement, const Homography& toPlane,
                         float opacity)
    : alpha_(uint32_t(std::clamp(opacity, 0.0f, 1.0f) * 255 + 0.5f)) {
    Rect source = placement.source;
    if (source.width == 0 || source.height == 0)
        source = {0, 0, 0, float(texture.width), float(texture.height)};
    const Rect& target = placement.target;
    const double sx =
        source.width / std::max<double>(std::abs(target.width), 1e-6) * (target.width < 0 ? -1 : 1);
    const double sy =
        source.height / std::max<double>(std::abs(target.height), 1e-6) * (target.height < 0 ? -1 : 1);
    Homography toTexels =
        Affine(1, -double(source.x), 1, -double(source.y)) * Affine(sx, target.x, sy, target.y) * toPlane;

    int shift = 0;
    const double texelsAPixel = toTexels.MaxScale(target.x, target.y);
    level_ = &texture.Level(1 / std::max(texelsAPixel, 1e-9), &shift);
    // Odd sizes round up, so a level's scale is the ratio of the sizes.
    const double levelX = double(level_->width()) / texture.width,
                 levelY = double(level_->height()) / texture.height;
    toTexels_ = Affine(levelX, 0, levelY, 0) * toTexels;
    left_ = std::max(0.0, source.x * levelX), top_ = std::max(0.0, source.y * levelY);
    right_ = std::min<double>(level_->width(), (source.x + source.width) * levelX);
    bottom_ = std::min<double>(level_->height(), (source.y + source.height) * levelY);
    right_ = std::max(right_, left_ + 1e-3), bottom_ = std::max(bottom_, top_ + 1e-3);
    if (placement.repeatX) periodX_ = (std::abs(target.width) + placement.spacingX) * std::abs(sx) * levelX;
    if (placement.repeatY) periodY_ = (std::abs(target.height) + placement.spacingY) * std::abs(sy) * levelY;
    wrapX_ = periodX_ > 0 && std::abs(periodX_ - (right_ - left_)) < 1e-6 * periodX_;
    wrapY_ = periodY_ > 0 && std::abs(periodY_ - (bottom_ - top_)) < 1e-6 * periodY_;
    // Texel for pixel: rows can be copied.
    const auto whole = [](double v) { return std::abs(v - std::round(v)) < 1.0 / 512; };
    aligned_ = toTexels_.IsScaleTranslate() && std::abs(toTexels_.xx - 1) < 1e-6 &&
               std::abs(toTexels_.yy - 1) < 1e-6 && whole(toTexels_.x0) && whole(toTexels_.y0) &&
               periodX_ == 0 && periodY_ == 0;
}

uint32_t ImageSource::Sample(double u, double v) const {
    if (periodX_ > 0) {
        u = left_ + (u - left_) - std::floor((u - left_) / periodX_) * periodX_;
        if (u > right_ + 0.0 && !wrapX_) return 0;
    }
    if (periodY_ > 0) {
        v = top_ + (v - top_) - std::floor((v - top_) / periodY_) * periodY_;
        if (v > bottom_ + 0.0 && !wrapY_) return 0;
    }
    // Texel centres lie at one half; outside of the source its edge goes on, or the other side comes back.
    const double firstX = std::floor(left_), lastX = std::ceil(right_) - 1;
    const double firstY = std::floor(top_), lastY = std::ceil(bottom_) - 1;
    u -= 0.5, v -= 0.5;
    const double fu = std::floor(u), fv = std::floor(v);
    const uint32_t wu = uint32_t((u - fu) * 256 + 0.5), wv = uint32_t((v - fv) * 256 + 0.5);
    const auto index = [](double i, double first, double last, bool wrap) {
        if (wrap && i < first) i = last;
        if (wrap && i > last) i = first;
        return int(std::clamp(i, first, last));
    };
    const int x0 = index(fu, firstX, lastX, wrapX_), x1 = index(fu + 1, firstX, lastX, wrapX_);
    const int y0 = index(fv, firstY, lastY, wrapY_), y1 = index(fv + 1, firstY, lastY, wrapY_);
    return Bilinear(level_->Row(y0), level_->Row(y1), x0, x1, wu, wv);
}

// Without repeats the position is held inside of the source, so that truncation is floor and no index can
// leave.
void ImageSource::FetchClamped(int x, int y, int count, uint32_t* out) {
    const double firstX = std::floor(left_), lastX = std::ceil(right_) - 1;
    const double firstY = std::floor(top_), lastY = std::ceil(bottom_) - 1;
    const int endX = int(lastX), endY = int(lastY);
    const auto locate = [](double at, double first, double last, int end) {
        const uint32_t fixed = uint32_t(std::min(std::max(at - 0.5, first), last) * 256 + 0.5);
        const int low = int(fixed >> 8);
        return Axis{low, std::min(low + 1, end), fixed & 255};
    };
    if (toTexels_.IsScaleTranslate()) {
        const Axis v = locate(toTexels_.yy * (y + 0.5) + toTexels_.y0, firstY, lastY, endY);
        const uint32_t *upper = level_->Row(v.low), *lower = level_->Row(v.high);
        // A row comes in pieces (edges, middle), the next row in the same ones: keep the columns of all of
        // them.
        const int known = columnsX_ + int(columns_.size());
        if (columns_.empty() || x < columnsX_ || x + count > known) {
            const int first = columns_.empty() ? x : std::min(x, columnsX_);
            const int end = columns_.empty() ? x + count : std::max(x + count, known);
            columnsX_ = first;
            columns_.resize(size_t(end - first));
            WalkRow(toTexels_, first, y, end - first,
                    [&](int i, double at, double) { columns_[size_t(i)] = locate(at, firstX, lastX, endX); });
        }
        const Axis* columns = columns_.data() + (x - columnsX_);
        for (int i = 0; i < count; ++i) {
            const Axis& u = columns[i];
            out[i] = Bilinear(upper, lower, u.low, u.high, u.weight, v.weight);
        }
        return;
    }
    WalkRow(toTexels_, x, y, count, [&](int i, double atX, double atY) {
        const Axis u = locate(atX, firstX, lastX, endX), v = locate(atY, firstY, lastY, endY);
        out[i] = Bilinear(level_->Row(v.low), level_->Row(v.high), u.low, u.high, u.weight, v.weight);
    });
}

void ImageSource::FetchAligned(int u, int v, int count, uint32_t* out) const {
    const int first = int(left_), last = int(std::ceil(right_)) - 1;
    const uint32_t* row = level_->Row(std::clamp(v, int(top_), int(std::ceil(bottom_)) - 1));
    if (u >= first && u + count <= last + 1) {
        std::memcpy(out, row + u, size_t(count) * 4);
        return;
    }
    for (int i = 0; i < count; ++i)
        out[i] = row[std::clamp(u + i, first, last)];
}

void ImageSource::Fetch(int x, int y, int count, uint32_t* out) {
    if (aligned_) {
        FetchAligned(x + int(std::lround(toTexels_.x0)), y + int(std::lround(toTexels_.y0)), count, out);
    } else if (periodX_ == 0 && periodY_ == 0) {
        FetchClamped(x, y, count, out);
    } else {
        WalkRow(toTexels_, x, y, count, [&](int i, double u, double v) { out[i] = Sample(u, v); });
    }
    if (alpha_ != 255) {
        for (int i = 0; i < count; ++i)
            out[i] = ScalePixel(out[i], alpha_);
    }
}

void WindowSource::Fetch(int x, int y, int count, uint32_t* out) {
    inner_.Fetch(x, y, count, out);
    if (placement_.repeatX && placement_.repeatY) return;
    const Rect& t = placement_.target;
    WalkRow(toPlane_, x, y, count, [&](int i, double u, double v) {
        const bool inX = placement_.repeatX || (u >= t.x && u < double(t.x) + t.width);
        const bool inY = placement_.repeatY || (v >= t.y && v < double(t.y) + t.height);
        if (!inX || !inY) out[i] = 0;
    });
}

YuvSource::YuvSource(const Texture* const planes[4], const Rect& target, const Homography& toPlane,
                     float opacity)
    : opacity_(opacity) {
    std::copy(planes, planes + 4, planes_);
    toUnit_ = Affine(1 / std::max<double>(target.width, 1e-6), target.x,
                     1 / std::max<double>(target.height, 1e-6), target.y) *
              toPlane;
}

void YuvSource::Fetch(int x, int y, int count, uint32_t* out) {
    const auto sample = [](const Texture& plane, double u, double v) {
        const double px = std::clamp(u * plane.width - 0.5, 0.0, plane.width - 1.0);
        const double py = std::clamp(v * plane.height - 0.5, 0.0, plane.height - 1.0);
        const size_t x0 = size_t(px), y0 = size_t(py);
        const size_t x1 = std::min<size_t>(x0 + 1, plane.width - 1),
                     y1 = std::min<size_t>(y0 + 1, plane.height - 1);
        const float fx = float(px - double(x0)), fy = float(py - double(y0));
        const uint8_t *a = plane.alpha.data() + y0 * plane.width, *b = plane.alpha.data() + y1 * plane.width;
        return (a[x0] * (1 - fx) + a[x1] * fx) * (1 - fy) + (b[x0] * (1 - fx) + b[x1] * fx) * fy;
    };
    WalkRow(toUnit_, x, y, count, [&](int i, double u, double v) {
        const float l = (sample(*planes_[0], u, v) - 16) * (1.164383f / 255);
        const float cb = (sample(*planes_[1], u, v) - 128) / 255,
                    cr = (sample(*planes_[2], u, v) - 128) / 255;
        const float alpha = (planes_[3] ? sample(*planes_[3], u, v) / 255 : 1) * opacity_;
        const auto clamp = [](float c) { return std::clamp(c, 0.0f, 1.0f); };
        out[i] =
            PackPixel(clamp(l + 1.596027f * cr) * alpha, clamp(l - 0.391762f * cb - 0.812968f * cr) * alpha,
                      clamp(l + 2.017232f * cb) * alpha, alpha);
    });
}

}  // namespace fresco::cpu
