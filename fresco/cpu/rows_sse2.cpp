// The SSE2 way of rows.h, which every x86-64 processor has.
#include <fresco/paint.h>
#include "fresco/cpu/pixels.h"
#include "fresco/cpu/rows_ways.h"

#if defined(__SSE2__)
#include <emmintrin.h>

namespace fresco::cpu {
namespace {

// Four pixels.
using Wide = __m128i;
using WideFloat = __m128;
constexpr int kWide = 4;
#define FRESCO_PARTIAL_STORES 0
#define WIDE(name) _mm_##name
#define WIDE_SI(name) _mm_##name##_si128

// Coverage bytes of the pixels, each in all four bytes of its own.
inline Wide SpreadCoverage(const uint8_t* mask) {
    int32_t bytes;
    std::memcpy(&bytes, mask, 4);
    const Wide c = _mm_cvtsi32_si128(bytes);
    const Wide twice = _mm_unpacklo_epi8(c, c);
    return _mm_unpacklo_epi16(twice, twice);
}

inline bool AllCovered(const uint8_t* mask, uint32_t what) {
    uint32_t bytes;
    std::memcpy(&bytes, mask, 4);
    return bytes == what;
}

// Alphas of unpacked pixels in all of their lanes.
inline Wide SpreadAlpha(Wide unpacked) {
    return _mm_shufflehi_epi16(_mm_shufflelo_epi16(unpacked, 0xFF), 0xFF);
}

// The alphas of pixels in both 16-bit lanes of each.
inline Wide AlphaWords(Wide pixels) {
    const Wide alphas = _mm_srli_epi32(pixels, 24);
    return _mm_or_si128(alphas, _mm_slli_epi32(alphas, 16));
}

inline bool AllOpaque(Wide pixels) {
    return (_mm_movemask_epi8(_mm_cmpeq_epi8(pixels, _mm_set1_epi32(-1))) & 0x8888) == 0x8888;
}

inline bool AllBlank(Wide pixels) {
    return _mm_movemask_epi8(_mm_cmpeq_epi8(pixels, _mm_setzero_si128())) == 0xFFFF;
}

inline Wide Lookup(const uint32_t* table, Wide index) {
    alignas(16) int32_t at[4];
    _mm_store_si128(reinterpret_cast<Wide*>(at), index);
    return _mm_set_epi32(int(table[at[3]]), int(table[at[2]]), int(table[at[1]]), int(table[at[0]]));
}

inline Wide Ascending() {
    return _mm_set_epi32(3, 2, 1, 0);
}

inline WideFloat Greater(WideFloat a, WideFloat b) {
    return _mm_cmpgt_ps(a, b);
}

#include "fresco/cpu/rows_wide.inc"

const RowLoops kRows = FRESCO_ROW_TABLE;

}  // namespace

const RowLoops* const kSse2Rows = &kRows;

}  // namespace fresco::cpu

#else

namespace fresco::cpu {
const RowLoops* const kSse2Rows = nullptr;
}  // namespace fresco::cpu

#endif
