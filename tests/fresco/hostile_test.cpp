// Streams that ask for too much: they draw something or nothing, soon, and in bounded memory.
#include <gtest/gtest.h>

#include <cmath>
#include <functional>

#include "canvas.h"

namespace fresco::test {
namespace {

constexpr long kMegabyte = 1 << 20;
const CornerRadii kRound{{9, 9}, {9, 9}, {9, 9}, {9, 9}};

// One draw of each kind around the origin.
void DrawEachKind(CommandBuffer* b, FontId font, ImageId image, float size) {
    const Rect rect{-size, -size, 0, 2 * size, 2 * size};
    const GradientStop stops[] = {{0, {1, 0, 0, 1}}, {1, {0, 0, 1, 1}}};
    Paint paint = Solid(1, 0, 0, 0.5f);
    paint.strokeWidth = size / 10;
    Path* path = Path::Create();
    path->MoveTo(-size, 0), path->BezierCurveTo(0, -size * 3, 0, size * 3, size, 0), path->Close();
    b->FillRect(rect, paint), b->StrokeRect(rect, paint);
    b->FillRoundedRect(rect, kRound, paint), b->StrokeRoundedRect(rect, kRound, paint);
    b->FillEllipse(0, 0, 0, size, size / 2, paint), b->StrokeEllipse(0, 0, 0, size, size / 2, paint);
    b->FillPath(*path, paint), b->StrokePath(*path, paint, 0);
    b->FillLinearGradient(rect, paint, stops, 2, {{0, 0}, {1, 1}, kSpreadRepeat});
    b->FillRadialGradient(rect, paint, stops, 2, {{0, 0}, {0, 0}, kSpreadReflect});
    b->FillLinearGradient(rect, paint, nullptr, 0, {});
    b->DrawImage(image, rect, {}, paint);
    b->DrawImageTiled(image, rect, {{}, {0, 0, 0, 0.001f, 0.001f}, -5, 0}, paint);
    b->ClearRect({0, 0, 0, 1, 1}, 0);
    TextPaint text;
    text.font = font, text.size = size, text.paint = paint;
    b->FillString("text", 4, text);
    text.flags = kTextStroke;
    b->FillString("text", 4, text);
    b->PushState(kStateClip);
    b->ClipRoundedRect(rect, kRound, kClipExclude);
    b->ClipPath(*path, kClipAdd);
    const FilterRecord shadow{uint32_t(FilterKind::DropShadow), {size, -size, size, 0, 0, 0, 1}};
    Effect* filter = GetEffectFactory()->CreateFilter(&shadow, 1);
    b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(0.5f), &filter, 1);
    b->FillRect(rect, paint);
    b->SetMaskImage(image, rect, {}, 0);
    b->SetMaskImageTiled(image, rect, {{}, rect, 1e9f, 1e9f}, 0);
    b->EndLayer();
    b->PopState();
    if (filter) filter->Release();
    path->Release();
}

class HostileCanvas : public Canvas {
  public:
    explicit HostileCanvas(int width = 96, int height = 64) : Canvas(width, height) {
        font = LoadFont(kSans);
        image = Library::GetImageName();
        CommandBuffer* b = Buffer();
        b->CreateImage(image, {2, 2, PixelFormat::RGBA8, 0, 0, texels});
        Draw(b);
    }
    FontId font;
    ImageId image;
    const uint32_t texels[4] = {0xFF0000FFu, 0x80008000u, 0, 0xFFFFFFFFu};
};

}  // namespace

TEST(Hostile, MatricesOfEveryDegenerateKind) {
    const float huge = 1e30f, tiny = 1e-30f;
    Matrix4 zero, flat, edgeOn, behind, through, vast, minute;
    for (float& m : zero.m)
        m = 0;
    flat.m[5] = 0;
    edgeOn.m[0] = 0, edgeOn.m[2] = 1;
    behind.m[15] = -1;
    through.m[3] = 0.1f, through.m[7] = -0.07f, through.m[15] = 0.0f;
    for (float* m : {&vast.m[0], &vast.m[5], &vast.m[12]})
        *m = huge;
    minute.m[0] = tiny, minute.m[5] = tiny;
    Matrix4 skewed = AffineMatrix(1, 1, 1, 1.0000001f, 0, 0);
    for (const Matrix4& matrix : {zero, flat, edgeOn, behind, through, vast, minute, skewed}) {
        HostileCanvas canvas;
        for (const float size : {0.0f, 1e-20f, 10.0f, 1e20f, NAN, INFINITY}) {
            CommandBuffer* b = Buffer();
            b->PushState(kStateAll);
            b->MultiplyTransform(matrix);
            DrawEachKind(b, canvas.font, canvas.image, size);
            for (int i = 0; i < 8; ++i)
                b->MultiplyTransform(matrix);  // beyond what floats hold
            DrawEachKind(b, canvas.font, canvas.image, size);
            b->PopState();
            canvas.Draw(b);
        }
        EXPECT_LT(canvas.allocator.peak, 300 * kMegabyte);
    }
}

TEST(Hostile, WhatLiesBehindTheEyeIsNotSeen) {
    HostileCanvas canvas;
    Matrix4 perspective;
    perspective.m[11] = -1.0f / 100;
    CommandBuffer* b = Buffer();
    b->MultiplyTransform(perspective);
    b->MultiplyTransform(TranslationMatrix(0, 0, 150));
    DrawEachKind(b, canvas.font, canvas.image, 50);
    canvas.Draw(b);
    for (const uint32_t p : canvas.pixels)
        ASSERT_EQ(p, 0u);
    // A floor that runs from before the eye to behind it: seen up to the eye's plane.
    Matrix4 lying;
    lying.m[5] = 0, lying.m[6] = 1, lying.m[9] = -1, lying.m[10] = 0;
    b = Buffer();
    b->Translate(48, 10);
    b->MultiplyTransform(perspective);
    b->Translate(0, 20);
    b->MultiplyTransform(lying);
    b->FillRect({-40, -500, 0, 80, 700}, Solid(0, 1, 0));
    b->DrawImage(canvas.image, {-40, -500, 0, 80, 700}, {}, Paint{});
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(48, 60).g, 255);
    EXPECT_EQ(canvas.At(48, 2).a, 0);
}

TEST(Hostile, BlursAndShadowsOfTenThousandPixels) {
    HostileCanvas canvas;
    const FilterRecord filters[] = {{uint32_t(FilterKind::Blur), {10000}},
                                    {uint32_t(FilterKind::DropShadow), {10000, 10000, 10000, 0, 0, 0, 1}},
                                    {uint32_t(FilterKind::DropShadow), {4000, 0, 1, 0, 0, 0, 1}},
                                    {uint32_t(FilterKind::AxisBlur), {10000, 0}},
                                    {uint32_t(FilterKind::Blur), {1e30f}}};
    for (uint32_t first = 0; first < 5; ++first) {
        Effect* effect = GetEffectFactory()->CreateFilter(filters + first, first == 4 ? 1 : 2);
        CommandBuffer* b = Buffer();
        b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &effect, 1);
        b->FillRect({0, 0, 0, 96, 64}, Solid(1, 1, 1));
        b->EndLayer();
        effect->Release();
        canvas.Draw(b);
    }
    // A shadow's surface as large as its blur asks for is refused, the draw of it does nothing.
    const SurfaceId surface = Library::GetSurfaceName();
    CommandBuffer* b = Library::CreateBufferForSurface(surface, 256, 0);
    b->CreateSurface(surface, {20100, 20100, PixelFormat::RGBA8}, 0);
    b->FillRect({0, 0, 0, 100, 100}, Solid(0, 0, 0));
    b->ApplyBlur(10000);
    canvas.Draw(b);
    b = Buffer();
    b->DrawSurface(surface, {}, {0, 0, 0, 20100, 20100}, Paint{});
    canvas.Draw(b);
    EXPECT_LT(canvas.allocator.peak, 400 * kMegabyte);
    EXPECT_FALSE(canvas.log.lines.empty());
}

TEST(Hostile, ThousandsOfLayersClipsAndStates) {
    HostileCanvas canvas(120, 90);
    CommandBuffer* b = Buffer();
    for (int i = 0; i < 1000; ++i) {
        b->PushState(kStateAll);
        if (i % 2)
            b->ClipEllipse(60, 45, 75, 56, kClipIntersect);
        else
            b->ClipRoundedRect({float(i) / 50, 0, 0, 120, 90}, kRound, kClipIntersect);
        b->BeginLayer(kLayerContent, MakeLayerPaint(1, uint32_t(i) % kBlendModeCount));
        b->FillRect({0, 0, 0, 120, 90}, Solid(0, 0, 1, 0.1f));
    }
    for (int i = 0; i < 1000; ++i) {
        b->EndLayer();
        b->PopState();
    }
    canvas.Draw(b);
    // Clips of a large target come to the end of their room.
    HostileCanvas wide(1920, 1080);
    b = Buffer();
    for (int i = 0; i < 140; ++i) {
        b->PushState(kStateAll);
        b->ClipEllipse(960, 540, 1000, 900, kClipIntersect);
    }
    b->FillRect({0, 0, 0, 1920, 1080}, Solid(1, 0, 0));
    wide.Draw(b);
    EXPECT_LT(wide.allocator.peak, 330 * kMegabyte);
    EXPECT_EQ(wide.At(960, 540).r, 255);
    // A layer is never larger than its clip, however large the target is.
    b = Buffer();
    b->ClipRect({10, 10, 0, 4, 4}, kClipIntersect);
    for (int i = 0; i < 1000; ++i)
        b->BeginLayer(kLayerContent, MakeLayerPaint(0.5f));
    b->FillRect({0, 0, 0, 120, 90}, Solid(0, 0, 1));
    canvas.Draw(b);
    EXPECT_LT(canvas.allocator.peak, 300 * kMegabyte);
}

TEST(Hostile, AHundredThousandDraws) {
    HostileCanvas canvas(320, 240);
    CommandBuffer* b = Buffer();
    for (int i = 0; i < 100'000; ++i) {
        const float x = float(i % 311), y = float(i % 233);
        switch (i % 5) {
            case 0:
                b->FillRect({x, y, 0, 9, 7}, Solid(1, 0, 0, 0.5f));
                break;
            case 1:
                b->FillRoundedRect({x, y, 0, 12, 9}, kRound, Solid(0, 1, 0));
                break;
            case 2:
                b->DrawImage(canvas.image, {x, y, 0, 5, 5}, {}, Paint{});
                break;
            case 3:
                b->ClipRect({x, y, 0, 300, 200}, i % 3 ? kClipSet : kClipExclude);
                break;
            default:
                b->StrokeEllipse(x, y, 0, 5, 4, Solid(0, 0, 1));
        }
    }
    canvas.Draw(b);
    EXPECT_LT(canvas.allocator.peak, 120 * kMegabyte);
}

TEST(Hostile, TargetsWithoutRoomAreRefused) {
    HostileCanvas canvas;
    uint32_t pixel = 0;
    const CpuRenderTarget targets[] = {{nullptr, 0, 0, 0},
                                       {&pixel, 0, 0, 0},
                                       {&pixel, 0, 1, 4},
                                       {&pixel, 1, 1, 3},
                                       {&pixel, 1, 1, 6},
                                       {&pixel, 70000, 1, 280000},
                                       {reinterpret_cast<uint8_t*>(&pixel) + 1, 1, 1, 4}};
    for (const CpuRenderTarget& target : targets) {
        canvas.scene->SetRenderTarget(const_cast<CpuRenderTarget*>(&target), nullptr, {});
        CommandBuffer* b = Buffer();
        DrawEachKind(b, canvas.font, canvas.image, 10);
        b->ClearRect({}, 1);
        b->ApplyBlur(5);
        canvas.Draw(b);
    }
    EXPECT_EQ(pixel, 0u);
    EXPECT_EQ(canvas.scene->GetStats().paintedPixels, 0u);
    // Images and surfaces that make no sense, or were never made.
    CommandBuffer* b = Buffer();
    b->DrawSurface(12345, {}, {0, 0, 0, 10, 10}, Paint{});
    for (const uint32_t side : {0u, 1u, 16385u, 0xFFFFFFFFu}) {
        const ImageId id = Library::GetImageName();
        b->CreateImage(
            id, {side, side == 1 ? 1u : 20000u, PixelFormat::RGBA8, 0, side == 1 ? 4u : 1u, canvas.texels});
        b->UpdateImage(id, canvas.texels, 3, 0);
        b->DrawImage(id, {0, 0, 0, 10, 10}, {-5, 1e9f, 0, -3, 0.5f}, Paint{});
        b->CreateSurface(Library::GetSurfaceName(), {side, 3, PixelFormat::RGBA8}, 0);
    }
    canvas.Draw(b);
}

}  // namespace fresco::test
