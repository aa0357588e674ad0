#include "fresco/cpu/blend.h"

#include <cstring>

#include <fresco/paint.h>
#include "fresco/cpu/blend_modes.h"
#include "fresco/cpu/pixels.h"
#if defined(__SSE2__)
#include <emmintrin.h>
#endif

// Each SSE2 loop gives bit for bit what its scalar tail gives: MulDiv255 rounds exactly in both.

namespace fresco::cpu {
namespace {

inline uint32_t Over(uint32_t src, uint32_t dst) {
    return src + ScalePixel(dst, 255 - (src >> 24));
}

void FillPixels(uint32_t* dst, int count, uint32_t color) {
    int i = 0;
#if defined(__SSE2__)
    const __m128i four = _mm_set1_epi32(int(color));
    for (; i + 16 <= count; i += 16) {
        auto* out = reinterpret_cast<__m128i*>(dst + i);
        _mm_storeu_si128(out, four);
        _mm_storeu_si128(out + 1, four);
        _mm_storeu_si128(out + 2, four);
        _mm_storeu_si128(out + 3, four);
    }
#endif
    for (; i < count; ++i)
        dst[i] = color;
}

#if defined(__SSE2__)
// 16-bit lanes: a * b / 255, rounded.
inline __m128i MulDiv255(__m128i a, __m128i b) {
    const __m128i t = _mm_add_epi16(_mm_mullo_epi16(a, b), _mm_set1_epi16(128));
    return _mm_srli_epi16(_mm_add_epi16(t, _mm_srli_epi16(t, 8)), 8);
}

// The alpha of each of the two unpacked pixels in all of its lanes.
inline __m128i SpreadAlpha(__m128i unpacked) {
    return _mm_shufflehi_epi16(_mm_shufflelo_epi16(unpacked, 0xFF), 0xFF);
}

// src over dst, two unpacked pixels each.
inline __m128i OverUnpacked(__m128i src, __m128i dst) {
    const __m128i inverse = _mm_sub_epi16(_mm_set1_epi16(255), SpreadAlpha(src));
    return _mm_add_epi16(src, MulDiv255(dst, inverse));
}

// Four coverage bytes as 16-bit lanes over two pixels each.
inline void SpreadCoverage(const uint8_t* mask, __m128i* low, __m128i* high) {
    int32_t bytes;
    std::memcpy(&bytes, mask, 4);
    __m128i c = _mm_cvtsi32_si128(bytes);
    c = _mm_unpacklo_epi8(c, c);
    c = _mm_unpacklo_epi16(c, c);
    *low = _mm_unpacklo_epi8(c, _mm_setzero_si128());
    *high = _mm_unpackhi_epi8(c, _mm_setzero_si128());
}
#endif

}  // namespace

void BlendSolid(uint32_t* dst, int count, uint32_t color, uint8_t coverage) {
    if (coverage != 255) color = ScalePixel(color, coverage);
    const uint32_t alpha = color >> 24;
    if (alpha == 255) return FillPixels(dst, count, color);
    if (color == 0) return;
    int i = 0;
#if defined(__SSE2__)
    const __m128i zero = _mm_setzero_si128();
    const __m128i source = _mm_unpacklo_epi8(_mm_set1_epi32(int(color)), zero);
    const __m128i inverse = _mm_set1_epi16(short(255 - alpha));
    for (; i + 4 <= count; i += 4) {
        const __m128i d = _mm_loadu_si128(reinterpret_cast<const __m128i*>(dst + i));
        const __m128i low = _mm_add_epi16(source, MulDiv255(_mm_unpacklo_epi8(d, zero), inverse));
        const __m128i high = _mm_add_epi16(source, MulDiv255(_mm_unpackhi_epi8(d, zero), inverse));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + i), _mm_packus_epi16(low, high));
    }
#endif
    for (; i < count; ++i)
        dst[i] = Over(color, dst[i]);
}

void BlendSolidMask(uint32_t* dst, int count, uint32_t color, const uint8_t* mask) {
    int i = 0;
#if defined(__SSE2__)
    const __m128i zero = _mm_setzero_si128();
    const __m128i source = _mm_unpacklo_epi8(_mm_set1_epi32(int(color)), zero);
    for (; i + 4 <= count; i += 4) {
        uint32_t any;
        std::memcpy(&any, mask + i, 4);
        if (any == 0) continue;
        __m128i coverLow, coverHigh;
        SpreadCoverage(mask + i, &coverLow, &coverHigh);
        const __m128i d = _mm_loadu_si128(reinterpret_cast<const __m128i*>(dst + i));
        const __m128i low = OverUnpacked(MulDiv255(source, coverLow), _mm_unpacklo_epi8(d, zero));
        const __m128i high = OverUnpacked(MulDiv255(source, coverHigh), _mm_unpackhi_epi8(d, zero));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + i), _mm_packus_epi16(low, high));
    }
#endif
    for (; i < count; ++i) {
        if (mask[i]) dst[i] = Over(ScalePixel(color, mask[i]), dst[i]);
    }
}

void BlendRow(uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask, uint8_t coverage) {
    int i = 0;
#if defined(__SSE2__)
    const __m128i zero = _mm_setzero_si128();
    const __m128i opaque = _mm_set1_epi8(-1);
    __m128i coverLow = _mm_set1_epi16(coverage), coverHigh = coverLow;
    for (; i + 4 <= count; i += 4) {
        const __m128i s = _mm_loadu_si128(reinterpret_cast<const __m128i*>(src + i));
        if (mask) {
            uint32_t any;
            std::memcpy(&any, mask + i, 4);
            if (any == 0) continue;
            SpreadCoverage(mask + i, &coverLow, &coverHigh);
        } else if (coverage == 255) {
            // Opaque and blank pixels are most of any layer or picture.
            const int alphas = _mm_movemask_epi8(_mm_cmpeq_epi8(s, opaque)) & 0x8888;
            if (alphas == 0x8888) {
                _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + i), s);
                continue;
            }
            if (_mm_movemask_epi8(_mm_cmpeq_epi8(s, zero)) == 0xFFFF) continue;
        }
        const __m128i d = _mm_loadu_si128(reinterpret_cast<const __m128i*>(dst + i));
        const __m128i sLow = MulDiv255(_mm_unpacklo_epi8(s, zero), coverLow);
        const __m128i sHigh = MulDiv255(_mm_unpackhi_epi8(s, zero), coverHigh);
        const __m128i low = OverUnpacked(sLow, _mm_unpacklo_epi8(d, zero));
        const __m128i high = OverUnpacked(sHigh, _mm_unpackhi_epi8(d, zero));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + i), _mm_packus_epi16(low, high));
    }
#endif
    for (; i < count; ++i)
        dst[i] = Over(ScalePixel(src[i], mask ? mask[i] : coverage), dst[i]);
}

void BlendRowMode(uint32_t mode, uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask,
                  uint8_t coverage) {
    if (mode == kBlendNormal) return BlendRow(dst, src, count, mask, coverage);
    // Each frame starts with the one and may end with the other, over the whole target.
    if (!mask && coverage == 255 && mode == kBlendClear) return FillPixels(dst, count, 0);
    if (!mask && coverage == 255 && mode == kBlendSource) {
        std::memcpy(dst, src, size_t(count) * sizeof(uint32_t));
        return;
    }
    for (int i = 0; i < count; ++i) {
        const uint32_t c = mask ? mask[i] : coverage;
        if (c == 0) continue;
        const uint32_t result = BlendPixel(mode, src[i], dst[i]);
        // Coverage is how much of the pixel changes, for every operator.
        dst[i] = c == 255 ? result : ScalePixel(result, c) + ScalePixel(dst[i], 255 - c);
    }
}

bool AffectsOutside(uint32_t mode) {
    return mode == kBlendClear || mode == kBlendSource || mode == kBlendSourceIn || mode == kBlendSourceOut ||
           mode == kBlendDestinationIn || mode == kBlendDestinationAtop;
}

}  // namespace fresco::cpu
