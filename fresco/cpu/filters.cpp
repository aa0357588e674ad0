#include "fresco/cpu/filters.h"

#include "fresco/cpu/blend.h"
#include "fresco/cpu/rows.h"

// https://www.w3.org/TR/filter-effects-1/#ShorthandEquivalents

namespace fresco::cpu {
namespace {

ColorMatrix SaturateMatrix(float s) {
    return {{0.213f + 0.787f * s,
             0.715f - 0.715f * s,
             0.072f - 0.072f * s,
             0,
             0,
             0.213f - 0.213f * s,
             0.715f + 0.285f * s,
             0.072f - 0.072f * s,
             0,
             0,
             0.213f - 0.213f * s,
             0.715f - 0.715f * s,
             0.072f + 0.928f * s,
             0,
             0,
             0,
             0,
             0,
             1,
             0}};
}

ColorMatrix ScaleMatrix(float scale, float offset) {
    return {{scale, 0, 0, 0, offset, 0, scale, 0, 0, offset, 0, 0, scale, 0, offset, 0, 0, 0, 1, 0}};
}

ColorMatrix SepiaMatrix(float amount) {
    const float s = 1 - std::clamp(amount, 0.0f, 1.0f);
    return {{0.393f + 0.607f * s,
             0.769f - 0.769f * s,
             0.189f - 0.189f * s,
             0,
             0,
             0.349f - 0.349f * s,
             0.686f + 0.314f * s,
             0.168f - 0.168f * s,
             0,
             0,
             0.272f - 0.272f * s,
             0.534f - 0.534f * s,
             0.131f + 0.869f * s,
             0,
             0,
             0,
             0,
             0,
             1,
             0}};
}

ColorMatrix HueMatrix(float degrees) {
    const float c = std::cos(degrees * 0.017453292f), s = std::sin(degrees * 0.017453292f);
    return {{0.213f + c * 0.787f - s * 0.213f,
             0.715f - c * 0.715f - s * 0.715f,
             0.072f - c * 0.072f + s * 0.928f,
             0,
             0,
             0.213f - c * 0.213f + s * 0.143f,
             0.715f + c * 0.285f + s * 0.140f,
             0.072f - c * 0.072f - s * 0.283f,
             0,
             0,
             0.213f - c * 0.213f - s * 0.787f,
             0.715f - c * 0.715f + s * 0.715f,
             0.072f + c * 0.928f + s * 0.072f,
             0,
             0,
             0,
             0,
             0,
             1,
             0}};
}

// On colours that are not premultiplied, clamped after.
void ApplyMatrix(const Bitmap& bitmap, const ColorMatrix& matrix) {
    for (int y = bitmap.bounds.y0; y < bitmap.bounds.y1; ++y)
        Rows().ApplyMatrix(bitmap.Row(y) + bitmap.bounds.x0, bitmap.bounds.Width(), matrix);
}

// Further away than this a shadow is on no screen; it would only make its layer large.
constexpr float kMaxShadowOffset = 8192;

bool ShadowShows(const float* v, float scale) {
    return std::abs(v[0] * scale) <= kMaxShadowOffset && std::abs(v[1] * scale) <= kMaxShadowOffset;
}

void ApplyDropShadow(const Bitmap& bitmap, const float* v, float scale) {
    PixelBuffer shadow;
    const IRect& bounds = bitmap.bounds;
    if (!ShadowShows(v, scale) || !shadow.Allocate(bounds.Width(), bounds.Height())) return;
    const Bitmap view = shadow.View(bounds.x0, bounds.y0);
    const float alpha = std::clamp(v[6], 0.0f, 1.0f);
    const uint32_t color = PackPixel(v[3] * alpha, v[4] * alpha, v[5] * alpha, alpha);
    const int dx = int(std::lround(v[0] * scale)), dy = int(std::lround(v[1] * scale));
    for (int y = bounds.y0; y < bounds.y1; ++y) {
        if (y - dy < bounds.y0 || y - dy >= bounds.y1) continue;
        const uint32_t* from = bitmap.Row(y - dy);
        uint32_t* to = view.Row(y);
        const int first = std::max(bounds.x0, bounds.x0 + dx), last = std::min(bounds.x1, bounds.x1 + dx);
        if (first >= last) continue;
        std::fill(to + first, to + last, color);
        Rows().ScaleByAlpha(to + first, from + first - dx, last - first);
    }
    Blur(view, v[2] * scale, v[2] * scale);
    for (int y = bounds.y0; y < bounds.y1; ++y) {
        uint32_t *source = bitmap.Row(y) + bounds.x0, *under = view.Row(y) + bounds.x0;
        BlendRow(under, source, bounds.Width(), nullptr, 255);
        std::memcpy(source, under, size_t(bounds.Width()) * 4);
    }
}

}  // namespace

void ApplyFilter(const Bitmap& bitmap, const FilterRecord& filter, float scale) {
    const float* v = filter.values;
    const float amount = std::max(0.0f, v[0]), part = std::min(1.0f, amount);
    switch (FilterKind(filter.kind)) {
        case FilterKind::Blur:
            Blur(bitmap, v[0] * scale, v[0] * scale);
            break;
        case FilterKind::AxisBlur:
            Blur(bitmap, v[0] * scale, v[1] * scale);
            break;
        case FilterKind::Brightness:
            ApplyMatrix(bitmap, ScaleMatrix(amount, 0));
            break;
        case FilterKind::Contrast:
            ApplyMatrix(bitmap, ScaleMatrix(amount, 0.5f - 0.5f * amount));
            break;
        case FilterKind::DropShadow:
            ApplyDropShadow(bitmap, v, scale);
            break;
        case FilterKind::Grayscale:
            ApplyMatrix(bitmap, {{0.2126f + 0.7874f * (1 - part),
                                  0.7152f - 0.7152f * (1 - part),
                                  0.0722f - 0.0722f * (1 - part),
                                  0,
                                  0,
                                  0.2126f - 0.2126f * (1 - part),
                                  0.7152f + 0.2848f * (1 - part),
                                  0.0722f - 0.0722f * (1 - part),
                                  0,
                                  0,
                                  0.2126f - 0.2126f * (1 - part),
                                  0.7152f - 0.7152f * (1 - part),
                                  0.0722f + 0.9278f * (1 - part),
                                  0,
                                  0,
                                  0,
                                  0,
                                  0,
                                  1,
                                  0}});
            break;
        case FilterKind::HueRotate:
            ApplyMatrix(bitmap, HueMatrix(v[0]));
            break;
        case FilterKind::Invert:
            ApplyMatrix(bitmap, ScaleMatrix(1 - 2 * part, part));
            break;
        case FilterKind::Opacity:
            ApplyMatrix(bitmap, {{1, 0, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0, part, 0}});
            break;
        case FilterKind::Saturate:
            ApplyMatrix(bitmap, SaturateMatrix(amount));
            break;
        case FilterKind::Sepia:
            ApplyMatrix(bitmap, SepiaMatrix(v[0]));
            break;
        case FilterKind::ColorMatrix: {
            ColorMatrix matrix;
            std::copy(v, v + 20, matrix.m);
            ApplyMatrix(bitmap, matrix);
            break;
        }
    }
}

void FilterOutset(const FilterRecord& filter, float scale, int outset[4]) {
    const auto grow = [outset](int left, int top, int right, int bottom) {
        outset[0] += std::max(left, 0), outset[1] += std::max(top, 0);
        outset[2] += std::max(right, 0), outset[3] += std::max(bottom, 0);
    };
    const float* v = filter.values;
    if (filter.kind == uint32_t(FilterKind::Blur) || filter.kind == uint32_t(FilterKind::AxisBlur)) {
        const bool axis = filter.kind == uint32_t(FilterKind::AxisBlur);
        const int x = BlurExtent(v[0] * scale), y = BlurExtent((axis ? v[1] : v[0]) * scale);
        grow(x, y, x, y);
    } else if (filter.kind == uint32_t(FilterKind::DropShadow) && ShadowShows(v, scale)) {
        const int e = BlurExtent(v[2] * scale);
        const int dx = int(std::lround(v[0] * scale)), dy = int(std::lround(v[1] * scale));
        // The blur needs its own reach around every pixel, even where the offset leads away.
        grow(e + std::max(-dx, 0), e + std::max(-dy, 0), e + std::max(dx, 0), e + std::max(dy, 0));
    }
}

}  // namespace fresco::cpu
