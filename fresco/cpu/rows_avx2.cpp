// The AVX2 way of rows.h. Only what stands between the two pragmas may use it; rows.cpp asks the processor
// first.
#include <fresco/paint.h>
#include "fresco/cpu/pixels.h"
#include "fresco/cpu/rows_ways.h"

#if defined(__x86_64__)
#include <immintrin.h>

#if defined(__clang__)
#pragma clang attribute push(__attribute__((target("avx2"))), apply_to = function)
#else
#pragma GCC push_options
#pragma GCC target("avx2")
#endif

namespace fresco::cpu {
namespace {

// Eight pixels. Unpacking and packing stay in the halves of a register and so undo each other.
using Wide = __m256i;
using WideFloat = __m256;
constexpr int kWide = 8;
#define FRESCO_PARTIAL_STORES 1
#define WIDE(name) _mm256_##name
#define WIDE_SI(name) _mm256_##name##_si256

inline Wide SpreadCoverage(const uint8_t* mask) {
    const Wide c = _mm256_cvtepu8_epi32(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(mask)));
    return _mm256_shuffle_epi8(c, _mm256_set_epi8(12, 12, 12, 12, 8, 8, 8, 8, 4, 4, 4, 4, 0, 0, 0, 0, 12, 12,
                                                  12, 12, 8, 8, 8, 8, 4, 4, 4, 4, 0, 0, 0, 0));
}

inline bool AllCovered(const uint8_t* mask, uint32_t what) {
    uint64_t bytes;
    std::memcpy(&bytes, mask, 8);
    return bytes == (uint64_t(what) << 32 | what);
}

inline Wide SpreadAlpha(Wide unpacked) {
    return _mm256_shufflehi_epi16(_mm256_shufflelo_epi16(unpacked, 0xFF), 0xFF);
}

inline Wide Lookup(const uint32_t* table, Wide index) {
    return _mm256_i32gather_epi32(reinterpret_cast<const int*>(table), index, 4);
}

inline Wide Ascending() {
    return _mm256_set_epi32(7, 6, 5, 4, 3, 2, 1, 0);
}

// The alphas of pixels in both 16-bit lanes of each.
inline Wide AlphaWords(Wide pixels) {
    return _mm256_shuffle_epi8(
        pixels, _mm256_set_epi8(-1, 15, -1, 15, -1, 11, -1, 11, -1, 7, -1, 7, -1, 3, -1, 3, -1, 15, -1, 15,
                                -1, 11, -1, 11, -1, 7, -1, 7, -1, 3, -1, 3));
}

inline bool AllOpaque(Wide pixels) {
    return _mm256_testc_si256(pixels, _mm256_set1_epi32(int(0xFF000000u)));
}

inline bool AllBlank(Wide pixels) {
    return _mm256_testz_si256(pixels, pixels);
}

using Inside = Wide;

inline Inside FirstPixels(int count) {
    return _mm256_cmpgt_epi32(_mm256_set1_epi32(count), Ascending());
}

inline Wide LoadPart(const uint32_t* p, Inside inside) {
    return _mm256_maskload_epi32(reinterpret_cast<const int*>(p), inside);
}

inline void StorePart(uint32_t* p, Inside inside, Wide v) {
    _mm256_maskstore_epi32(reinterpret_cast<int*>(p), inside, v);
}

inline WideFloat Greater(WideFloat a, WideFloat b) {
    return _mm256_cmp_ps(a, b, _CMP_GT_OQ);
}

#include "fresco/cpu/rows_wide.inc"

const RowLoops kRows = FRESCO_ROW_TABLE;

}  // namespace

const RowLoops* const kAvx2Rows = &kRows;

}  // namespace fresco::cpu

#if defined(__clang__)
#pragma clang attribute pop
#else
#pragma GCC pop_options
#endif

#else

namespace fresco::cpu {
const RowLoops* const kAvx2Rows = nullptr;
}  // namespace fresco::cpu

#endif
