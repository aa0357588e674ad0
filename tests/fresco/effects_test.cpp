// What draws look like, against the formulas: gradients, pictures, tiles, video, filters, blends, clips,
// masks.
#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <functional>

#include "canvas.h"
#include "fresco/cpu/blend_modes.h"
#include "fresco/paths/matrix.h"

namespace fresco::test {
namespace {

void ExpectNear(Pixel a, std::array<double, 4> b, double tolerance, const std::string& where) {
    EXPECT_NEAR(a.r, b[0], tolerance) << where;
    EXPECT_NEAR(a.g, b[1], tolerance) << where;
    EXPECT_NEAR(a.b, b[2], tolerance) << where;
    EXPECT_NEAR(a.a, b[3], tolerance) << where;
}

std::string Name(int i, int x, int y) {
    return "case " + std::to_string(i) + " at " + std::to_string(x) + "," + std::to_string(y);
}

Matrix4 Turned() {
    return AffineMatrix(0.8f, 0.5f, -0.4f, 0.9f, 20, 4);
}

Matrix4 Deep() {
    Matrix4 perspective, turn;
    perspective.m[11] = -1.0f / 150;
    turn.m[0] = std::cos(0.6f), turn.m[2] = -std::sin(0.6f), turn.m[8] = std::sin(0.6f),
    turn.m[10] = std::cos(0.6f);
    return TranslationMatrix(32, 20) * perspective * turn * TranslationMatrix(-20, -10);
}

// Calls `check` for pixels that lie well inside of the rectangle under the transform, with their place in its
// plane.
void ForInside(const Matrix4& matrix, const Rect& rect, const std::function<void(int, int, Vec2)>& check) {
    Homography inverse;
    ASSERT_TRUE(Homography::FromMatrix(matrix).Invert(&inverse));
    int count = 0;
    for (int y = 0; y < 64; ++y) {
        for (int x = 0; x < 64; ++x) {
            const Vec2 p = inverse.Project(x + 0.5, y + 0.5);
            const bool inside = p.x > rect.x + 2 && p.x < rect.x + rect.width - 2 && p.y > rect.y + 2 &&
                                p.y < rect.y + rect.height - 2;
            if (inside && (x + y) % 3 == 0) check(x, y, p), ++count;
        }
    }
    EXPECT_GT(count, 40);
}

double Spread(double t, uint32_t spread) {
    if (spread == kSpreadPad) return std::clamp(t, 0.0, 1.0);
    if (spread == kSpreadRepeat) return t - std::floor(t);
    return std::abs(t - 2 * std::floor(t / 2 + 0.5));
}

}  // namespace

TEST(Effects, GradientsFollowTheirFormulas) {
    const Rect rect{2, 2, 0, 44, 30};
    const GradientStop stops[] = {{0, {1, 0, 0, 1}}, {0.25f, {0, 1, 0, 1}}, {1, {0, 0, 0.4f, 0.4f}}};
    const auto color = [](double t) -> std::array<double, 4> {
        const double f = t < 0.25 ? t * 4 : (t - 0.25) / 0.75;
        if (t < 0.25) return {255 * (1 - f), 255 * f, 0, 255};
        return {0, 255 * (1 - f), 102 * f, 255 - 153 * f};
    };
    int round = 0;
    for (const Matrix4& matrix : {Matrix4(), Turned(), Deep()}) {
        for (const uint32_t spread : {kSpreadPad, kSpreadRepeat, kSpreadReflect}) {
            for (const bool radial : {false, true}) {
                Canvas canvas;
                CommandBuffer* b = Buffer();
                b->MultiplyTransform(matrix);
                // In units of 44 pixels from the corner.
                const LinearGradient line{{0.3f, 0.1f}, {0.8f, 0.5f}, spread};
                const RadialGradient ring{{0.4f, 0.3f}, {0.6f, 0.3f}, spread};
                if (radial)
                    b->FillRadialGradient(rect, Paint{}, stops, 3, ring);
                else
                    b->FillLinearGradient(rect, Paint{}, stops, 3, line);
                canvas.Draw(b);
                ForInside(matrix, rect, [&](int x, int y, Vec2 p) {
                    const double u = (p.x - 2) / 44, v = (p.y - 2) / 44;
                    const double t = radial ? std::hypot((u - 0.4) / 0.6, (v - 0.3) / 0.3)
                                            : ((u - 0.3) * 0.5 + (v - 0.1) * 0.4) / 0.41;
                    const double at = Spread(t, spread);
                    // Where the colour jumps, the nearer entry decides.
                    if (spread == kSpreadRepeat && (at < 0.03 || at > 0.97)) return;
                    ExpectNear(canvas.At(x, y), color(at), 12, Name(round, x, y));
                });
                ++round;
            }
        }
    }
}

TEST(Effects, HardStopsThatMeetShareNoPixel) {
    const Color half{0, 0, 0.5f, 0.5f}, none{0, 0, 0, 0};
    const LinearGradient diagonal{{0, 1}, {1, 0}, kSpreadPad};
    for (const float side : {12.0f, 24.0f, 40.0f, 60.0f}) {
        for (const float at : {0.25f, 0.5f, 0.75f}) {
            const GradientStop before[] = {{0, half}, {at, half}, {at, none}, {1, none}};
            const GradientStop after[] = {{0, none}, {at, none}, {at, half}, {1, half}};
            Canvas canvas;
            CommandBuffer* b = Buffer();
            const Rect rect{0, 0, 0, side, side};
            b->FillLinearGradient(rect, Paint{}, before, 4, diagonal);
            b->FillLinearGradient(rect, Paint{}, after, 4, diagonal);
            canvas.Draw(b);
            for (int y = 0; y < int(side); ++y) {
                for (int x = 0; x < int(side); ++x)
                    ASSERT_EQ(canvas.At(x, y), canvas.At(0, 0)) << side << " " << at << " " << x << "," << y;
            }
        }
    }
}

// However short the last ramp: what lies beyond the ends has their very colours.
TEST(Effects, GradientsEndInTheirLastColour) {
    const Color solid{0.8f, 0.4f, 0.2f, 1}, none{0, 0, 0, 0};
    const GradientStop out[] = {{0, solid}, {0.95f, solid}, {1, none}};
    const GradientStop in[] = {{0, none}, {0.05f, solid}, {1, solid}};
    const Rect rect{0, 0, 0, 64, 64};
    Canvas canvas;
    CommandBuffer* b = Buffer();
    b->FillRadialGradient(rect, Paint{}, out, 3, {{0.5f, 0.5f}, {0.25f, 0.25f}});
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(0, 32), (Pixel{0, 0, 0, 0}));
    EXPECT_EQ(canvas.At(32, 32), (Pixel{204, 102, 51, 255}));
    b = Buffer();
    b->ClearRect(rect, 1);
    b->FillLinearGradient(rect, Paint{}, in, 3, {{0.5f, 0}, {0.75f, 0.25f}});
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(8, 8), (Pixel{0, 0, 0, 0}));
    EXPECT_EQ(canvas.At(60, 60), (Pixel{204, 102, 51, 255}));
}

TEST(Effects, PicturesGoThroughAnyTransform) {
    // A ramp: what is seen tells where it comes from.
    std::vector<uint32_t> ramp;
    for (uint32_t y = 0; y < 32; ++y) {
        for (uint32_t x = 0; x < 32; ++x)
            ramp.push_back(x * 8 | (y * 8) << 8 | 0xFF000000u);
    }
    const Rect rect{2, 2, 0, 40, 30};
    int round = 0;
    for (const Matrix4& matrix : {Matrix4(), ScaleMatrix(1.3f, 1.2f), Turned(), Deep()}) {
        Canvas canvas;
        const ImageId image = Library::GetImageName();
        CommandBuffer* b = Buffer();
        b->CreateImage(image, {32, 32, PixelFormat::RGBA8, 0, 0, ramp.data()});
        b->MultiplyTransform(matrix);
        b->DrawImage(image, rect, {4, 8, 0, 20, 16}, Paint{});
        canvas.Draw(b);
        ForInside(matrix, rect, [&](int x, int y, Vec2 p) {
            const double u = 4 + (p.x - 2) / 40 * 20 - 0.5, v = 8 + (p.y - 2) / 30 * 16 - 0.5;
            ExpectNear(canvas.At(x, y), {u * 8, v * 8, 0, 255}, 5, Name(round, x, y));
        });
        ++round;
    }
}

TEST(Effects, ShrunkPicturesAreTheMeanOfTheirTexels) {
    Canvas canvas;
    std::vector<uint32_t> checker;
    for (int i = 0; i < 256 * 256; ++i)
        checker.push_back((i + i / 256) % 2 ? 0xFFFFFFFFu : 0xFF000000u);
    const ImageId image = Library::GetImageName();
    CommandBuffer* b = Buffer();
    b->CreateImage(image, {256, 256, PixelFormat::RGBA8, 0, 0, checker.data()});
    b->DrawImage(image, {0, 0, 0, 60, 60}, {}, Paint{});
    canvas.Draw(b);
    for (int i = 2; i < 58; i += 5)
        EXPECT_NEAR(canvas.At(i, 60 - i).r, 128, 2);
}

TEST(Effects, TilesRepeatWithTheirSpacing) {
    // Nine-slice borders are this: stretch, repeat, round (a fitted tile) and space (a gap).
    std::vector<uint32_t> texels;
    for (uint32_t i = 0; i < 36; ++i)
        texels.push_back(0xFF000000u | i * 7);
    struct Case {
        Rect source, tile;
        float spacing;
    };
    const Case cases[] = {{{}, {5, 3, 0, 6, 6}, 0},
                          {{2, 1, 0, 3, 4}, {-4, 9, 0, 3, 4}, 0},
                          {{0, 0, 0, 6, 6}, {8, 8, 0, 6, 6}, 5},
                          {{1, 1, 0, 4, 4}, {8, 8, 0, 8, 8}, 2}};
    int round = 0;
    for (const Case& c : cases) {
        Canvas canvas;
        const ImageId image = Library::GetImageName();
        CommandBuffer* b = Buffer();
        b->CreateImage(image, {6, 6, PixelFormat::RGBA8, 0, 0, texels.data()});
        b->DrawImageTiled(image, {0, 0, 0, 64, 64}, {c.source, c.tile, c.spacing, c.spacing}, Paint{});
        canvas.Draw(b);
        const int width = c.source.width > 0 ? int(c.source.width) : 6;
        const int scale = int(c.tile.width) / width;
        const auto wrap = [](int v, int period) { return ((v % period) + period) % period; };
        for (int y = 0; y < 64; ++y) {
            for (int x = 0; x < 64; ++x) {
                const int tx = wrap(x - int(c.tile.x), int(c.tile.width + c.spacing));
                const int ty = wrap(y - int(c.tile.y), int(c.tile.height + c.spacing));
                if (tx >= int(c.tile.width) || ty >= int(c.tile.height)) {
                    EXPECT_EQ(canvas.At(x, y), (Pixel{0, 0, 0, 0})) << Name(round, x, y);
                } else if (scale == 1) {
                    const int texel = (int(c.source.y) + ty) * 6 + int(c.source.x) + tx;
                    EXPECT_EQ(canvas.At(x, y).r, texel * 7) << Name(round, x, y);
                }
            }
        }
        ++round;
    }
}

TEST(Effects, TurnedTilesKeepTheirGaps) {
    Canvas canvas;
    const uint32_t white[4] = {0xFFFFFFFFu, 0xFFFFFFFFu, 0xFFFFFFFFu, 0xFFFFFFFFu};
    const ImageId image = Library::GetImageName();
    CommandBuffer* b = Buffer();
    b->CreateImage(image, {2, 2, PixelFormat::RGBA8, 0, 0, white});
    b->MultiplyTransform(Turned());
    b->DrawImageTiled(image, {0, 0, 0, 60, 40}, {{}, {3, 0, 0, 8, 40}, 6, 0}, Paint{});
    canvas.Draw(b);
    ForInside(Turned(), {0, 0, 0, 60, 40}, [&](int x, int y, Vec2 p) {
        const double at = std::fmod(p.x - 3 + 14, 14);
        if (at > 0.5 && at < 7.5) {
            EXPECT_EQ(canvas.At(x, y).a, 255) << Name(0, x, y);
        }
        if (at > 8.5 && at < 13.5) {
            EXPECT_EQ(canvas.At(x, y).a, 0) << Name(1, x, y);
        }
    });
}

TEST(Effects, VideoPlanesBecomeColours) {
    Canvas canvas;
    const auto plane = [&](CommandBuffer* b, int size, uint8_t left, uint8_t right,
                           std::vector<uint8_t>& bytes) {
        bytes.clear();
        for (int i = 0; i < size * size; ++i)
            bytes.push_back(i % size < size / 2 ? left : right);
        const ImageId id = Library::GetImageName();
        b->CreateImage(id, {uint32_t(size), uint32_t(size), PixelFormat::A8, 0, 0, bytes.data()});
        return id;
    };
    std::vector<uint8_t> bytes[4];
    CommandBuffer* b = Buffer();
    // Red at the left (Y 81, U 90, V 240), white at the right, half transparent there.
    const ImageId planes[4] = {plane(b, 16, 81, 235, bytes[0]), plane(b, 8, 90, 128, bytes[1]),
                               plane(b, 8, 240, 128, bytes[2]), plane(b, 16, 255, 128, bytes[3])};
    b->DrawYUVImage(planes, {0, 0, 0, 64, 64}, Paint{});
    canvas.Draw(b);
    ExpectNear(canvas.At(8, 30), {255, 0, 0, 255}, 3, "left");
    ExpectNear(canvas.At(56, 30), {128, 128, 128, 128}, 3, "right");
    b = Buffer();
    const ImageId opaque[4] = {planes[0], planes[1], planes[2], kNoId};
    b->ClearRect({}, 1);
    b->MultiplyTransform(Deep());
    b->DrawYUVImage(opaque, {0, 0, 0, 40, 40}, Paint{});
    canvas.Draw(b);
    ForInside(Deep(), {0, 0, 0, 40, 40}, [&](int x, int y, Vec2 p) {
        if (p.x < 16) ExpectNear(canvas.At(x, y), {255, 0, 0, 255}, 4, Name(0, x, y));
        if (p.x > 24) ExpectNear(canvas.At(x, y), {255, 255, 255, 255}, 4, Name(1, x, y));
    });
}

TEST(Effects, ColourFiltersFollowTheirFormulas) {
    // https://www.w3.org/TR/filter-effects-1/#FilterPrimitivesOverview, written out by hand.
    using Rgb = std::array<double, 3>;
    struct Case {
        FilterRecord filter;
        std::function<Rgb(const Rgb&)> expected;
        double alpha = 1;
    };
    const auto each = [](std::function<double(double)> f) {
        return [f](const Rgb& c) { return Rgb{f(c[0]), f(c[1]), f(c[2])}; };
    };
    const auto luma = [](const Rgb& c) { return 0.213 * c[0] + 0.715 * c[1] + 0.072 * c[2]; };
    const Case cases[] = {
        {{uint32_t(FilterKind::Brightness), {1.5f}}, each([](double c) { return c * 1.5; })},
        {{uint32_t(FilterKind::Contrast), {0.5f}}, each([](double c) { return c * 0.5 + 0.25; })},
        {{uint32_t(FilterKind::Invert), {0.75f}}, each([](double c) { return c * 0.25 + (1 - c) * 0.75; })},
        {{uint32_t(FilterKind::Opacity), {0.5f}}, each([](double c) { return c; }), 0.5},
        {{uint32_t(FilterKind::Grayscale), {1}},
         [](const Rgb& c) {
             const double g = 0.2126 * c[0] + 0.7152 * c[1] + 0.0722 * c[2];
             return Rgb{g, g, g};
         }},
        {{uint32_t(FilterKind::Saturate), {0}},
         [&](const Rgb& c) {
             return Rgb{luma(c), luma(c), luma(c)};
         }},
        {{uint32_t(FilterKind::Saturate), {2}},
         [&](const Rgb& c) {
             const double l = luma(c);
             return Rgb{2 * c[0] - l, 2 * c[1] - l, 2 * c[2] - l};
         }},
        {{uint32_t(FilterKind::Sepia), {1}},
         [](const Rgb& c) {
             return Rgb{0.393 * c[0] + 0.769 * c[1] + 0.189 * c[2],
                        0.349 * c[0] + 0.686 * c[1] + 0.168 * c[2],
                        0.272 * c[0] + 0.534 * c[1] + 0.131 * c[2]};
         }},
        {{uint32_t(FilterKind::HueRotate), {360}}, [](const Rgb& c) { return c; }},
        {{uint32_t(FilterKind::ColorMatrix), {0, 1, 0, 0, 0, 0, 0, 1, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 1, 0}},
         [](const Rgb& c) {
             return Rgb{c[1], c[2], c[0]};
         }}};
    const Color colors[] = {{1, 0, 0, 1}, {0.2f, 0.5f, 0.8f, 1}, {0.9f, 0.9f, 0.1f, 0.5f}, {0, 0, 0, 0.8f}};
    int round = 0;
    for (const Case& c : cases) {
        Canvas canvas(8, 8);
        CommandBuffer* b = Buffer();
        Effect* effect = GetEffectFactory()->CreateFilter(&c.filter, 1);
        b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &effect, 1);
        for (int i = 0; i < 4; ++i)
            b->FillRect({float(i) * 2, 0, 0, 2, 8},
                        Solid(colors[i].r, colors[i].g, colors[i].b, colors[i].a));
        b->EndLayer();
        effect->Release();
        canvas.Draw(b);
        for (int i = 0; i < 4; ++i) {
            const Rgb out = c.expected({colors[i].r, colors[i].g, colors[i].b});
            const double alpha = colors[i].a * c.alpha * 255;
            const auto channel = [&](int k) { return std::clamp(out[size_t(k)], 0.0, 1.0) * alpha; };
            ExpectNear(canvas.At(i * 2, 3), {channel(0), channel(1), channel(2), alpha}, 2.1,
                       Name(round, i, 0));
        }
        ++round;
    }
}

TEST(Effects, ShadowsTurnAndBlurWithTheirElement) {
    // A quarter turn: what goes right in the element goes down on the screen.
    const FilterRecord shadow{uint32_t(FilterKind::DropShadow), {20, 0, 0, 1, 0, 0, 1}};
    const FilterRecord across{uint32_t(FilterKind::AxisBlur), {4, 0}};
    for (const bool turned : {false, true}) {
        Canvas canvas;
        CommandBuffer* b = Buffer();
        Effect* effects[] = {GetEffectFactory()->CreateFilter(&shadow, 1),
                             GetEffectFactory()->CreateFilter(&across, 1)};
        b->Translate(32, 32);
        if (turned) b->MultiplyTransform(AffineMatrix(0, 1, -1, 0, 0, 0));
        b->Translate(-32, -32);
        b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &effects[0], 1);
        b->FillRect({10, 27, 0, 10, 10}, Solid(0, 0, 1));
        b->EndLayer();
        b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &effects[1], 1);
        b->FillRect({31, 8, 0, 2, 8}, Solid(0, 1, 0));
        b->EndLayer();
        for (Effect* effect : effects)
            effect->Release();
        canvas.Draw(b);
        const auto at = [&](int x, int y) { return turned ? canvas.At(63 - y, x) : canvas.At(x, y); };
        EXPECT_EQ(at(15, 32), (Pixel{0, 0, 255, 255})) << turned;
        EXPECT_EQ(at(35, 32), (Pixel{255, 0, 0, 255})) << turned;
        EXPECT_GT(at(36, 12).g, 20) << turned;
        EXPECT_EQ(at(32, 20).g, 0) << turned;
    }
}

TEST(Effects, BlendModesOfDrawsAndLayersAreTheFormula) {
    const auto pack = [](const Pixel& p) {
        return uint32_t(p.r) | uint32_t(p.g) << 8 | uint32_t(p.b) << 16 | uint32_t(p.a) << 24;
    };
    const Paint under[] = {Solid(0.9f, 0.2f, 0.4f), Solid(0.1f, 0.7f, 0.3f, 0.5f), Solid(0, 0, 0, 0)};
    Paint over = Solid(0.3f, 0.6f, 0.9f, 0.75f);
    for (uint32_t mode = 0; mode < kBlendModeCount; ++mode) {
        for (const Paint& backdrop : under) {
            Canvas plain(8, 4), drawn(8, 4), layered(8, 4);
            const auto record = [&](Canvas& canvas, int kind) {
                CommandBuffer* b = Buffer();
                Paint paint = over;
                if (kind > 0) b->FillRect({0, 0, 0, 8, 4}, backdrop);
                b->ClipRect({0, 0, 0, 4, 4});
                if (kind == 1) paint.blend = mode;
                if (kind == 2) b->BeginLayer(kLayerContent, MakeLayerPaint(1, mode));
                b->FillRect({0, 0, 0, 4, 4}, paint);
                if (kind == 2) b->EndLayer();
                canvas.Draw(b);
            };
            record(plain, 0);
            record(drawn, 1);
            record(layered, 2);
            const uint32_t expected = cpu::BlendPixel(mode, pack(plain.At(1, 1)), pack(drawn.At(6, 1)));
            EXPECT_EQ(pack(drawn.At(1, 1)), expected) << mode;
            EXPECT_EQ(pack(layered.At(1, 1)), expected) << mode;
        }
    }
}

TEST(Effects, ClipsOfEveryShapeCoverTheirArea) {
    const Point3 quad[4] = {{10, 10, 0}, {50, 14, 0}, {46, 50, 0}, {8, 40, 0}};
    Path* path = Path::Create();
    path->MoveTo(8, 8), path->LineTo(56, 8), path->LineTo(32, 56), path->Close();
    struct Case {
        std::function<void(CommandBuffer*, uint32_t)> clip;
        double area;
    };
    const Case cases[] = {
        {[](CommandBuffer* b, uint32_t mode) {
             b->ClipRect({10.5f, 12.25f, 0, 30, 20}, mode);
         },
         600},
        {[&](CommandBuffer* b, uint32_t mode) { b->ClipQuad(quad, mode); }, 1308},
        {[](CommandBuffer* b, uint32_t mode) {
             b->ClipRoundedRect({10, 10, 0, 40, 30}, {{10, 10}, {10, 10}, {10, 10}, {10, 10}}, mode);
         },
         1200 - 400 + 100 * 3.14159265},
        {[](CommandBuffer* b, uint32_t mode) { b->ClipEllipse(32, 32, 20, 12, mode); }, 240 * 3.14159265},
        {[&](CommandBuffer* b, uint32_t mode) { b->ClipPath(*path, mode); }, 1152}};
    int round = 0;
    for (const Case& c : cases) {
        for (const bool turned : {false, true}) {
            for (const uint32_t mode : {kClipSet, kClipIntersect, kClipExclude, kClipAdd}) {
                Canvas canvas;
                CommandBuffer* b = Buffer();
                b->PushState(kStateClip);
                if (mode == kClipAdd) b->ClipRect({0, 0, 0, 2, 2}, kClipSet);
                b->PushState(kStateTransform);
                // Turned about the middle, made smaller: all of it stays on the canvas.
                if (turned)
                    b->MultiplyTransform(TranslationMatrix(32, 32) *
                                         AffineMatrix(0.6f, 0.3f, -0.3f, 0.6f, 0, 0) *
                                         TranslationMatrix(-32, -32));
                c.clip(b, mode);
                b->PopState();
                b->FillRect({0, 0, 0, 64, 64}, Solid(1, 0, 0));
                b->PopState();
                canvas.Draw(b);
                const double area = c.area * (turned ? 0.45 : 1);
                const double expected = mode == kClipExclude ? 4096 - area
                                        : mode == kClipAdd   ? area + 4
                                                             : area;
                EXPECT_NEAR(double(canvas.Ink()) / 255, expected, 1.5)
                    << "case " << round << " mode " << mode << " turned " << turned;
            }
        }
        ++round;
    }
    path->Release();
}

TEST(Effects, MasksTakeAlphaTurnAndRepeat) {
    Canvas canvas;
    const uint8_t halves[4] = {255, 64, 255, 64};
    const ImageId image = Library::GetImageName();
    CommandBuffer* b = Buffer();
    b->CreateImage(image, {2, 2, PixelFormat::A8, 0, 0, halves});
    // Repeated with a gap of 4: 4 on, 4 on, 4 off.
    b->BeginLayer(kLayerContent, MakeLayerPaint(1));
    b->FillRect({0, 0, 0, 64, 20}, Solid(0, 0, 1));
    b->SetMaskImageTiled(image, {0, 0, 0, 60, 20}, {{}, {0, 0, 0, 8, 20}, 4, 0}, 0);
    b->EndLayer();
    // A quarter turn: left becomes top.
    b->BeginLayer(kLayerContent, MakeLayerPaint(1));
    b->FillRect({0, 24, 0, 40, 40}, Solid(1, 0, 0));
    b->PushState(kStateTransform);
    b->MultiplyTransform(AffineMatrix(0, 1, -1, 0, 40, 24));
    b->SetMaskImage(image, {0, 0, 0, 40, 40}, {}, 0);
    b->PopState();
    b->EndLayer();
    canvas.Draw(b);
    EXPECT_EQ(canvas.At(1, 10).a, 255);
    EXPECT_EQ(canvas.At(6, 10).a, 64);
    EXPECT_EQ(canvas.At(10, 10).a, 0);
    EXPECT_EQ(canvas.At(13, 10).a, 255);
    EXPECT_EQ(canvas.At(62, 10).a, 0);  // outside of the mask's rectangle
    EXPECT_EQ(canvas.At(20, 30).a, 255);
    EXPECT_EQ(canvas.At(20, 58).a, 64);
    EXPECT_EQ(canvas.At(50, 40).a, 0);
}

TEST(Effects, BlurredTextShadowsKeepTheInkOfTheirText) {
    Canvas canvas(256, 64);
    const FontId font = canvas.LoadFont(kSans);
    if (font == kNoId) GTEST_SKIP() << "no DejaVu on this machine";
    TextPaint text;
    text.font = font, text.size = 24, text.x = 20, text.y = 40, text.paint = Solid(0, 0, 0);
    CommandBuffer* b = Buffer();
    b->FillString("Shadow", 6, text);
    canvas.Draw(b);
    const double plain = double(canvas.Ink());
    const SurfaceId surface = Library::GetSurfaceName();
    b = Library::CreateBufferForSurface(surface, 256, 0);
    b->CreateSurface(surface, {256, 64, PixelFormat::RGBA8}, 0);
    b->FillString("Shadow", 6, text);
    b->ApplyBlur(8);
    canvas.Draw(b);
    b = Buffer();
    b->ClearRect({}, 1);
    b->DrawSurface(surface, {}, {0, 0, 0, 256, 64}, Paint{});
    canvas.Draw(b);
    EXPECT_NEAR(double(canvas.Ink()) / plain, 1, 0.02);
    for (int x = 0; x < 256; x += 3)
        EXPECT_LT(canvas.At(x, 30).a, 200) << "nothing sharp is left";
    // The outline of a glyph: ink around its edge, none in the middle of a thick stem.
    b = Buffer();
    b->ClearRect({}, 1);
    text.size = 60, text.flags = kTextStroke, text.paint.strokeWidth = 1, text.y = 56;
    b->FillString("I", 1, text);
    canvas.Draw(b);
    int edges = 0;
    for (int x = 1; x < 100; ++x)
        edges += (canvas.At(x, 30).a > 100) != (canvas.At(x - 1, 30).a > 100);
    EXPECT_EQ(edges, 4);
}

TEST(Effects, ClientsDrawEffectsAndTakeLayers) {
    struct Hooks final : ICustomEffectRenderer, ICustomCompositor {
        void RenderCustomEffect(const CustomEffectLayer& layer) override {
            name = layer.name, first = layer.text1, second = layer.text2;
            parameter = layer.params[2], moved = layer.transform.m[12];
            auto* pixels = static_cast<uint32_t*>(layer.pixels);
            pixels[0] = 0xFF00FF00u;
            ++effects;
        }
        bool OnLayer(const CompositionLayer& layer) override {
            id = layer.id, x = layer.x, y = layer.y, width = layer.width, opacity = layer.opacity;
            aabb = layer.aabb, world = layer.worldMatrix;
            content = static_cast<const uint32_t*>(layer.pixels)[0];
            ++layers;
            return takes;
        }
        std::string name, first, second, id;
        float parameter = 0, moved = 0, opacity = 0;
        int effects = 0, layers = 0, x = 0, y = 0;
        uint32_t width = 0, content = 0;
        Rect aabb;
        Matrix4 world;
        bool takes = true;
    } hooks;
    Canvas canvas;
    canvas.scene->SetCustomCompositor(&hooks);
    canvas.scene->SetCustomEffectRenderer(&hooks);
    const auto record = [] {
        const float params[4] = {1, 2, 3, 4};
        Effect* custom = GetEffectFactory()->CreateCustom("ripple", params, "one", "");
        CommandBuffer* b = Buffer();
        b->PushState(kStateAll);
        b->ClipRect({4, 6, 0, 20, 20}, kClipIntersect);
        b->Translate(5, 0);
        b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(1), &custom, 1);
        b->FillRect({0, 0, 0, 64, 64}, Solid(1, 0, 0));
        b->EndLayer();
        b->PopState();
        custom->Release();
        b->ClipRect({30, 30, 0, 10, 10}, kClipIntersect);
        b->BeginLayer(kLayerContent, MakeLayerPaint(0.5f));
        const Matrix4 world = TranslationMatrix(7, 8, 9);
        const Rect aabb{1, 2, 3, 4, 5};
        b->Annotate(kAnnotateBaseTransform, &world);
        b->Annotate(kAnnotateCompositionId, "map");
        b->Annotate(kAnnotateWorldMatrix, &world);
        b->Annotate(kAnnotateAABB, &aabb);
        b->FillRect({0, 0, 0, 64, 64}, Solid(0, 0, 1));
        b->EndLayer();
        return b;
    };
    canvas.Draw(record());
    EXPECT_EQ(hooks.name + hooks.first + hooks.second, "rippleone");
    EXPECT_EQ(hooks.parameter, 3);
    EXPECT_EQ(hooks.moved, 5);
    EXPECT_EQ(canvas.At(4, 6), (Pixel{0, 255, 0, 255}));
    EXPECT_EQ(canvas.At(12, 12), (Pixel{255, 0, 0, 255}));
    EXPECT_EQ(hooks.id, "map");
    EXPECT_EQ(hooks.x, 30);
    EXPECT_EQ(hooks.width, 10u);
    EXPECT_EQ(hooks.opacity, 0.5f);
    EXPECT_EQ(hooks.content, 0xFFFF0000u);
    EXPECT_EQ(hooks.aabb.height, 5);
    EXPECT_EQ(hooks.world.m[14], 9);
    EXPECT_EQ(canvas.At(33, 33), (Pixel{0, 0, 0, 0})) << "the client took it";
    hooks.takes = false;
    canvas.Draw(record());
    EXPECT_EQ(canvas.At(33, 33), (Pixel{0, 0, 128, 128}));
    EXPECT_EQ(hooks.effects, 2);
    EXPECT_EQ(hooks.layers, 2);
    canvas.scene->SetCustomCompositor(nullptr);
    canvas.scene->SetCustomEffectRenderer(nullptr);
}

}  // namespace fresco::test
