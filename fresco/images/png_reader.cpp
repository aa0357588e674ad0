#include <png.h>

#include <cstring>

#include "fresco/images/decoders.h"

namespace fresco {
namespace {

// libpng takes the memory for what a chunk says that it holds before it reads it, 2 GB for a few bytes. Only
// what stands before the pixels matters: nothing behind them is read (PNG, 5.3 Chunk layout).
bool LeadingChunksFit(const uint8_t* data, size_t size) {
    constexpr size_t kSignature = 8, kHeader = 8, kChecksum = 4;
    for (size_t at = kSignature; size - at >= kHeader + kChecksum;) {
        const uint8_t* chunk = data + at;
        if (std::memcmp(chunk + 4, "IDAT", 4) == 0) return true;
        const size_t length =
            size_t{chunk[0]} << 24 | size_t{chunk[1]} << 16 | size_t{chunk[2]} << 8 | chunk[3];
        if (length > size - at - kHeader - kChecksum) return false;
        at += kHeader + length + kChecksum;
    }
    return false;
}

}  // namespace

bool DecodePng(const uint8_t* data, size_t size, DecodedFrame* frame) {
    if (!LeadingChunksFit(data, size)) return false;
    png_image image = {};
    image.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_memory(&image, data, size)) return false;
    frame->hasAlpha = image.format & PNG_FORMAT_FLAG_ALPHA;
    frame->width = image.width, frame->height = image.height;
    image.format = PNG_FORMAT_RGBA;
    frame->pixels = AllocatePixels(image.width, image.height, size);
    const bool read = frame->pixels && png_image_finish_read(&image, nullptr, frame->pixels, 0, nullptr);
    png_image_free(&image);
    return read;
}

}  // namespace fresco
