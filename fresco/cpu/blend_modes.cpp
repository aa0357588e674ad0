#include "fresco/cpu/blend_modes.h"

#include <fresco/paint.h>
#include "fresco/cpu/pixels.h"
#include "fresco/cpu/rows.h"

namespace fresco::cpu {
namespace {

struct Rgb {
    float r, g, b;
};

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

float Channel(uint32_t pixel, int shift) {
    return float((pixel >> shift) & 255) / 255;
}

// Hue, saturation, colour, luminosity: the channels depend on each other.
uint32_t BlendNonSeparable(uint32_t mode, uint32_t src, uint32_t dst) {
    const float sa = Channel(src, 24), da = Channel(dst, 24);
    if (sa == 0) return dst;
    if (da == 0) return src;
    const Rgb s{Channel(src, 0), Channel(src, 8), Channel(src, 16)};
    const Rgb d{Channel(dst, 0), Channel(dst, 8), Channel(dst, 16)};
    const Rgb mixed = NonSeparable(mode, {s.r / sa, s.g / sa, s.b / sa}, {d.r / da, d.g / da, d.b / da});
    const auto join = [&](float sc, float dc, float m) {
        return sc * (1 - da) + dc * (1 - sa) + sa * da * m;
    };
    const float alpha = sa + da - sa * da;
    return PackPixel(std::min(alpha, join(s.r, d.r, mixed.r)), std::min(alpha, join(s.g, d.g, mixed.g)),
                     std::min(alpha, join(s.b, d.b, mixed.b)), alpha);
}

struct Operator {
    BlendFactor source, target;
};

// From kBlendAdditive on.
constexpr Operator kOperators[] = {
    {BlendFactor::One, BlendFactor::One},          // additive
    {BlendFactor::Zero, BlendFactor::Zero},        // clear
    {BlendFactor::One, BlendFactor::Zero},         // source
    {BlendFactor::Alpha, BlendFactor::Zero},       // source in
    {BlendFactor::Inverse, BlendFactor::Zero},     // source out
    {BlendFactor::Alpha, BlendFactor::Inverse},    // source atop
    {BlendFactor::Inverse, BlendFactor::One},      // destination over
    {BlendFactor::Zero, BlendFactor::Alpha},       // destination in
    {BlendFactor::Zero, BlendFactor::Inverse},     // destination out
    {BlendFactor::Inverse, BlendFactor::Alpha},    // destination atop
    {BlendFactor::Inverse, BlendFactor::Inverse},  // xor
};
static_assert(sizeof(kOperators) / sizeof(Operator) == kBlendModeCount - kBlendAdditive);

// Full coverage.
void BlendWhole(uint32_t mode, uint32_t* dst, const uint32_t* src, int count) {
    if (mode == kBlendNormal || mode >= kBlendModeCount) return Rows().BlendRow(dst, src, count, 255);
    if (mode >= kBlendAdditive) {
        const Operator& op = kOperators[mode - kBlendAdditive];
        return Rows().BlendOperator(dst, src, count, op.source, op.target);
    }
    if (mode < kBlendHue) return Rows().BlendSeparable(mode, dst, src, count);
    for (int i = 0; i < count; ++i)
        dst[i] = BlendNonSeparable(mode, src[i], dst[i]);
}

}  // namespace

uint32_t BlendPixel(uint32_t mode, uint32_t src, uint32_t dst) {
    BlendWhole(mode, &dst, &src, 1);
    return dst;
}

void BlendModeRow(uint32_t mode, uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask,
                  uint8_t coverage) {
    if (!mask && coverage == 255) return BlendWhole(mode, dst, src, count);
    constexpr int kPiece = 256;
    uint32_t blended[kPiece];
    uint8_t constant[kPiece];
    if (!mask) std::memset(constant, coverage, sizeof(constant));
    for (int at = 0; at < count; at += kPiece) {
        const int length = std::min(kPiece, count - at);
        std::memcpy(blended, dst + at, size_t(length) * 4);
        BlendWhole(mode, blended, src + at, length);
        Rows().MixByMask(dst + at, blended, length, mask ? mask + at : constant);
    }
}

}  // namespace fresco::cpu
