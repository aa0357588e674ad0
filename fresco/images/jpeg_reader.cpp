#include <csetjmp>
#include <cstdio>

#include <jpeglib.h>

#include "fresco/images/decoders.h"

namespace fresco {
namespace {

// A progressive file may repeat a full-size scan without end in few bytes.
constexpr int kMaxScans = 64;

struct Reader {
    jpeg_decompress_struct decoder = {};
    jpeg_error_mgr errors = {};
    jpeg_progress_mgr progress = {};
    jmp_buf escape;
};

[[noreturn]] void Fail(j_common_ptr common) {
    std::longjmp(static_cast<Reader*>(common->client_data)->escape, 1);
}

void WatchScans(j_common_ptr common) {
    if (reinterpret_cast<j_decompress_ptr>(common)->input_scan_number > kMaxScans) Fail(common);
}

void Quiet(j_common_ptr) {}

// Adobe's CMYK is stored inverted; to RGB without profiles.
void CmykToRgba(uint8_t* row, uint32_t width, bool inverted) {
    for (uint32_t x = 0; x < width; ++x, row += 4) {
        const uint32_t k = inverted ? row[3] : 255 - row[3];
        for (int c = 0; c < 3; ++c)
            row[c] = uint8_t((inverted ? row[c] : 255 - row[c]) * k / 255);
        row[3] = 255;
    }
}

// No object with a destructor lives here: errors leave by longjmp.
bool Read(Reader* reader, const uint8_t* data, size_t size, const DecodeHints& hints, DecodedFrame* frame) {
    jpeg_decompress_struct& d = reader->decoder;
    if (setjmp(reader->escape)) return false;
    jpeg_create_decompress(&d);
    d.mem->max_memory_to_use = long(2 * kMaxImageBytes);  // a progressive file's coefficients
    d.progress = &reader->progress;
    jpeg_mem_src(&d, data, static_cast<unsigned long>(size));
    jpeg_read_header(&d, TRUE);
    const bool cmyk = d.jpeg_color_space == JCS_CMYK || d.jpeg_color_space == JCS_YCCK;
    d.out_color_space = cmyk ? JCS_CMYK : JCS_EXT_RGBA;
    while (hints.width && hints.height && d.scale_denom < 8 &&
           d.image_width / (d.scale_denom * 2) >= hints.width &&
           d.image_height / (d.scale_denom * 2) >= hints.height) {
        d.scale_denom *= 2;
    }
    if (!MayDecode(d.image_width, d.image_height, size, d.scale_denom)) return false;
    jpeg_calc_output_dimensions(&d);
    frame->width = d.output_width, frame->height = d.output_height;
    frame->hasAlpha = false;
    frame->pixels = AllocatePixels(frame->width, frame->height, size);
    if (!frame->pixels) return false;
    jpeg_start_decompress(&d);
    while (d.output_scanline < d.output_height) {
        JSAMPROW row = frame->pixels + size_t(d.output_scanline) * frame->width * 4;
        jpeg_read_scanlines(&d, &row, 1);
        if (cmyk) CmykToRgba(row, frame->width, d.saw_Adobe_marker);
    }
    jpeg_finish_decompress(&d);
    return true;
}

}  // namespace

bool DecodeJpeg(const uint8_t* data, size_t size, const DecodeHints& hints, DecodedFrame* frame) {
    Reader reader;
    reader.decoder.err = jpeg_std_error(&reader.errors);
    reader.errors.error_exit = Fail;
    reader.errors.output_message = Quiet;
    reader.decoder.client_data = &reader;
    reader.progress.progress_monitor = WatchScans;
    const bool read = Read(&reader, data, size, hints, frame);
    jpeg_destroy_decompress(&reader.decoder);
    return read;
}

}  // namespace fresco
