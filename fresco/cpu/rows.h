// Loops over rows of pixels, each written three ways: plain (one pixel after the other, the reference), SSE2
// and AVX2; the plainest blends of long rows for AVX-512 too. FRESCO_ROW_LOOPS is the one table of them; a
// new loop is a row here and a function of its name in rows_plain.cpp and rows_wide.inc. All ways give the
// same pixels, bit for bit.
//
// Pixels are premultiplied RGBA8. No row may overlap another one but where it says so.
#pragma once
#include <cstddef>
#include <cstdint>

namespace fresco::cpu {

// Where a pixel lies between two neighbours of a row of texels: at[offset] * weights[0..3] + at[offset + 1] *
// weights[4..7], each in 256ths.
struct ColumnSample {
    uint16_t weights[8];
};

// Four texels around a point, as offsets from the picture's first one, and the 256ths of the right and of the
// lower ones.
struct TexelSample {
    int32_t upper[2], lower[2];
    uint16_t right, down;
};

// Of a Porter-Duff operator: nothing, all, the other one's alpha, what that leaves.
enum class BlendFactor : uint8_t { Zero, One, Alpha, Inverse };

// Positions along a gradient: u + du * x in entries of the table; for a radial one the distance of (u, v)
// from 0 is. Entry i + 1 holds for positions from i on; the first and the last one are what lies before 0 and
// beyond the end.
struct GradientWalk {
    // A position on the edge of two entries belongs to the second, whatever its arithmetic lost: stripes of
    // hard stops that are laid edge to edge must fit.
    static constexpr float kOnEdge = 1.0f / 512;
    // From a position to an entry.
    static constexpr float kShift = 1 + kOnEdge;

    const uint32_t* colors;
    float last;       // the end of the line, one period; the table has two entries more
    uint32_t spread;  // GradientSpread
    float u, du;      // at x = 0, a pixel
    float v, dv;      // radial only
};

// Rows r, g, b, a; columns r, g, b, a, constant; on colours that are not premultiplied.
struct ColorMatrix {
    float m[20];
};

// X(name, parameters)
#define FRESCO_ROW_LOOPS(X)                                                                                  \
    X(Fill, (uint32_t * dst, int count, uint32_t color))                                                     \
    /* Source over destination: one colour, one colour under coverage, pixels times a constant, pixels       \
       under coverage. */                                                                                    \
    X(BlendSolid, (uint32_t * dst, int count, uint32_t color))                                               \
    X(BlendSolidMask, (uint32_t * dst, int count, uint32_t color, const uint8_t* mask))                      \
    /* The same for the rows of a glyph. */                                                                  \
    X(BlendSolidMasks, (uint32_t * dst, size_t pitch, int count, int rows, uint32_t color,                   \
                        const uint8_t* mask, size_t maskPitch))                                              \
    X(BlendRow, (uint32_t * dst, const uint32_t* src, int count, uint32_t alpha))                            \
    X(BlendRowMask, (uint32_t * dst, const uint32_t* src, int count, const uint8_t* mask))                   \
    /* A CSS blend mode from multiply to exclusion, and a Porter-Duff operator: the source times `source`    \
       plus the destination times `target`, held at 255. */                                                  \
    X(BlendSeparable, (uint32_t mode, uint32_t * dst, const uint32_t* src, int count))                       \
    X(BlendOperator,                                                                                         \
      (uint32_t * dst, const uint32_t* src, int count, BlendFactor source, BlendFactor target))              \
    /* Coverage of the source, the rest of the destination. */                                               \
    X(MixByMask, (uint32_t * dst, const uint32_t* src, int count, const uint8_t* mask))                      \
    /* Every channel times a constant, a coverage, the alpha of another row; in place. */                    \
    X(Scale, (uint32_t * row, int count, uint32_t alpha))                                                    \
    X(ScaleByMask, (uint32_t * row, int count, const uint8_t* mask))                                         \
    X(ScaleByAlpha, (uint32_t * row, const uint32_t* alphas, int count))                                     \
    /* Coverage by coverage: of another row, of a constant. */                                               \
    X(MultiplyMask, (uint8_t * dst, const uint8_t* src, int count))                                          \
    X(ScaleMask, (uint8_t * dst, const uint8_t* src, int count, uint32_t coverage))                          \
    /* Two rows of texels, `weight` 256ths of the lower one. */                                              \
    X(MixRows, (uint32_t * dst, const uint32_t* upper, const uint32_t* lower, int count, uint32_t weight))   \
    X(SampleColumns,                                                                                         \
      (uint32_t * dst, const uint32_t* row, const int32_t* offsets, const ColumnSample* samples, int count)) \
    X(SampleTexels, (uint32_t * dst, const uint32_t* pixels, const TexelSample* samples, int count))         \
    X(LinearGradient, (uint32_t * dst, int x, int count, const GradientWalk& walk))                          \
    X(RadialGradient, (uint32_t * dst, int x, int count, const GradientWalk& walk))                          \
    /* Premultiplied colours start + step * i, channels 0 to 255. */                                         \
    X(Ramp, (uint32_t * dst, int count, const float* start, const float* step))                              \
    X(ApplyMatrix, (uint32_t * row, int count, const ColorMatrix& matrix))                                   \
    /* A running mean over `before` pixels to the left, the pixel itself and `after` to the right; beyond    \
       the ends all is transparent. */                                                                       \
    X(BoxBlur, (uint32_t * dst, const uint32_t* src, int count, int before, int after))                      \
    /* `taps` weights of 1 / 16384, an even number; src starts with the first pixel of the first sum. */     \
    X(Convolve, (uint32_t * dst, const uint32_t* src, int count, const int16_t* weights, int taps))          \
    /* Straight colours to premultiplied ones. */                                                            \
    X(Premultiply, (uint32_t * row, int count))                                                              \
    X(SwapRedAndBlue, (uint32_t * row, int count))

struct RowLoops {
#define FRESCO_ROW_LOOP(name, parameters) void(*name) parameters;
    FRESCO_ROW_LOOPS(FRESCO_ROW_LOOP)
#undef FRESCO_ROW_LOOP
};

enum class RowWay : uint8_t { Plain, Sse2, Avx2, Avx512 };

// Null for a way that this processor does not know.
const RowLoops* GetRowLoops(RowWay way);
// The fastest one here.
const RowLoops& Rows();

}  // namespace fresco::cpu
