// Rows of pixels onto rows of pixels. Sources and destinations are premultiplied RGBA8; coverage is one byte
// a pixel, or one constant when `mask` is null.
#pragma once
#include <cstdint>

namespace fresco::cpu {

// Normal blending of one colour.
void BlendSolid(uint32_t* dst, int count, uint32_t color, uint8_t coverage);
void BlendSolidMask(uint32_t* dst, int count, uint32_t color, const uint8_t* mask);
// Normal blending of a row.
void BlendRow(uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask, uint8_t coverage);
// Any mode of BlendMode.
void BlendRowMode(uint32_t mode, uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask,
                  uint8_t coverage);
// Modes that change pixels which the source does not touch: a layer must merge over its whole bounds.
bool AffectsOutside(uint32_t mode);

}  // namespace fresco::cpu
