// Captures replay bit for bit, and a file that lies is refused.
#include <cmath>
#include <random>

#include <fresco/command_records.h>
#include <gtest/gtest.h>
#include "canvas.h"
#include "fresco/commands/validate.h"
#include "fresco/cpu/replay.h"

namespace fresco::test {
namespace {

// A frame that needs everything a capture carries: old content, a font, a font of pictures, an image, a
// surface, uploads of its own.
struct Frame {
    Canvas canvas{96, 64};
    ImageId image = Library::GetImageName(), late = Library::GetImageName();
    SurfaceId surface = Library::GetSurfaceName();
    uint32_t pixels[4] = {0xFF0000FF, 0x80008000, 0xFFFF0000, 0xFF00FFFF};
    CommandBuffer* buffers[2] = {};

    Frame() {
        CommandBuffer* before = Library::CreateBuffer(0, 0);
        before->CreateImage(image, {2, 2, PixelFormat::RGBA8, kImageStraightAlpha, 0, pixels});
        before->CreateSurface(surface, {16, 16, PixelFormat::RGBA8}, 0);
        before->FillRect({0, 0, 0, 96, 64}, Solid(0.9f, 0.9f, 0.8f));
        canvas.Draw(before);
        CommandBuffer* shadow = Library::CreateBufferForSurface(surface, 0, 0);
        shadow->FillRect({4, 4, 0, 8, 8}, Solid(0, 0, 0));
        shadow->ApplyBlur(4);
        canvas.Draw(shadow);

        buffers[0] = Library::CreateBuffer(0, 0);
        buffers[0]->CreateImage(late, {2, 2, PixelFormat::RGBA8, 0, 0, pixels});
        CommandBuffer* b = buffers[1] = Library::CreateBuffer(0, 0);
        b->BeginScissor();
        b->PushState(kStateAll);
        b->ClipRect({8, 8, 0, 80, 50}, kClipSet);
        b->DrawSurface(surface, {}, {10, 10, 0, 24, 24}, Paint{});
        b->DrawImage(image, {40, 10, 0, 13, 17}, {}, Paint{});
        b->DrawImage(late, {60, 10, 0, 5, 5}, {}, Paint{});
        FilterRecord hue{uint32_t(FilterKind::HueRotate), {70}};
        Effect* effects[] = {GetEffectFactory()->CreateFilter(&hue, 1),
                             GetEffectFactory()->CreateBlend(kBlendScreen)};
        b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(0.7f), effects, 2);
        b->FillRoundedRect({50, 30, 0, 30, 20}, {{5, 5}, {5, 5}, {5, 5}, {5, 5}}, Solid(0.8f, 0.1f, 0.3f));
        b->EndLayer();
        for (Effect* effect : effects)
            effect->Release();
        const FontId font = canvas.LoadFont(kSans);
        TextPaint text;
        text.font = font, text.size = 13, text.x = 10, text.y = 50, text.paint = Solid(0, 0, 0);
        b->FillString("replay \xC3\xA9", 9, text);
        text.font = LoadPictureFont(), text.y = 30, text.paint = Solid(1, 1, 0.5f);
        b->FillString("AB", 2, text);
        const GradientStop stops[] = {{0, {1, 0, 0, 1}}, {1, {0, 0, 1, 1}}};
        b->FillRadialGradient({70, 40, 0, 20, 20}, Paint{}, stops, 2, {{0.5f, 0.5f}, {0.5f, 0.5f}});
        Path* path = Path::Create();
        path->MoveTo(12, 55), path->BezierCurveTo(30, 30, 60, 70, 85, 45);
        b->StrokePath(*path, Solid(0, 0.5f, 0), 0);
        path->Release();
        b->Annotate(kAnnotateCompositionId, "hud");
        b->PopState();
    }
    ~Frame() {
        for (CommandBuffer* b : buffers)
            b->Release();
    }
    FontId LoadPictureFont() {
        const BitmapFontImage page{pixels, 2, 2, 8};
        const std::string table =
            "info size=2\ncommon lineHeight=2 base=2\n"
            "char id=65 x=0 y=0 width=1 height=2 xadvance=2\nchar id=66 x=1 y=0 width=1 height=1 "
            "xadvance=1\n";
        MemoryReader reader(std::vector<uint8_t>(table.begin(), table.end()));
        return canvas.library->GetFontService()->RegisterBitmapFont(&reader, {"Tiles", 0, &page, 1});
    }
    std::vector<uint64_t> Capture(size_t* size) {
        const CaptureData data = canvas.scene->SerializeBuffers(buffers, 2);
        std::vector<uint64_t> copy(data.size / 8 + 1);
        std::memcpy(copy.data(), data.data, data.size);
        *size = data.size;
        canvas.scene->FreeCapture(data);
        return copy;
    }
};

}  // namespace

TEST(Capture, ReplaysBitForBit) {
    Frame frame;
    size_t size = 0;
    const std::vector<uint64_t> file = frame.Capture(&size);
    frame.canvas.scene->ExecuteBackEnd(frame.buffers, 2);
    cpu::PixelBuffer picture;
    const char* error = nullptr;
    ASSERT_TRUE(cpu::ReplayCapture(file.data(), size, &picture, &error)) << error;
    ASSERT_EQ(picture.width(), 96);
    EXPECT_EQ(std::memcmp(picture.pixels(), frame.canvas.pixels.data(), picture.bytes()), 0);
}

TEST(Capture, CutAndScrambledFilesAreRefusedOrDrawn) {
    Frame frame;
    size_t size = 0;
    const std::vector<uint64_t> file = frame.Capture(&size);
    const auto replay = [](const void* data, size_t length) {
        cpu::PixelBuffer picture;
        const char* error = nullptr;
        const bool drawn = cpu::ReplayCapture(data, length, &picture, &error);
        EXPECT_EQ(drawn, error == nullptr);
        return drawn;
    };
    for (size_t cut = 0; cut < size; cut += 1 + size / 97) {
        std::vector<uint64_t> part(file.begin(), file.begin() + ptrdiff_t(cut / 8 + 1));
        EXPECT_FALSE(replay(part.data(), cut)) << cut;
    }
    // The font is most of the file; damage what comes after it, where the streams are, and the headers.
    std::mt19937 random(1);
    for (int round = 0; round < 120; ++round) {
        std::vector<uint64_t> damaged = file;
        auto* bytes = reinterpret_cast<uint8_t*>(damaged.data());
        for (int i = 0; i < 3; ++i)
            bytes[size - 1 - random() % 4000] = uint8_t(random());
        if (round % 3 == 0) bytes[random() % 64] ^= uint8_t(1 << random() % 8);
        replay(damaged.data(), size);
    }
}

TEST(Capture, StreamsAreCheckedRecordByRecord) {
    CommandBuffer* b = Library::CreateBuffer(0, 0);
    b->FillRect({1, 2, 0, 3, 4}, Solid(1, 0, 0));
    std::vector<uint32_t> words(b->GetStreamSize() / 4);
    std::memcpy(words.data(), b->GetStream(), b->GetStreamSize());
    b->Release();
    const auto valid = [](const std::vector<uint32_t>& stream) {
        const char* error = nullptr;
        return ValidateStream(stream.data(), stream.size() * 4, 0, &error);
    };
    EXPECT_TRUE(valid(words));
    const auto with = [&](size_t index, uint32_t value) {
        std::vector<uint32_t> changed = words;
        changed[index] = value;
        return changed;
    };
    EXPECT_FALSE(valid(with(0, 0)));
    EXPECT_FALSE(valid(with(0, uint32_t(CommandType::Count))));
    EXPECT_FALSE(valid(with(0, uint32_t(CommandType::FillPath))));
    EXPECT_FALSE(valid(with(1, words[1] - 4)));
    EXPECT_FALSE(valid(with(1, words[1] + 4)));
    EXPECT_FALSE(valid(with(1, 0)));
    EXPECT_FALSE(valid(with(2, 0x7F800000)));  // infinite x
    words.pop_back();
    EXPECT_FALSE(valid(words));
}

}  // namespace fresco::test
