// The AVX-512 way of rows.h: the AVX2 one, but for blends of long rows, which gain most. Only what stands
// between the two pragmas may use it; rows.cpp asks the processor first.
#include <fresco/paint.h>
#include "fresco/cpu/pixels.h"
#include "fresco/cpu/rows_ways.h"

#if defined(__x86_64__)
#include <immintrin.h>

#if defined(__clang__)
#pragma clang attribute push(__attribute__((target("avx512f,avx512bw"))), apply_to = function)
#else
#pragma GCC push_options
#pragma GCC target("avx512f,avx512bw")
#endif

namespace fresco::cpu {
namespace {

// Sixteen pixels.
using Wide = __m512i;
constexpr int kWide = 16;
#define FRESCO_PARTIAL_STORES 1
#define FRESCO_WHOLE_LINES 1
#define WIDE(name) _mm512_##name
#define WIDE_SI(name) _mm512_##name##_si512

inline Wide AlphaWords(Wide pixels) {
    return _mm512_shuffle_epi8(
        pixels, _mm512_set4_epi32(int(0xFF0FFF0Fu), int(0xFF0BFF0Bu), int(0xFF07FF07u), int(0xFF03FF03u)));
}

inline bool AllOpaque(Wide pixels) {
    const Wide alphas = _mm512_set1_epi32(int(0xFF000000u));
    return _mm512_cmpge_epu32_mask(pixels, alphas) == 0xFFFF;
}

inline bool AllBlank(Wide pixels) {
    return _mm512_test_epi32_mask(pixels, pixels) == 0;
}

using Inside = __mmask16;

// Of fewer than a register holds.
inline Inside FirstPixels(int count) {
    return Inside((1u << count) - 1);
}

inline Wide LoadPart(const uint32_t* p, Inside inside) {
    return _mm512_maskz_loadu_epi32(inside, p);
}

inline void StorePart(uint32_t* p, Inside inside, Wide v) {
    _mm512_mask_storeu_epi32(p, inside, v);
}

// In pixels, from where a register's worth of memory in one cache line begins.
inline int LineOffset(const uint32_t* p) {
    return int(reinterpret_cast<uintptr_t>(p) / 4) & (kWide - 1);
}

// As PlainPixels, for rows that lie otherwise to the cache lines than their targets: every load of such a row
// would touch two lines. Here each line is loaded once and the parts of two are joined. Reads up to kAhead
// pixels more than it has given.
class SkewedPixels {
  public:
    static constexpr int kAhead = kWide;
    explicit SkewedPixels(const uint32_t* from) {
        const int offset = LineOffset(from);
        line_ = from - offset;
        index_ = _mm512_add_epi32(_mm512_set1_epi32(offset),
                                  _mm512_set_epi32(15, 14, 13, 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0));
        held_ = LoadPart(line_, Inside(0xFFFFu << offset));
    }
    Wide Next() {
        line_ += kWide;
        const Wide next = _mm512_load_si512(line_);
        const Wide pixels = _mm512_permutex2var_epi32(held_, index_, next);
        held_ = next;
        return pixels;
    }

  private:
    const uint32_t* line_;
    Wide index_, held_;
};

#include "fresco/cpu/rows_over.inc"

}  // namespace

void TakeAvx512Rows(RowLoops* rows) {
    rows->BlendSolid = BlendSolid;
    rows->BlendRow = BlendRow;
}

}  // namespace fresco::cpu

#if defined(__clang__)
#pragma clang attribute pop
#else
#pragma GCC pop_options
#endif

#else

namespace fresco::cpu {
void TakeAvx512Rows(RowLoops*) {}
}  // namespace fresco::cpu

#endif
