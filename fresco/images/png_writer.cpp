#include "fresco/images/png_writer.h"

#include <csetjmp>

#include <png.h>

namespace fresco {
namespace {

void Append(png_structp png, png_bytep data, png_size_t size) {
    auto& out = *static_cast<Vector<uint8_t>*>(png_get_io_ptr(png));
    out.insert(out.end(), data, data + size);
}

}  // namespace

Vector<uint8_t> EncodePng(const void* pixels, uint32_t width, uint32_t height, size_t pitch) {
    Vector<uint8_t> out;
    Vector<uint8_t> row(size_t(width) * 3);
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png ? png_create_info_struct(png) : nullptr;
    if (!info || setjmp(png_jmpbuf(png))) {
        png_destroy_write_struct(&png, &info);
        return {};
    }
    png_set_write_fn(png, &out, Append, nullptr);
    png_set_IHDR(png, info, width, height, 8, PNG_COLOR_TYPE_RGB, PNG_INTERLACE_NONE,
                 PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    png_write_info(png, info);
    for (uint32_t y = 0; y < height; ++y) {
        const uint8_t* from = static_cast<const uint8_t*>(pixels) + size_t(y) * pitch;
        for (uint32_t x = 0; x < width; ++x) {
            for (uint32_t c = 0; c < 3; ++c) {
                row[x * 3 + c] = uint8_t(std::min(255, from[x * 4 + c] + 255 - from[x * 4 + 3]));
            }
        }
        png_write_row(png, row.data());
    }
    png_write_end(png, nullptr);
    png_destroy_write_struct(&png, &info);
    return out;
}

}  // namespace fresco
