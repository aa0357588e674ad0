// The decoders behind Library::DecodeImageMemory. Each gives straight RGBA8, tightly packed; the entry turns
// that into what was asked for. They run on any thread and trust nothing: sizes are checked before memory is
// taken. libpng, libjpeg, libwebp and giflib allocate their working memory themselves; pixels are the
// client's memory.
#pragma once
#include <fresco/image.h>

namespace fresco {

struct DecodedFrame {
    uint8_t* pixels = nullptr;  // AllocatePixels
    uint32_t width = 0, height = 0;
    bool hasAlpha = true;
    uint32_t delay = 0;       // hundredths of a second
    uint32_t frameCount = 1;  // of the file, as far as it is whole
};

struct DecodeHints {
    uint32_t width = 0, height = 0;
};

// False, with a Warning, when it is beyond the limits of a file with so many bytes. `shrink` is by how much a
// decoder makes the sides shorter on its way.
bool MayDecode(uint64_t width, uint64_t height, uint64_t fileSize, uint64_t shrink = 1);
// Null, with a Warning, when it is beyond the limits of a file with so many bytes, or without memory.
uint8_t* AllocatePixels(uint64_t width, uint64_t height, uint64_t fileSize);
void FreePixels(void* pixels);

bool DecodePng(const uint8_t* data, size_t size, DecodedFrame* frame);
bool DecodeJpeg(const uint8_t* data, size_t size, const DecodeHints& hints, DecodedFrame* frame);
// Frames of an animation are asked for in order, from 0 on (animation.h).
bool DecodeWebp(const uint8_t* data, size_t size, uint32_t index, DecodedFrame* frame);
bool DecodeGif(const uint8_t* data, size_t size, uint32_t index, DecodedFrame* frame);

}  // namespace fresco
