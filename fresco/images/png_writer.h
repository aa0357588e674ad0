// PNG files from premultiplied pixels, for captures, replays and tests.
#pragma once
#include <cstdint>

#include "fresco/core/heap.h"

namespace fresco {

// Empty on failure. Pixels are RGBA8 premultiplied; they are shown over white, as a view over its window is.
Vector<uint8_t> EncodePng(const void* pixels, uint32_t width, uint32_t height, size_t pitch);

}  // namespace fresco
