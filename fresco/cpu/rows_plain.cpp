// The plain way of rows.h: the reference for the others, and what processors without SSE2 run.
#include <fresco/paint.h>
#include "fresco/cpu/pixels.h"
#include "fresco/cpu/rows_ways.h"

namespace fresco::cpu {
namespace {

uint32_t Over(uint32_t src, uint32_t dst) {
    return src + ScalePixel(dst, 255 - (src >> 24));
}

// 8-bit weights between two pixels, rounded.
uint32_t Mix(uint32_t a, uint32_t b, uint32_t weight) {
    const uint32_t inverse = 256 - weight;
    const uint32_t even = ((a & 0x00FF00FF) * inverse + (b & 0x00FF00FF) * weight + 0x00800080) >> 8;
    const uint32_t odd = ((a >> 8) & 0x00FF00FF) * inverse + ((b >> 8) & 0x00FF00FF) * weight + 0x00800080;
    return (even & 0x00FF00FF) | (odd & 0xFF00FF00);
}

// As the vector instructions treat a NaN: it becomes the bound.
float AtLeast(float v, float bound) {
    return v > bound ? v : bound;
}

float AtMost(float v, float bound) {
    return v < bound ? v : bound;
}

uint32_t ByteOf(float v) {
    return uint32_t(std::nearbyint(AtMost(AtLeast(v, 0), 1) * 255.0f));
}

void Fill(uint32_t* dst, int count, uint32_t color) {
    for (int i = 0; i < count; ++i)
        dst[i] = color;
}

void BlendSolid(uint32_t* dst, int count, uint32_t color) {
    for (int i = 0; i < count; ++i)
        dst[i] = Over(color, dst[i]);
}

void BlendSolidMask(uint32_t* dst, int count, uint32_t color, const uint8_t* mask) {
    for (int i = 0; i < count; ++i)
        dst[i] = Over(ScalePixel(color, mask[i]), dst[i]);
}

void BlendSolidMasks(uint32_t* dst, size_t pitch, int count, int rows, uint32_t color, const uint8_t* mask,
                     size_t maskPitch) {
    for (int i = 0; i < rows; ++i, dst += pitch, mask += maskPitch)
        BlendSolidMask(dst, count, color, mask);
}

void BlendRow(uint32_t* dst, const uint32_t* src, int count, uint32_t alpha) {
    for (int i = 0; i < count; ++i)
        dst[i] = Over(ScalePixel(src[i], alpha), dst[i]);
}

void BlendRowMask(uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask) {
    for (int i = 0; i < count; ++i)
        dst[i] = Over(ScalePixel(src[i], mask[i]), dst[i]);
}

// What a mode makes of one channel where source and destination meet; s and d times their alphas sa and da.
// https://www.w3.org/TR/compositing-1/#blendingseparable, multiplied by sa * da.
float Meet(uint32_t mode, float s, float d, float sa, float da) {
    const float both = sa * da;
    const float low = (s + s) * d, high = both - (da - d) * (sa - s) * 2;
    switch (mode) {
        case kBlendMultiply:
            return s * d;
        case kBlendScreen:
            return s * da + d * sa - s * d;
        case kBlendOverlay:
            return d + d <= da ? low : high;
        case kBlendDarken:
            return AtMost(s * da, d * sa);
        case kBlendLighten:
            return AtLeast(s * da, d * sa);
        case kBlendColorDodge: {
            const float dodged = sa - s > 0 ? AtMost(d * sa * sa / (sa - s), both) : both;
            return d > 0 ? dodged : 0;
        }
        case kBlendColorBurn: {
            const float burnt = s > 0 ? both - AtMost((da - d) * sa * sa / s, both) : 0;
            return da - d > 0 ? burnt : both;
        }
        case kBlendHardLight:
            return s + s <= sa ? low : high;
        case kBlendSoftLight: {
            const float u = d / AtLeast(da, 1e-6f), m = s + s - sa;
            const float bent = u <= 0.25f ? ((u * 16 - 12) * u + 4) * u : std::sqrt(u);
            return m <= 0 ? d * (sa + m * (1 - u)) : d * sa + da * m * (bent - u);
        }
        case kBlendDifference:
            return AtLeast(s * da, d * sa) - AtMost(s * da, d * sa);
        default:
            return s * da + d * sa - (s + s) * d;
    }
}

void BlendSeparable(uint32_t mode, uint32_t* dst, const uint32_t* src, int count) {
    constexpr float kUnit = 1.0f / 255;
    for (int i = 0; i < count; ++i) {
        const float sa = float(src[i] >> 24) * kUnit, da = float(dst[i] >> 24) * kUnit;
        uint32_t out = ByteOf(sa * (1 - da) + da * (1 - sa) + sa * da) << 24;
        for (int shift = 0; shift < 24; shift += 8) {
            const float s = float(src[i] >> shift & 255) * kUnit, d = float(dst[i] >> shift & 255) * kUnit;
            const uint32_t channel = ByteOf(s * (1 - da) + d * (1 - sa) + Meet(mode, s, d, sa, da));
            out |= std::min(channel, out >> 24) << shift;
        }
        dst[i] = out;
    }
}

uint32_t Weighed(uint32_t pixel, uint32_t other, BlendFactor factor) {
    switch (factor) {
        case BlendFactor::Zero:
            return 0;
        case BlendFactor::One:
            return pixel;
        case BlendFactor::Alpha:
            return ScalePixel(pixel, other >> 24);
        default:
            return ScalePixel(pixel, 255 - (other >> 24));
    }
}

void BlendOperator(uint32_t* dst, const uint32_t* src, int count, BlendFactor source, BlendFactor target) {
    for (int i = 0; i < count; ++i) {
        const uint32_t a = Weighed(src[i], dst[i], source), b = Weighed(dst[i], src[i], target);
        uint32_t sum = 0;
        for (int shift = 0; shift < 32; shift += 8)
            sum |= std::min(255u, (a >> shift & 255) + (b >> shift & 255)) << shift;
        dst[i] = sum;
    }
}

void MixByMask(uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask) {
    for (int i = 0; i < count; ++i)
        dst[i] = ScalePixel(src[i], mask[i]) + ScalePixel(dst[i], 255u - mask[i]);
}

void Scale(uint32_t* row, int count, uint32_t alpha) {
    for (int i = 0; i < count; ++i)
        row[i] = ScalePixel(row[i], alpha);
}

void ScaleByMask(uint32_t* row, int count, const uint8_t* mask) {
    for (int i = 0; i < count; ++i)
        row[i] = ScalePixel(row[i], mask[i]);
}

void ScaleByAlpha(uint32_t* row, const uint32_t* alphas, int count) {
    for (int i = 0; i < count; ++i)
        row[i] = ScalePixel(row[i], alphas[i] >> 24);
}

void MultiplyMask(uint8_t* dst, const uint8_t* src, int count) {
    for (int i = 0; i < count; ++i)
        dst[i] = uint8_t(MulDiv255(dst[i], src[i]));
}

void ScaleMask(uint8_t* dst, const uint8_t* src, int count, uint32_t coverage) {
    for (int i = 0; i < count; ++i)
        dst[i] = uint8_t(MulDiv255(src[i], coverage));
}

void MixRows(uint32_t* dst, const uint32_t* upper, const uint32_t* lower, int count, uint32_t weight) {
    for (int i = 0; i < count; ++i)
        dst[i] = Mix(upper[i], lower[i], weight);
}

void SampleColumns(uint32_t* dst, const uint32_t* row, const int32_t* offsets, const ColumnSample* samples,
                   int count) {
    for (int i = 0; i < count; ++i)
        dst[i] = Mix(row[offsets[i]], row[offsets[i] + 1], samples[i].weights[4]);
}

float Floor(float v) {
    constexpr float kBound = 1 << 30;
    return std::floor(AtLeast(AtMost(v, kBound), -kBound));
}

void SampleTexels(uint32_t* dst, const uint32_t* pixels, const TexelSample* samples, int count) {
    for (int i = 0; i < count; ++i) {
        const TexelSample& s = samples[i];
        dst[i] = Mix(Mix(pixels[s.upper[0]], pixels[s.lower[0]], s.down),
                     Mix(pixels[s.upper[1]], pixels[s.lower[1]], s.down), s.right);
    }
}

// Positions are single floats, multiplied and added in this order, in every way.
float TableIndex(float t, const GradientWalk& walk) {
    if (walk.spread == kSpreadRepeat) {
        t = t - Floor(t / walk.last) * walk.last;
    } else if (walk.spread == kSpreadReflect) {
        const float twice = walk.last + walk.last;
        t = t - Floor(t / twice + 0.5f) * twice;
        t = AtLeast(t, 0 - t);
    }
    return AtMost(AtLeast(t, -1), walk.last) + GradientWalk::kShift;
}

void LinearGradient(uint32_t* dst, int x, int count, const GradientWalk& walk) {
    for (int i = 0; i < count; ++i)
        dst[i] = walk.colors[int(TableIndex(walk.u + walk.du * float(x + i), walk))];
}

void RadialGradient(uint32_t* dst, int x, int count, const GradientWalk& walk) {
    for (int i = 0; i < count; ++i) {
        const float u = walk.u + walk.du * float(x + i), v = walk.v + walk.dv * float(x + i);
        dst[i] = walk.colors[int(TableIndex(std::sqrt(u * u + v * v), walk))];
    }
}

void Ramp(uint32_t* dst, int count, const float* start, const float* step) {
    for (int i = 0; i < count; ++i) {
        dst[i] = 0;
        for (int c = 0; c < 4; ++c) {
            const float v = AtMost(AtLeast(start[c] + step[c] * float(i), 0), 255);
            dst[i] |= uint32_t(std::nearbyint(v)) << (8 * c);
        }
    }
}

void ApplyMatrix(uint32_t* row, int count, const ColorMatrix& matrix) {
    for (int i = 0; i < count; ++i) {
        const uint32_t p = row[i];
        const float alpha = float(p >> 24);
        const float scale = alpha > 0 ? 1 / alpha : 0;
        const float r = float(p & 255) * scale, g = float(p >> 8 & 255) * scale,
                    b = float(p >> 16 & 255) * scale, a = alpha * (1.0f / 255);
        float out[4];
        for (int k = 0; k < 4; ++k) {
            const float* m = matrix.m + k * 5;
            out[k] = m[0] * r + m[1] * g + m[2] * b + m[3] * a + m[4];
            out[k] = AtMost(AtLeast(out[k], 0), 1);
        }
        row[i] = ByteOf(out[0] * out[3]) | ByteOf(out[1] * out[3]) << 8 | ByteOf(out[2] * out[3]) << 16 |
                 ByteOf(out[3]) << 24;
    }
}

void BoxBlur(uint32_t* dst, const uint32_t* src, int count, int before, int after) {
    const float reciprocal = 1.0f / float(before + after + 1);
    uint32_t sums[4] = {};
    const auto step = [&sums](uint32_t p, uint32_t sign) {
        for (int c = 0; c < 4; ++c)
            sums[c] += (p >> (8 * c) & 255) * sign;
    };
    for (int i = 0; i < std::min(after, count); ++i)
        step(src[i], 1);
    for (int i = 0; i < count; ++i) {
        if (i + after < count) step(src[i + after], 1);
        if (i - before - 1 >= 0) step(src[i - before - 1], ~0u);
        uint32_t mean = 0;
        for (int c = 0; c < 4; ++c)
            mean |= uint32_t(std::nearbyint(float(sums[c]) * reciprocal)) << (8 * c);
        dst[i] = mean;
    }
}

void Convolve(uint32_t* dst, const uint32_t* src, int count, const int16_t* weights, int taps) {
    for (int i = 0; i < count; ++i) {
        uint32_t out = 0;
        for (int c = 0; c < 4; ++c) {
            int32_t sum = 0;
            for (int k = 0; k < taps; ++k)
                sum += int32_t(src[i + k] >> (8 * c) & 255) * weights[k];
            out |= uint32_t((sum + 8192) >> 14) << (8 * c);
        }
        dst[i] = out;
    }
}

void Premultiply(uint32_t* row, int count) {
    for (int i = 0; i < count; ++i)
        row[i] = ScalePixel(row[i] | 0xFF000000u, row[i] >> 24);
}

void SwapRedAndBlue(uint32_t* row, int count) {
    for (int i = 0; i < count; ++i)
        row[i] = (row[i] & 0xFF00FF00) | (row[i] & 255) << 16 | (row[i] >> 16 & 255);
}

}  // namespace

const RowLoops kPlainRows = FRESCO_ROW_TABLE;

}  // namespace fresco::cpu
