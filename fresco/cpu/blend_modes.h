// The blend formulas of https://www.w3.org/TR/compositing-1/ on single pixels.
#pragma once
#include <cstdint>

namespace fresco::cpu {

// Full coverage; premultiplied in and out.
uint32_t BlendPixel(uint32_t mode, uint32_t src, uint32_t dst);

// The same for a row; coverage is how much of a pixel changes, for every operator. One byte a pixel, or one
// constant when `mask` is null.
void BlendModeRow(uint32_t mode, uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask,
                  uint8_t coverage);

}  // namespace fresco::cpu
