// Image files to pixels, against the decoders alone doing the same: RGBA rows in memory of the caller.
#include <benchmark/benchmark.h>
#include <fresco/image.h>
#include <fresco/library.h>
#include <png.h>
#include <webp/decode.h>
#include <webp/encode.h>

#include <csetjmp>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <random>
#include <vector>

// After cstdio: it names FILE without including it.
#include <jpeglib.h>

namespace {

constexpr int kSide = 1024;

// A photograph of sorts: soft colours with some noise, and a soft edge in alpha.
std::vector<std::uint8_t> MakePicture() {
    std::vector<std::uint8_t> pixels;
    std::mt19937 random(3);
    for (int y = 0; y < kSide; ++y) {
        for (int x = 0; x < kSide; ++x) {
            const auto noise = [&](int v) {
                return static_cast<std::uint8_t>((v + static_cast<int>(random() % 9)) & 255);
            };
            pixels.push_back(noise(x / 5));
            pixels.push_back(noise(y / 5));
            pixels.push_back(noise((x * y) >> 13));
            const int edge = x < y ? x : y;
            pixels.push_back(static_cast<std::uint8_t>(edge < 255 ? edge : 255));
        }
    }
    return pixels;
}

std::vector<std::uint8_t> EncodePng(const std::vector<std::uint8_t>& pixels) {
    png_image image = {};
    image.version = PNG_IMAGE_VERSION, image.width = kSide, image.height = kSide,
    image.format = PNG_FORMAT_RGBA;
    png_alloc_size_t size = 0;
    png_image_write_to_memory(&image, nullptr, &size, 0, pixels.data(), 0, nullptr);
    std::vector<std::uint8_t> file(size);
    png_image_write_to_memory(&image, file.data(), &size, 0, pixels.data(), 0, nullptr);
    return file;
}

std::vector<std::uint8_t> EncodeJpeg(const std::vector<std::uint8_t>& pixels) {
    jpeg_compress_struct encoder = {};
    jpeg_error_mgr errors = {};
    encoder.err = jpeg_std_error(&errors);
    jpeg_create_compress(&encoder);
    unsigned char* bytes = nullptr;
    unsigned long size = 0;
    jpeg_mem_dest(&encoder, &bytes, &size);
    encoder.image_width = kSide, encoder.image_height = kSide, encoder.input_components = 4;
    encoder.in_color_space = JCS_EXT_RGBX;
    jpeg_set_defaults(&encoder);
    jpeg_set_quality(&encoder, 85, TRUE);
    jpeg_start_compress(&encoder, TRUE);
    while (encoder.next_scanline < encoder.image_height) {
        auto* row =
            const_cast<JSAMPLE*>(pixels.data() + static_cast<std::size_t>(encoder.next_scanline) * kSide * 4);
        jpeg_write_scanlines(&encoder, &row, 1);
    }
    jpeg_finish_compress(&encoder);
    jpeg_destroy_compress(&encoder);
    std::vector<std::uint8_t> file(bytes, bytes + size);
    std::free(bytes);
    return file;
}

std::vector<std::uint8_t> EncodeWebp(const std::vector<std::uint8_t>& pixels) {
    std::uint8_t* bytes = nullptr;
    const std::size_t size = WebPEncodeRGBA(pixels.data(), kSide, kSide, kSide * 4, 80, &bytes);
    std::vector<std::uint8_t> file(bytes, bytes + size);
    WebPFree(bytes);
    return file;
}

bool DecodePng(const std::vector<std::uint8_t>& file, std::uint8_t* out) {
    png_image image = {};
    image.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_memory(&image, file.data(), file.size())) return false;
    image.format = PNG_FORMAT_RGBA;
    return png_image_finish_read(&image, nullptr, out, 0, nullptr);
}

bool DecodeJpeg(const std::vector<std::uint8_t>& file, std::uint8_t* out) {
    jpeg_decompress_struct decoder = {};
    jpeg_error_mgr errors = {};
    decoder.err = jpeg_std_error(&errors);
    jpeg_create_decompress(&decoder);
    jpeg_mem_src(&decoder, file.data(), static_cast<unsigned long>(file.size()));
    jpeg_read_header(&decoder, TRUE);
    decoder.out_color_space = JCS_EXT_RGBA;
    jpeg_start_decompress(&decoder);
    while (decoder.output_scanline < decoder.output_height) {
        JSAMPROW row = out + static_cast<std::size_t>(decoder.output_scanline) * kSide * 4;
        jpeg_read_scanlines(&decoder, &row, 1);
    }
    jpeg_finish_decompress(&decoder);
    jpeg_destroy_decompress(&decoder);
    return true;
}

bool DecodeWebp(const std::vector<std::uint8_t>& file, std::uint8_t* out) {
    return WebPDecodeRGBAInto(file.data(), file.size(), out, static_cast<std::size_t>(kSide) * kSide * 4,
                              kSide * 4);
}

using Encode = std::vector<std::uint8_t> (*)(const std::vector<std::uint8_t>&);
using Decode = bool (*)(const std::vector<std::uint8_t>&, std::uint8_t*);

// As the engine asks: premultiplied, fresh memory each time.
void DecodeImage(benchmark::State& state, Encode encode) {
    const std::vector<std::uint8_t> file = encode(MakePicture());
    for (auto _ : state) {
        fresco::ImageInfo info;
        std::uint32_t frames = 0, delay = 0;
        fresco::FrameResult frame;
        const auto result = fresco::Library::DecodeImageMemory(
            file.data(), file.size(), 0, 0, 0, true, info, frames, delay, &frame, fresco::PixelFormat::RGBA8);
        if (result == fresco::ImageDecodeResult::Failed) state.SkipWithError("not decoded");
        fresco::Library::FreeDecodedImage(frame.pixels);
    }
    state.counters["target"] = 1.1;
}

void DecodeBare(benchmark::State& state, Encode encode, Decode decode) {
    const std::vector<std::uint8_t> file = encode(MakePicture());
    for (auto _ : state) {
        auto* pixels = static_cast<std::uint8_t*>(std::malloc(static_cast<std::size_t>(kSide) * kSide * 4));
        if (!decode(file, pixels)) state.SkipWithError("not decoded");
        benchmark::DoNotOptimize(pixels);
        std::free(pixels);
    }
}

BENCHMARK_CAPTURE(DecodeImage, png, EncodePng)->Name("decode_png")->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(DecodeBare, png, EncodePng, DecodePng)
    ->Name("decode_png_baseline")
    ->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(DecodeImage, jpeg, EncodeJpeg)->Name("decode_jpeg")->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(DecodeBare, jpeg, EncodeJpeg, DecodeJpeg)
    ->Name("decode_jpeg_baseline")
    ->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(DecodeImage, webp, EncodeWebp)->Name("decode_webp")->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(DecodeBare, webp, EncodeWebp, DecodeWebp)
    ->Name("decode_webp_baseline")
    ->Unit(benchmark::kMicrosecond);

}  // namespace
