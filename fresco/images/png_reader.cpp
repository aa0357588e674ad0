#include <png.h>

#include "fresco/images/decoders.h"

namespace fresco {

bool DecodePng(const uint8_t* data, size_t size, DecodedFrame* frame) {
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
