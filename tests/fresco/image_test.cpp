// The decoders, on small files made here and on damaged ones.
#include <random>

#include <gif_lib.h>
#include <gtest/gtest.h>
#include <webp/encode.h>
#include "canvas.h"
#include "fresco/images/png_writer.h"

namespace fresco::test {
namespace {

struct Decoded {
    ImageDecodeResult result;
    ImageInfo info;
    uint32_t frames = 0, delay = 0;
    std::vector<uint8_t> bytes;
};

Decoded Decode(const std::vector<uint8_t>& file, uint32_t index = 0, bool premultiply = true,
               PixelFormat format = PixelFormat::RGBA8) {
    Decoded d;
    FrameResult frame;
    d.result = Library::DecodeImageMemory(file.data(), file.size(), index, 0, 0, premultiply, d.info,
                                          d.frames, d.delay, &frame, format);
    if (frame.pixels) {
        const auto* bytes = static_cast<uint8_t*>(frame.pixels);
        d.bytes.assign(bytes, bytes + frame.size);
        Library::FreeDecodedImage(frame.pixels);
    }
    return d;
}

std::vector<uint8_t> Webp() {
    const uint8_t pixels[16] = {255, 0, 0, 255, 0, 255, 0, 128, 0, 0, 255, 255, 9, 9, 9, 0};
    uint8_t* out = nullptr;
    const size_t size = WebPEncodeLosslessRGBA(pixels, 2, 2, 8, &out);
    std::vector<uint8_t> file(out, out + size);
    WebPFree(out);
    return file;
}

// Two frames of 2 by 1: red and blue, then a green pixel over the first.
std::vector<uint8_t> Gif() {
    std::vector<uint8_t> file;
    int error = 0;
    GifFileType* gif = EGifOpen(
        &file,
        [](GifFileType* g, const GifByteType* data, int size) {
            auto* out = static_cast<std::vector<uint8_t>*>(g->UserData);
            out->insert(out->end(), data, data + size);
            return size;
        },
        &error);
    const GifColorType colors[4] = {{255, 0, 0}, {0, 0, 255}, {0, 255, 0}, {0, 0, 0}};
    ColorMapObject* map = GifMakeMapObject(4, colors);
    EGifSetGifVersion(gif, true);
    EGifPutScreenDesc(gif, 2, 1, 2, 0, map);
    for (int frame = 0; frame < 2; ++frame) {
        const GraphicsControlBlock control = {DISPOSE_DO_NOT, false, frame ? 1 : 7, NO_TRANSPARENT_COLOR};
        GifByteType block[4];
        EGifGCBToExtension(&control, block);
        EGifPutExtension(gif, GRAPHICS_EXT_FUNC_CODE, 4, block);
        GifPixelType line[2] = {GifPixelType(frame ? 2 : 0), 1};
        EGifPutImageDesc(gif, 0, 0, frame ? 1 : 2, 1, false, nullptr);
        EGifPutLine(gif, line, frame ? 1 : 2);
    }
    EGifCloseFile(gif, &error);
    GifFreeMapObject(map);
    return file;
}

std::vector<uint8_t> Png() {
    const uint32_t pixels[2] = {0xFF0000FF, 0xFF00FF00};
    const Vector<uint8_t> png = EncodePng(pixels, 2, 1, 8);
    return {png.begin(), png.end()};
}

}  // namespace

TEST(Image, DecodesEachFormat) {
    const Decoded png = Decode(Png());
    EXPECT_EQ(png.result, ImageDecodeResult::LastFrame);
    EXPECT_EQ(png.info.flags, uint32_t(kImageOpaque));
    EXPECT_EQ(png.bytes, (std::vector<uint8_t>{255, 0, 0, 255, 0, 255, 0, 255}));
    EXPECT_EQ(Decode(Png(), 1).result, ImageDecodeResult::LastFrame);
    EXPECT_EQ(Decode(Png(), 0, true, PixelFormat::BGRA8).bytes[2], 255);

    const Decoded webp = Decode(Webp());
    ASSERT_EQ(webp.bytes.size(), 16u);
    EXPECT_EQ(webp.bytes[5], 128);  // premultiplied
    EXPECT_EQ(Decode(Webp(), 0, false).bytes[5], 255);
    EXPECT_EQ(Decode(Webp(), 0, false).info.flags, uint32_t(kImageStraightAlpha));
    EXPECT_EQ(Decode(Webp(), 0, true, PixelFormat::A8).bytes, (std::vector<uint8_t>{255, 128, 255, 0}));

    const Decoded first = Decode(Gif()), second = Decode(Gif(), 1), past = Decode(Gif(), 2);
    EXPECT_EQ(first.result, ImageDecodeResult::MoreFrames);
    EXPECT_EQ(first.frames, 2u);
    EXPECT_EQ(first.delay, 7u);
    EXPECT_EQ(first.bytes, (std::vector<uint8_t>{255, 0, 0, 255, 0, 0, 255, 255}));
    EXPECT_EQ(second.result, ImageDecodeResult::LastFrame);
    EXPECT_EQ(second.bytes, (std::vector<uint8_t>{0, 255, 0, 255, 0, 0, 255, 255}));
    EXPECT_EQ(past.result, ImageDecodeResult::LastFrame);
    EXPECT_TRUE(past.bytes.empty());
}

TEST(Image, DamagedFilesFailWithoutHarm) {
    std::mt19937 random(9);
    for (const std::vector<uint8_t>& file : {Png(), Webp(), Gif()}) {
        for (size_t cut = 0; cut < file.size(); ++cut)
            Decode({file.begin(), file.begin() + ptrdiff_t(cut)});
        for (int round = 0; round < 300; ++round) {
            std::vector<uint8_t> damaged = file;
            for (int i = 0; i < 2; ++i)
                damaged[random() % damaged.size()] = uint8_t(random());
            for (uint32_t index = 0; index < 3; ++index)
                Decode(damaged, index);
        }
    }
    EXPECT_EQ(Decode({'n', 'o'}).result, ImageDecodeResult::Failed);
    // A PNG header that claims 60,000 pixels a side.
    std::vector<uint8_t> huge = Png();
    huge[18] = 0xEA, huge[22] = 0xEA;
    EXPECT_EQ(Decode(huge).result, ImageDecodeResult::Failed);
}

}  // namespace fresco::test
