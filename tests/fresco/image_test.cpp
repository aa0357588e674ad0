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

std::vector<uint8_t> SolidWebp(int width, int height) {
    const std::vector<uint8_t> pixels(size_t(width) * size_t(height) * 4, 255);
    uint8_t* out = nullptr;
    const size_t size = WebPEncodeLosslessRGBA(pixels.data(), width, height, width * 4, &out);
    std::vector<uint8_t> file(out, out + size);
    WebPFree(out);
    return file;
}

// Two frames of 2 x 2 pixels on a canvas of any size.
std::vector<uint8_t> WebpAnimation(uint32_t width, uint32_t height) {
    std::vector<uint8_t> file = {'R', 'I', 'F', 'F', 0, 0, 0, 0, 'W', 'E', 'B', 'P'};
    const auto number = [&](uint32_t value, int bytes) {
        for (int i = 0; i < bytes; ++i)
            file.push_back(uint8_t(uint64_t{value} >> (8 * i)));
    };
    const auto chunk = [&](std::string_view name, uint32_t size) {
        file.insert(file.end(), name.begin(), name.end());
        number(size, 4);
    };
    chunk("VP8X", 10), number(0x12, 4), number(width - 1, 3), number(height - 1, 3);
    chunk("ANIM", 6), number(0, 6);
    const std::vector<uint8_t> still = Webp();
    for (int i = 0; i < 2; ++i) {
        chunk("ANMF", 16 + uint32_t(still.size()) - 12);
        number(0, 6), number(1, 3), number(1, 3), number(50, 4);
        file.insert(file.end(), still.begin() + 12, still.end());
    }
    const uint32_t size = uint32_t(file.size()) - 8;
    std::memcpy(file.data() + 4, &size, 4);
    return file;
}

struct GifFrame {
    int width, height;
    int delay;
    uint8_t color;  // of the first pixel; all others are blue
};

std::vector<uint8_t> MakeGif(int width, int height, const std::vector<GifFrame>& frames) {
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
    EGifPutScreenDesc(gif, width, height, 2, 0, map);
    for (const GifFrame& frame : frames) {
        const GraphicsControlBlock control = {DISPOSE_DO_NOT, false, frame.delay, NO_TRANSPARENT_COLOR};
        GifByteType block[4];
        EGifGCBToExtension(&control, block);
        EGifPutExtension(gif, GRAPHICS_EXT_FUNC_CODE, 4, block);
        EGifPutImageDesc(gif, 0, 0, frame.width, frame.height, false, nullptr);
        std::vector<GifPixelType> line(size_t(frame.width), 1);
        line[0] = frame.color;
        for (int y = 0; y < frame.height; ++y)
            EGifPutLine(gif, line.data(), frame.width);
    }
    EGifCloseFile(gif, &error);
    GifFreeMapObject(map);
    return file;
}

// Red and blue, then a green pixel over the first.
std::vector<uint8_t> Gif() {
    return MakeGif(2, 1, {{2, 1, 7, 0}, {1, 1, 1, 2}});
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

// Frames that are asked for out of order, of several files in turn, and by callers who stop in the middle.
TEST(Image, AnimationsAreReadInAnyOrder) {
    const std::vector<uint8_t> red = {255, 0, 0, 255}, blue = {0, 0, 255, 255}, green = {0, 255, 0, 255};
    const auto a = MakeGif(1, 1, {{1, 1, 0, 0}, {1, 1, 0, 1}, {1, 1, 0, 2}});
    const auto b = MakeGif(1, 1, {{1, 1, 0, 2}, {1, 1, 0, 0}, {1, 1, 0, 1}});
    EXPECT_EQ(Decode(a, 0).bytes, red);
    EXPECT_EQ(Decode(b, 0).bytes, green);
    EXPECT_EQ(Decode(a, 2).bytes, green);
    EXPECT_EQ(Decode(b, 1).bytes, red);
    EXPECT_EQ(Decode(b, 0).bytes, green);
    EXPECT_EQ(Decode(a, 1).bytes, blue);

    Canvas canvas;  // counts what stays behind at its end
    const long before = canvas.allocator.live;
    std::vector<std::vector<uint8_t>> files(200, a);
    for (const auto& file : files)
        Decode(file, 0);
    EXPECT_LT(canvas.allocator.live - before, 200);  // the oldest made room
}

TEST(Image, AnimationsBeyondTheLimitsAreRefused) {
    Canvas canvas;
    const GifFrame dot = {1, 1, 0, 0};
    const auto many = MakeGif(1, 1, std::vector<GifFrame>(kMaxAnimationFrames, dot));
    uint32_t shown = 0;
    for (uint32_t i = 0; i < kMaxAnimationFrames; ++i)
        shown += Decode(many, i).bytes.size() == 4;
    EXPECT_EQ(shown, kMaxAnimationFrames);
    EXPECT_TRUE(canvas.log.lines.empty());

    EXPECT_EQ(Decode(MakeGif(1, 1, std::vector<GifFrame>(kMaxAnimationFrames + 1, dot))).result,
              ImageDecodeResult::Failed);
    auto large = MakeGif(8192, 4096, {dot, dot, dot});
    large.resize(1 << 20);  // so that its few bytes are not what is wrong
    EXPECT_EQ(Decode(large).result, ImageDecodeResult::Failed);
    // Frames that unpack to far more than the canvas which cuts them.
    const auto wide = MakeGif(1, 1, std::vector<GifFrame>(5, {16000, 1000, 0, 0}));
    EXPECT_EQ(Decode(wide).result, ImageDecodeResult::Failed);
    ASSERT_EQ(canvas.log.lines.size(), 3u);
    EXPECT_EQ(canvas.log.lines[1],
              "Refusing to decode an animation of 3 frames of 8192 x 4096 pixels from 1048576 bytes");
}

// Within the limits of size, from too few bytes to be worth the work.
TEST(Image, FewBytesGiveFewPixels) {
    Canvas canvas;
    const GifFrame dot = {1, 1, 0, 0};
    EXPECT_EQ(Decode(MakeGif(2048, 1024, {dot, dot})).result, ImageDecodeResult::MoreFrames);
    EXPECT_EQ(Decode(SolidWebp(3840, 2160)).bytes.size(), 3840u * 2160 * 4);
    EXPECT_TRUE(canvas.log.lines.empty());

    const std::vector<std::pair<std::vector<uint8_t>, std::string>> refused = {
        {MakeGif(520, 12040, {dot, dot}), "an animation of 2 frames of 520 x 12040"},
        {WebpAnimation(520, 12040), "an animation of 2 frames of 520 x 12040"},
        {SolidWebp(4096, 4096), "an image of 4096 x 4096"},
    };
    for (const auto& [file, what] : refused) {
        const long before = canvas.allocator.live;
        EXPECT_EQ(Decode(file).result, ImageDecodeResult::Failed);
        EXPECT_EQ(canvas.allocator.live, before);
        EXPECT_EQ(canvas.log.lines.back(),
                  "Refusing to decode " + what + " pixels from " + std::to_string(file.size()) + " bytes");
    }
    EXPECT_EQ(canvas.log.lines.size(), refused.size());
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
