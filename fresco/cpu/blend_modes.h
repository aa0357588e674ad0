// The blend formulas of https://www.w3.org/TR/compositing-1/ on single pixels.
#pragma once
#include <cstdint>

namespace fresco::cpu {

// Full coverage; premultiplied in and out.
uint32_t BlendPixel(uint32_t mode, uint32_t src, uint32_t dst);

}  // namespace fresco::cpu
