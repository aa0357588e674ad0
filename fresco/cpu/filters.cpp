#include "fresco/cpu/filters.h"

#include "fresco/cpu/blend.h"
#include "fresco/cpu/rows.h"

// https://www.w3.org/TR/filter-effects-1/#ShorthandEquivalents

namespace fresco::cpu {
namespace {

// What mixes r, g and b; rows of the result.
struct Mixer {
    float m[9];
};

constexpr Mixer kIdentity = {{1, 0, 0, 0, 1, 0, 0, 0, 1}};
constexpr Mixer kLuminance = {{0.213f, 0.715f, 0.072f, 0.213f, 0.715f, 0.072f, 0.213f, 0.715f, 0.072f}};
constexpr Mixer kGray = {{0.2126f, 0.7152f, 0.0722f, 0.2126f, 0.7152f, 0.0722f, 0.2126f, 0.7152f, 0.0722f}};
constexpr Mixer kSepia = {{0.393f, 0.769f, 0.189f, 0.349f, 0.686f, 0.168f, 0.272f, 0.534f, 0.131f}};
constexpr Mixer kHueSine = {{-0.213f, -0.715f, 0.928f, 0.143f, 0.140f, -0.283f, -0.787f, 0.715f, 0.072f}};

// `amount` of one and the rest of the other, and a multiple of a third.
ColorMatrix Mix(const Mixer& a, float amount, const Mixer& b, float third = 0, const Mixer& c = kHueSine) {
    ColorMatrix matrix = {};
    for (int row = 0; row < 3; ++row) {
        for (int column = 0; column < 3; ++column) {
            const int i = row * 3 + column;
            matrix.m[row * 5 + column] = a.m[i] * amount + b.m[i] * (1 - amount) + c.m[i] * third;
        }
    }
    matrix.m[18] = 1;
    return matrix;
}

ColorMatrix ScaleColors(float scale, float offset, float alpha = 1) {
    return {{scale, 0, 0, 0, offset, 0, scale, 0, 0, offset, 0, 0, scale, 0, offset, 0, 0, 0, alpha, 0}};
}

// On colours that are not premultiplied, clamped after.
void ApplyMatrix(const Bitmap& bitmap, const ColorMatrix& matrix) {
    for (int y = bitmap.bounds.y0; y < bitmap.bounds.y1; ++y)
        Rows().ApplyMatrix(bitmap.Row(y) + bitmap.bounds.x0, bitmap.bounds.Width(), matrix);
}

// Standard deviations along the device's axes. A Gaussian that is turned stays one; what its axes have in
// common (under a skew, or a turned one of two radii) is left out.
struct Deviation {
    float x, y;
};

Deviation MapDeviation(float x, float y, const Jacobian& j) {
    return {float(std::hypot(j.xx * x, j.xy * y)), float(std::hypot(j.yx * x, j.yy * y))};
}

// Further away than this a shadow is on no screen; it would only make its layer large.
constexpr double kMaxShadowOffset = 8192;

// False when the shadow is nowhere near.
bool MapShadow(const float* v, const Jacobian& j, int* dx, int* dy) {
    const double x = j.xx * v[0] + j.xy * v[1], y = j.yx * v[0] + j.yy * v[1];
    if (!(std::abs(x) <= kMaxShadowOffset) || !(std::abs(y) <= kMaxShadowOffset)) return false;
    *dx = int(std::lround(x)), *dy = int(std::lround(y));
    return true;
}

void ApplyDropShadow(const Bitmap& bitmap, const float* v, const Jacobian& space) {
    PixelBuffer shadow;
    const IRect& bounds = bitmap.bounds;
    int dx = 0, dy = 0;
    if (!MapShadow(v, space, &dx, &dy) || !shadow.Allocate(bounds.Width(), bounds.Height())) return;
    const Bitmap view = shadow.View(bounds.x0, bounds.y0);
    const float alpha = std::clamp(v[6], 0.0f, 1.0f);
    const uint32_t color = PackPixel(v[3] * alpha, v[4] * alpha, v[5] * alpha, alpha);
    for (int y = bounds.y0; y < bounds.y1; ++y) {
        if (y - dy < bounds.y0 || y - dy >= bounds.y1) continue;
        const uint32_t* from = bitmap.Row(y - dy);
        uint32_t* to = view.Row(y);
        const int first = std::max(bounds.x0, bounds.x0 + dx), last = std::min(bounds.x1, bounds.x1 + dx);
        if (first >= last) continue;
        std::fill(to + first, to + last, color);
        Rows().ScaleByAlpha(to + first, from + first - dx, last - first);
    }
    const Deviation deviation = MapDeviation(v[2], v[2], space);
    Blur(view, deviation.x, deviation.y);
    for (int y = bounds.y0; y < bounds.y1; ++y) {
        uint32_t *source = bitmap.Row(y) + bounds.x0, *under = view.Row(y) + bounds.x0;
        BlendRow(under, source, bounds.Width(), nullptr, 255);
        std::memcpy(source, under, size_t(bounds.Width()) * 4);
    }
}

// The two radii of a blur.
Deviation BlurOf(const FilterRecord& filter, const Jacobian& space) {
    const float* v = filter.values;
    return MapDeviation(v[0], filter.kind == uint32_t(FilterKind::AxisBlur) ? v[1] : v[0], space);
}

}  // namespace

void ApplyFilter(const Bitmap& bitmap, const FilterRecord& filter, const Jacobian& space) {
    const float* v = filter.values;
    const float amount = std::max(0.0f, v[0]), part = std::min(1.0f, amount);
    switch (FilterKind(filter.kind)) {
        case FilterKind::Blur:
        case FilterKind::AxisBlur: {
            const Deviation deviation = BlurOf(filter, space);
            return Blur(bitmap, deviation.x, deviation.y);
        }
        case FilterKind::DropShadow:
            return ApplyDropShadow(bitmap, v, space);
        case FilterKind::Brightness:
            return ApplyMatrix(bitmap, ScaleColors(amount, 0));
        case FilterKind::Contrast:
            return ApplyMatrix(bitmap, ScaleColors(amount, 0.5f - 0.5f * amount));
        case FilterKind::Invert:
            return ApplyMatrix(bitmap, ScaleColors(1 - 2 * part, part));
        case FilterKind::Opacity:
            return ApplyMatrix(bitmap, ScaleColors(1, 0, part));
        case FilterKind::Grayscale:
            return ApplyMatrix(bitmap, Mix(kGray, part, kIdentity));
        case FilterKind::Saturate:
            return ApplyMatrix(bitmap, Mix(kIdentity, amount, kLuminance));
        case FilterKind::Sepia:
            return ApplyMatrix(bitmap, Mix(kSepia, part, kIdentity));
        case FilterKind::HueRotate: {
            const float angle = v[0] * 0.017453292f;
            return ApplyMatrix(bitmap, Mix(kIdentity, std::cos(angle), kLuminance, std::sin(angle)));
        }
        case FilterKind::ColorMatrix: {
            ColorMatrix matrix;
            std::copy(v, v + 20, matrix.m);
            return ApplyMatrix(bitmap, matrix);
        }
    }
}

void FilterOutset(const FilterRecord& filter, const Jacobian& space, int outset[4]) {
    const auto grow = [outset](int left, int top, int right, int bottom) {
        outset[0] += std::max(left, 0), outset[1] += std::max(top, 0);
        outset[2] += std::max(right, 0), outset[3] += std::max(bottom, 0);
    };
    if (filter.kind == uint32_t(FilterKind::Blur) || filter.kind == uint32_t(FilterKind::AxisBlur)) {
        const Deviation deviation = BlurOf(filter, space);
        const int x = BlurExtent(deviation.x), y = BlurExtent(deviation.y);
        grow(x, y, x, y);
    } else if (filter.kind == uint32_t(FilterKind::DropShadow)) {
        int dx = 0, dy = 0;
        if (!MapShadow(filter.values, space, &dx, &dy)) return;
        const Deviation deviation = MapDeviation(filter.values[2], filter.values[2], space);
        const int ex = BlurExtent(deviation.x), ey = BlurExtent(deviation.y);
        // The blur needs its own reach around every pixel, even where the offset leads away.
        grow(ex + std::max(-dx, 0), ey + std::max(-dy, 0), ex + std::max(dx, 0), ey + std::max(dy, 0));
    }
}

}  // namespace fresco::cpu
