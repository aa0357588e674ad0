// Whole streams on a target: clips, layers, masks, surfaces, text, and that a partial repaint is exact.
#include <cmath>
#include <random>

#include <gtest/gtest.h>
#include "canvas.h"

namespace fresco::test {
namespace {

const Pixel kNone{0, 0, 0, 0}, kRed{255, 0, 0, 255}, kBlue{0, 0, 255, 255}, kWhite{255, 255, 255, 255};
const CornerRadii kRound8{{8, 8}, {8, 8}, {8, 8}, {8, 8}};

}  // namespace

TEST(Scene, FractionalRectanglesCoverByArea) {
    Canvas canvas;
    CommandBuffer* b = Buffer();
    b->FillRect({10.25f, 10, 0, 10, 10}, Solid(1, 1, 1));
    b->FillRect({40, 40.5f, 0, 1, 1}, Solid(1, 1, 1));
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(10, 15).a, 191);
    EXPECT_EQ(canvas.At(15, 15), kWhite);
    EXPECT_EQ(canvas.At(20, 15).a, 64);
    EXPECT_EQ(canvas.At(40, 40).a, 128);
    EXPECT_EQ(canvas.At(40, 41).a, 128);
    EXPECT_EQ(canvas.At(21, 15), kNone);
}

TEST(Scene, ClipModesCombineAndStatesRestore) {
    Canvas canvas;
    CommandBuffer* b = Buffer();
    b->BeginScissor();
    b->PushState(kStateAll);
    b->ClipRect({0, 0, 0, 20, 64}, kClipSet);
    b->ClipRect({40, 0, 0, 10, 64}, kClipAdd);
    b->PushState(kStateClip);
    b->ClipRect({0, 10, 0, 64, 20}, kClipIntersect);
    b->ClipRoundedRect({4, 14, 0, 8, 8}, {}, kClipExclude);
    b->FillRect({0, 0, 0, 64, 64}, Solid(1, 0, 0));
    b->PopState();
    b->FillRect({0, 40, 0, 64, 10}, Solid(0, 0, 1));
    b->PopState();
    b->FillRect({30, 60, 0, 1, 1}, Solid(1, 1, 1));
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(2, 15), kRed);
    EXPECT_EQ(canvas.At(6, 16), kNone);  // excluded
    EXPECT_EQ(canvas.At(45, 15), kRed);
    EXPECT_EQ(canvas.At(30, 15), kNone);  // between the two scissors
    EXPECT_EQ(canvas.At(2, 5), kNone);
    EXPECT_EQ(canvas.At(2, 45), kBlue);
    EXPECT_EQ(canvas.At(30, 45), kNone);
    EXPECT_EQ(canvas.At(30, 60), kWhite);
}

TEST(Scene, LayersGroupOpacityAndKeepToTheirClip) {
    Canvas canvas;
    CommandBuffer* b = Buffer();
    b->PushState(kStateClip);
    b->ClipRect({0, 0, 0, 30, 30}, kClipIntersect);
    CommandBuffer* layer = b->BeginLayer(kLayerContent, MakeLayerPaint(0.5f));
    EXPECT_EQ(layer->Query(kQueryParentBuffer), static_cast<void*>(layer));
    layer->Translate(5, 5);
    layer->FillRect({0, 0, 0, 20, 20}, Solid(1, 0, 0));
    layer->FillRect({10, 10, 0, 50, 20}, Solid(0, 0, 1));
    Matrix4 inner, after;
    b = layer->EndLayerTransformed(&inner);
    EXPECT_EQ(inner.m[12], 5);
    b->GetTransform(&after);
    EXPECT_EQ(after.m[12], 0);
    EXPECT_EQ(b->Query(kQueryParentBuffer), nullptr);
    b->PopState();
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(8, 8), (Pixel{128, 0, 0, 128}));
    EXPECT_EQ(canvas.At(20, 20), (Pixel{0, 0, 128, 128}));  // the red below it does not shine through
    EXPECT_EQ(canvas.At(40, 20), kNone);
    EXPECT_EQ(canvas.scene->GetStats().layers, 1u);
}

TEST(Scene, EffectsBlendFillAndReachIntoTheirClip) {
    Canvas canvas;
    IEffectFactory* factory = GetEffectFactory();
    CommandBuffer* b = Buffer();
    b->FillRect({0, 0, 0, 64, 64}, Solid(1, 1, 0));
    Effect* multiply = factory->CreateBlend(kBlendMultiply);
    b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &multiply, 1);
    b->FillRect({0, 0, 0, 10, 10}, Solid(0, 1, 1));
    b->EndLayer();
    const GradientStop stops[] = {{0, {1, 0, 0, 1}}, {1, {0, 0, 1, 1}}};
    Effect* gradient = factory->CreateLinearGradient({{0, 40}, {64, 40}}, stops, 2);
    b->BeginLayerWithEffects(kLayerEffectFill, MakeLayerPaint(1), &gradient, 1);
    b->FillCircle(10, 40, 0, 8, Solid(1, 1, 1));
    b->FillCircle(54, 40, 0, 8, Solid(1, 1, 1));
    b->EndLayer();
    // A blurred box that lies outside of the clip but reaches into it.
    const FilterRecord blur{uint32_t(FilterKind::Blur), {3}};
    Effect* blurred = factory->CreateFilter(&blur, 1);
    b->PushState(kStateClip);
    b->ClipRect({0, 56, 0, 64, 8}, kClipIntersect);
    b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &blurred, 1);
    b->FillRect({20, 50, 0, 20, 5}, Solid(0, 0, 0));
    b->EndLayer();
    b->PopState();
    for (Effect* effect : {multiply, gradient, blurred})
        effect->Release();
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(5, 5), (Pixel{0, 255, 0, 255}));
    EXPECT_GT(canvas.At(10, 40).r, 200);
    EXPECT_GT(canvas.At(54, 40).b, 200);
    EXPECT_EQ(canvas.At(32, 40), (Pixel{255, 255, 0, 255}));
    EXPECT_LT(canvas.At(30, 56).r, 220);
    EXPECT_EQ(canvas.At(30, 52), (Pixel{255, 255, 0, 255}));
}

TEST(Scene, ImagesAndSurfaces) {
    Canvas canvas;
    const uint32_t checker[4] = {0xFF0000FF, 0xFFFF0000, 0xFFFF0000, 0xFF0000FF};
    const ImageId image = Library::GetImageName();
    const SurfaceId surface = Library::GetSurfaceName();
    CommandBuffer* resources = Buffer();
    resources->CreateImage(image, {2, 2, PixelFormat::RGBA8, 0, 0, checker});
    resources->CreateSurface(surface, {8, 8, PixelFormat::RGBA8}, 0);
    canvas.Draw(resources);
    const SurfaceId own = Library::GetSurfaceName();
    CommandBuffer* makes = Library::CreateBufferForSurface(own, 256, 0);
    makes->CreateSurface(own, {4, 4, PixelFormat::RGBA8}, 0);
    makes->FillRect({0, 0, 0, 4, 4}, Solid(0, 0, 1));
    canvas.Draw(makes);
    CommandBuffer* onSurface = Library::CreateBufferForSurface(surface, 256, 0);
    onSurface->ClearRect({}, 1);
    onSurface->FillRect({0, 0, 0, 8, 4}, Solid(1, 0, 0));
    canvas.Draw(onSurface);

    CommandBuffer* b = Buffer();
    b->DrawImage(image, {0, 0, 0, 2, 2}, {}, Paint{});
    b->DrawSurface(surface, {}, {20, 0, 0, 8, 8}, Paint{});
    b->DrawSurface(own, {}, {60, 0, 0, 4, 4}, Paint{});
    b->DrawImage(image, {30, 0, 0, 20, 20}, {0, 0, 0, 1, 1},
                 Paint{});  // one texel, stretched: no neighbour bleeds in
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(0, 0), kRed);
    EXPECT_EQ(canvas.At(1, 0), kBlue);
    EXPECT_EQ(canvas.At(23, 2), kRed);
    EXPECT_EQ(canvas.At(23, 6), kNone);
    EXPECT_EQ(canvas.At(61, 1), kBlue);
    EXPECT_EQ(canvas.At(49, 19), kRed);
    canvas.scene->FreeImages(&image, 1);
    canvas.scene->FreeSurfaces(&surface, 1);
}

TEST(Scene, PartialRepaintEqualsFullRepaint) {
    Canvas canvas(160, 120);
    const FontId font = canvas.LoadFont(kSans);
    std::mt19937 random(5);
    const auto unit = [&] { return float(random() % 1000) / 1000; };
    const uint32_t noise[16] = {0xFF112233, 0x80402010, 0xFFFFFFFF, 0,
                                0xFF00FF00, 0xFF0000FF, 0x40101010, 0xFFAABBCC};
    const ImageId image = Library::GetImageName();
    CommandBuffer* upload = Buffer();
    upload->CreateImage(image, {4, 4, PixelFormat::RGBA8, 0, 0, noise});
    canvas.Draw(upload);
    const auto record = [&](uint32_t seed, const IntRect* dirty, int count) {
        random.seed(seed);
        CommandBuffer* b = Buffer();
        b->BeginScissor();
        b->PushState(kStateAll);
        for (int i = 0; i < count; ++i) {
            b->ClipRect(
                {float(dirty[i].x), float(dirty[i].y), 0, float(dirty[i].width), float(dirty[i].height)},
                i ? kClipAdd : kClipSet);
        }
        b->ClearRect({0, 0, 0, 160, 120}, 0);
        for (int i = 0; i < 24; ++i) {
            const Rect rect{unit() * 140, unit() * 100, 0, 5 + unit() * 60, 5 + unit() * 40};
            const Paint paint = Solid(unit(), unit(), unit(), 0.3f + 0.7f * unit());
            b->PushState(kStateAll);
            if (i % 5 == 1) b->MultiplyTransform(AffineMatrix(0.9f, 0.3f, -0.2f, 1.1f, 10, -5));
            if (i % 7 == 2) b->ClipRoundedRect({30, 20, 0, 80, 70}, kRound8, kClipIntersect);
            const bool layer = i % 6 == 3;
            if (layer) b->BeginLayer(kLayerContent, MakeLayerPaint(0.6f));
            const GradientStop stops[] = {{0, {1, 0, 0, 1}}, {1, {0, 0, 0.5f, 0.5f}}};
            switch (i % 6) {
                case 0:
                    b->FillRect(rect, paint);
                    break;
                case 1:
                    b->FillRoundedRect(rect, kRound8, paint);
                    break;
                case 2:
                    b->FillLinearGradient(rect, paint, stops, 2, {{0, 0}, {1, 1}});
                    break;
                case 3:
                    b->StrokeEllipse(rect.x, rect.y, 0, rect.width, rect.height, paint);
                    break;
                case 4:
                    b->DrawImage(image, rect, {}, paint);
                    break;
                default: {
                    TextPaint text;
                    text.font = font, text.size = 9 + unit() * 20, text.x = rect.x, text.y = rect.y,
                    text.paint = paint;
                    b->FillString("partial", 7, text);
                }
            }
            if (layer) b->EndLayer();
            b->PopState();
        }
        b->PopState();
        return b;
    };
    for (uint32_t round = 1; round <= 30; ++round) {
        // The old picture is another one: all that shows in the end comes from the second recording.
        const IntRect whole{0, 0, 160, 120};
        canvas.Draw(record(round, &whole, 1));
        const std::vector<uint32_t> full = canvas.pixels;
        std::mt19937 place(round);
        IntRect dirty[4];
        for (IntRect& d : dirty)
            d = {int(place() % 120), int(place() % 90), 1 + int(place() % 60), 1 + int(place() % 50)};
        for (const IntRect& d : dirty) {
            for (int y = d.y; y < std::min(120, d.y + d.height); ++y) {
                for (int x = d.x; x < std::min(160, d.x + d.width); ++x)
                    canvas.pixels[size_t(y * 160 + x)] = 0xFFFF00FF;
            }
        }
        canvas.Draw(record(round, dirty, 4));
        ASSERT_EQ(canvas.pixels, full) << "round " << round;
    }
}

}  // namespace fresco::test
