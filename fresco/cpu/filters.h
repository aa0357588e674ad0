// What CSS filters do to the pixels of a layer. The layer is large enough for what the filters spread.
#pragma once
#include <fresco/effects.h>
#include "fresco/cpu/pixels.h"
#include "fresco/paths/matrix.h"

namespace fresco::cpu {

// Standard deviations in device pixels. Up to kExactSigma the
// kernel is the Gaussian itself, above it three box passes (within 3% of it).
constexpr float kExactSigma = 2;
void Blur(const Bitmap& bitmap, float sigmaX, float sigmaY);
// How far a blur is seen, in pixels.
int BlurExtent(float sigma);

// The filter in place; `space` takes its lengths to device pixels.
void ApplyFilter(const Bitmap& bitmap, const FilterRecord& filter, const Jacobian& space);
// Adds by how much a filter grows what it is applied to: left, top, right, bottom.
void FilterOutset(const FilterRecord& filter, const Jacobian& space, int outset[4]);

}  // namespace fresco::cpu
