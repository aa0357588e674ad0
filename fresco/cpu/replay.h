// Draws a capture file anew: the same pixels, bit for bit, as the frame that it was taken from.
#pragma once
#include "fresco/cpu/pixels.h"

namespace fresco::cpu {

// `data` must be aligned to 8 bytes. False with a one-line reason for a file that is not sound.
bool ReplayCapture(const void* data, size_t size, PixelBuffer* picture, const char** error);

}  // namespace fresco::cpu
