#include "fresco/cpu/blend_modes.h"

#include <fresco/paint.h>
#include "fresco/cpu/pixels.h"

namespace fresco::cpu {
namespace {

struct Rgb {
    float r, g, b;
};

float HardLight(float s, float d) {
    return s <= 0.5f ? d * 2 * s : d + (2 * s - 1) - d * (2 * s - 1);
}

float SoftLight(float s, float d) {
    if (s <= 0.5f) return d - (1 - 2 * s) * d * (1 - d);
    const float g = d <= 0.25f ? ((16 * d - 12) * d + 4) * d : std::sqrt(d);
    return d + (2 * s - 1) * (g - d);
}

// Colours that are not premultiplied, source over backdrop.
float Separable(uint32_t mode, float s, float d) {
    switch (mode) {
        case kBlendMultiply:
            return s * d;
        case kBlendScreen:
            return s + d - s * d;
        case kBlendOverlay:
            return HardLight(d, s);
        case kBlendDarken:
            return std::min(s, d);
        case kBlendLighten:
            return std::max(s, d);
        case kBlendColorDodge:
            return d <= 0 ? 0 : s >= 1 ? 1 : std::min(1.0f, d / (1 - s));
        case kBlendColorBurn:
            return d >= 1 ? 1 : s <= 0 ? 0 : 1 - std::min(1.0f, (1 - d) / s);
        case kBlendHardLight:
            return HardLight(s, d);
        case kBlendSoftLight:
            return SoftLight(s, d);
        case kBlendDifference:
            return std::abs(s - d);
        case kBlendExclusion:
            return s + d - 2 * s * d;
        default:
            return s;
    }
}

float Luminosity(Rgb c) {
    return 0.3f * c.r + 0.59f * c.g + 0.11f * c.b;
}

Rgb ClipColor(Rgb c) {
    const float l = Luminosity(c), low = std::min({c.r, c.g, c.b}), high = std::max({c.r, c.g, c.b});
    const auto toward = [l](float v, float scale) { return l + (v - l) * scale; };
    if (low < 0) {
        const float scale = l / (l - low);
        c = {toward(c.r, scale), toward(c.g, scale), toward(c.b, scale)};
    }
    if (high > 1) {
        const float scale = (1 - l) / (high - l);
        c = {toward(c.r, scale), toward(c.g, scale), toward(c.b, scale)};
    }
    return c;
}

Rgb SetLuminosity(Rgb c, float l) {
    const float d = l - Luminosity(c);
    return ClipColor({c.r + d, c.g + d, c.b + d});
}

float Saturation(Rgb c) {
    return std::max({c.r, c.g, c.b}) - std::min({c.r, c.g, c.b});
}

Rgb SetSaturation(Rgb c, float s) {
    const float low = std::min({c.r, c.g, c.b}), range = Saturation(c);
    if (range <= 0) return {0, 0, 0};
    const float scale = s / range;
    return {(c.r - low) * scale, (c.g - low) * scale, (c.b - low) * scale};
}

Rgb NonSeparable(uint32_t mode, Rgb s, Rgb d) {
    switch (mode) {
        case kBlendHue:
            return SetLuminosity(SetSaturation(s, Saturation(d)), Luminosity(d));
        case kBlendSaturation:
            return SetLuminosity(SetSaturation(d, Saturation(s)), Luminosity(d));
        case kBlendColor:
            return SetLuminosity(s, Luminosity(d));
        default:
            return SetLuminosity(d, Luminosity(s));
    }
}

struct Operator {
    // Factors of source and destination: 0, 1, alpha of the other, or its complement.
    enum Factor : uint8_t { Zero, One, Alpha, Inverse } source, destination;
};

constexpr Operator kOperators[] = {
    {Operator::Zero, Operator::Zero},        // clear
    {Operator::One, Operator::Zero},         // source
    {Operator::Alpha, Operator::Zero},       // source in
    {Operator::Inverse, Operator::Zero},     // source out
    {Operator::Alpha, Operator::Inverse},    // source atop
    {Operator::Inverse, Operator::One},      // destination over
    {Operator::Zero, Operator::Alpha},       // destination in
    {Operator::Zero, Operator::Inverse},     // destination out
    {Operator::Inverse, Operator::Alpha},    // destination atop
    {Operator::Inverse, Operator::Inverse},  // xor
};

uint32_t Weigh(Operator::Factor factor, uint32_t pixel, uint32_t otherAlpha) {
    switch (factor) {
        case Operator::Zero:
            return 0;
        case Operator::One:
            return pixel;
        case Operator::Alpha:
            return ScalePixel(pixel, otherAlpha);
        default:
            return ScalePixel(pixel, 255 - otherAlpha);
    }
}

// Channel by channel, held at 255: rounding of two products may reach 256.
uint32_t AddSaturated(uint32_t a, uint32_t b) {
    uint32_t sum = 0;
    for (int shift = 0; shift < 32; shift += 8) {
        sum |= std::min(255u, ((a >> shift) & 255) + ((b >> shift) & 255)) << shift;
    }
    return sum;
}

float Channel(uint32_t pixel, int shift) {
    return float((pixel >> shift) & 255) / 255;
}

}  // namespace

uint32_t BlendPixel(uint32_t mode, uint32_t src, uint32_t dst) {
    if (mode == kBlendNormal || mode >= kBlendModeCount) return src + ScalePixel(dst, 255 - (src >> 24));
    if (mode == kBlendAdditive) return AddSaturated(src, dst);
    if (mode >= kBlendClear) {
        const Operator& op = kOperators[mode - kBlendClear];
        return AddSaturated(Weigh(op.source, src, dst >> 24), Weigh(op.destination, dst, src >> 24));
    }
    const float sa = Channel(src, 24), da = Channel(dst, 24);
    if (sa == 0) return dst;
    if (da == 0) return src;
    const Rgb s{Channel(src, 0), Channel(src, 8), Channel(src, 16)};
    const Rgb d{Channel(dst, 0), Channel(dst, 8), Channel(dst, 16)};
    const Rgb us{s.r / sa, s.g / sa, s.b / sa}, ud{d.r / da, d.g / da, d.b / da};
    Rgb mixed;
    if (mode >= kBlendHue) {
        mixed = NonSeparable(mode, us, ud);
    } else {
        mixed = {Separable(mode, us.r, ud.r), Separable(mode, us.g, ud.g), Separable(mode, us.b, ud.b)};
    }
    const auto join = [&](float sc, float dc, float m) {
        return sc * (1 - da) + dc * (1 - sa) + sa * da * m;
    };
    const float alpha = sa + da - sa * da;
    return PackPixel(std::min(alpha, join(s.r, d.r, mixed.r)), std::min(alpha, join(s.g, d.g, mixed.g)),
                     std::min(alpha, join(s.b, d.b, mixed.b)), alpha);
}

void BlendModeRow(uint32_t mode, uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask,
                  uint8_t coverage) {
    for (int i = 0; i < count; ++i) {
        const uint32_t c = mask ? mask[i] : coverage;
        if (c == 0) continue;
        const uint32_t result = BlendPixel(mode, src[i], dst[i]);
        dst[i] = c == 255 ? result : ScalePixel(result, c) + ScalePixel(dst[i], 255 - c);
    }
}

}  // namespace fresco::cpu
