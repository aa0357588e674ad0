#include "fresco/cpu/blend.h"

#include <cstring>

#include <fresco/paint.h>
#include "fresco/cpu/blend_modes.h"
#include "fresco/cpu/pixels.h"
#include "fresco/cpu/rows.h"

namespace fresco::cpu {

void BlendSolid(uint32_t* dst, int count, uint32_t color, uint8_t coverage) {
    if (coverage != 255) color = ScalePixel(color, coverage);
    if (color >> 24 == 255) return Rows().Fill(dst, count, color);
    if (color != 0) Rows().BlendSolid(dst, count, color);
}

void BlendSolidMask(uint32_t* dst, int count, uint32_t color, const uint8_t* mask) {
    Rows().BlendSolidMask(dst, count, color, mask);
}

void BlendRow(uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask, uint8_t coverage) {
    if (mask) return Rows().BlendRowMask(dst, src, count, mask);
    Rows().BlendRow(dst, src, count, coverage);
}

void BlendRowMode(uint32_t mode, uint32_t* dst, const uint32_t* src, int count, const uint8_t* mask,
                  uint8_t coverage) {
    if (mode == kBlendNormal) return BlendRow(dst, src, count, mask, coverage);
    // Each frame starts with the one and may end with the other, over the whole target.
    if (!mask && coverage == 255) {
        if (mode == kBlendClear) return Rows().Fill(dst, count, 0);
        if (mode == kBlendSource) {
            std::memcpy(dst, src, size_t(count) * 4);
            return;
        }
    }
    BlendModeRow(mode, dst, src, count, mask, coverage);
}

bool AffectsOutside(uint32_t mode) {
    return mode == kBlendClear || mode == kBlendSource || mode == kBlendSourceIn || mode == kBlendSourceOut ||
           mode == kBlendDestinationIn || mode == kBlendDestinationAtop;
}

}  // namespace fresco::cpu
