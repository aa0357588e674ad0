// Frames that several threads paint: the picture is that of one thread, bit for bit.
#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <thread>

#include <fresco/paint_helpers.h>
#include "canvas.h"

namespace fresco::test {
namespace {

constexpr int kWidth = 640, kHeight = 480;

// One thread for each posted work: they come early, late, or after the frame.
class Threads final : public IPaintHelpers {
  public:
    explicit Threads(uint32_t count) : count_(count) {}
    ~Threads() { Join(); }
    uint32_t GetCount() override { return count_; }
    void Post(IPaintWork* work) override {
        ++posted;
        if (posted % 5 == 4) return work->Release();  // a client that shuts down
        threads_.emplace_back([work] {
            work->Run();
            work->Release();
        });
    }
    void Join() {
        for (std::thread& thread : threads_)
            thread.join();
        threads_.clear();
    }
    uint32_t posted = 0;

  private:
    uint32_t count_;
    std::vector<std::thread> threads_;
};

// Holds on to all work until the frame is over.
class Sluggish final : public IPaintHelpers {
  public:
    uint32_t GetCount() override { return 2; }
    void Post(IPaintWork* work) override { works.push_back(work); }
    void Finish() {
        for (IPaintWork* work : works) {
            work->Run();
            work->Release();
        }
        works.clear();
    }
    std::vector<IPaintWork*> works;
};

struct Ids {
    FontId font;
    ImageId image, user;
    SurfaceId surface;
};

// A random one of all the things that a stream can hold.
void DrawSomething(CommandBuffer* b, std::mt19937& random, const Ids& ids) {
    const auto unit = [&] { return float(random() % 1000) / 1000; };
    const Rect rect{unit() * 560 - 40, unit() * 400 - 40, 0, 5 + unit() * 260, 5 + unit() * 200};
    const float r = unit() * 40;
    const CornerRadii radii{{r, r}, {r, r / 2}, {0, 0}, {r, r}};
    Paint paint = Solid(unit(), unit(), unit(), 0.2f + 0.8f * unit());
    paint.strokeWidth = 1 + unit() * 9;
    if (random() % 6 == 0) paint.blend = random() % kBlendModeCount;
    const GradientStop stops[] = {{0, {1, 0, 0, 1}}, {0.3f, {0, 0.5f, 0, 0.5f}}, {1, {0, 0, 1, 1}}};
    switch (random() % 12) {
        case 0:
            return b->FillRect(rect, paint);
        case 1:
            return b->FillRoundedRect(rect, radii, paint);
        case 2:
            return b->StrokeRoundedRect(rect, radii, paint);
        case 3:
            return b->StrokeEllipse(rect.x, rect.y, 0, rect.width / 2, rect.height / 2, paint);
        case 4:
            return b->FillLinearGradient(rect, paint, stops, 3,
                                         {{0, 0}, {unit(), unit()}, uint32_t(random() % 3)});
        case 5:
            return b->FillRadialGradient(rect, paint, stops, 3,
                                         {{0.5f, 0.3f}, {unit(), 0.4f}, uint32_t(random() % 3)});
        case 6:
            return b->DrawImage(random() % 2 ? ids.image : ids.user, rect, {}, paint);
        case 7:
            return b->DrawImageTiled(ids.image, rect,
                                     {{}, {rect.x + 3, rect.y, 0, 7 + unit() * 30, 9}, unit() * 4, 2}, paint);
        case 8:
            return b->DrawSurface(ids.surface, {}, {rect.x, rect.y, 0, 50, 40}, paint);
        case 9:
            return b->ClearRect(rect, 0);
        default: {
            TextPaint text;
            text.font = ids.font, text.size = 8 + unit() * 40, text.x = rect.x, text.y = rect.y + 40,
            text.paint = paint, text.flags = random() % 5 == 0 ? uint32_t(kTextStroke) : 0;
            return b->FillString("Bands, equal in every bit", 25, text);
        }
    }
}

Effect* RandomFilter(std::mt19937& random) {
    const auto unit = [&] { return float(random() % 1000) / 1000; };
    const FilterRecord filters[] = {
        {uint32_t(FilterKind::Blur), {unit() * 12}},
        {uint32_t(FilterKind::AxisBlur), {unit() * 30, unit() * 2}},
        {uint32_t(FilterKind::DropShadow), {unit() * 20, -unit() * 9, unit() * 8, 0, 0, 0, 1}},
        {uint32_t(FilterKind::HueRotate), {unit() * 360}},
        {uint32_t(FilterKind::Contrast), {unit() * 2}}};
    const size_t first = random() % 4;
    return GetEffectFactory()->CreateFilter(filters + first, 1 + uint32_t(random() % 2));
}

CommandBuffer* Record(uint32_t seed, const Ids& ids) {
    std::mt19937 random(seed);
    CommandBuffer* b = Library::CreateBuffer(0, 0);
    b->BeginScissor();
    b->PushState(kStateAll);
    b->ClipRect({0, 0, 0, kWidth, kHeight});
    b->ClearRect({}, 1);
    for (int i = 0; i < 40; ++i) {
        b->PushState(kStateAll);
        const unsigned state = random() % 8;
        if (state == 0) b->MultiplyTransform(AffineMatrix(0.9f, 0.3f, -0.2f, 1.1f, 30, -5));
        if (state == 1) {
            Matrix4 perspective, turn;
            perspective.m[11] = -1.0f / 700;
            turn.m[0] = std::cos(0.7f), turn.m[2] = -std::sin(0.7f), turn.m[8] = std::sin(0.7f),
            turn.m[10] = std::cos(0.7f);
            b->MultiplyTransform(perspective);
            b->MultiplyTransform(turn);
        }
        if (state == 2) b->ClipEllipse(300, 200, 220, 150, random() % 4);
        if (state == 3)
            b->ClipRoundedRect({100, 60, 0, 300, 350}, {{30, 30}, {30, 30}, {9, 9}, {9, 9}}, kClipIntersect);
        const unsigned layer = random() % 5;
        Effect* effect = layer == 0 ? RandomFilter(random) : nullptr;
        if (effect) {
            b->BeginLayerWithEffects(kLayerContent, MakeLayerPaint(0.8f), &effect, 1);
            effect->Release();
        } else if (layer == 1) {
            b->BeginLayer(kLayerContent, MakeLayerPaint(0.6f, random() % kBlendModeCount));
        }
        for (unsigned k = random() % 3; k < 3; ++k)
            DrawSomething(b, random, ids);
        if (layer == 0 && random() % 2) b->SetMaskImage(ids.image, {50, 50, 0, 500, 380}, {}, 0);
        if (layer < 2) b->EndLayer();
        b->PopState();
    }
    b->PopState();
    return b;
}

class BandCanvas : public Canvas {
  public:
    BandCanvas() : Canvas(kWidth, kHeight) {
        ids.font = LoadFont(kSans);
        std::mt19937 random(1);
        for (uint32_t& p : noise_) {
            const uint32_t a = random() % 256;
            p = random() % (a + 1) | (random() % (a + 1)) << 8 | a << 24;
        }
        user_ = {noise_, 0};
        ids.image = Library::GetImageName(), ids.user = Library::GetImageName(),
        ids.surface = Library::GetSurfaceName();
        CommandBuffer* b = Library::CreateBuffer(0, 0);
        b->CreateImage(ids.image, {64, 64, PixelFormat::RGBA8, 0, 0, noise_});
        b->CreateImage(ids.user, {64, 32, PixelFormat::RGBA8, kImageUserObject, 0, &user_});
        b->CreateSurface(ids.surface, {50, 40, PixelFormat::RGBA8}, 0);
        Draw(b);
        b = Library::CreateBufferForSurface(ids.surface, 0, 0);
        b->FillRoundedRect({8, 8, 0, 34, 24}, {{8, 8}, {8, 8}, {8, 8}, {8, 8}}, Solid(0, 0, 0));
        b->ApplyBlur(8);
        Draw(b);
    }
    Ids ids;

  private:
    uint32_t noise_[64 * 64];
    UserImage user_;
};

}  // namespace

TEST(Bands, PicturesDoNotDependOnHelpers) {
    BandCanvas alone, helped;
    for (uint32_t seed = 1; seed <= 12; ++seed) {
        alone.Draw(Record(seed, alone.ids));
        Threads helpers(1 + seed % 4);
        helped.library->SetPaintHelpers(&helpers);
        helped.Draw(Record(seed, helped.ids));
        helpers.Join();
        helped.library->SetPaintHelpers(nullptr);
        EXPECT_EQ(helpers.posted, 1 + seed % 4);
        ASSERT_EQ(helped.pixels, alone.pixels) << "seed " << seed;
    }
}

TEST(Bands, NobodyIsWaitedForAndNothingIsTouchedLate) {
    BandCanvas alone, helped;
    Sluggish helpers;
    helped.library->SetPaintHelpers(&helpers);
    alone.Draw(Record(7, alone.ids));
    helped.Draw(Record(7, helped.ids));
    EXPECT_EQ(helpers.works.size(), 2u);
    EXPECT_EQ(helped.pixels, alone.pixels);
    helpers.Finish();
    EXPECT_EQ(helped.pixels, alone.pixels);
    // What is small, makes resources or blurs the target is not cut.
    CommandBuffer* b = Library::CreateBuffer(0, 0);
    b->BeginScissor();
    b->ClipRect({10, 10, 0, 100, 100});
    b->FillRect({0, 0, 0, 640, 480}, Solid(1, 0, 0));
    helped.Draw(b);
    b = Library::CreateBuffer(0, 0);
    b->FillRect({0, 0, 0, 640, 480}, Solid(1, 0, 0));
    b->ApplyBlur(4);
    helped.Draw(b);
    EXPECT_TRUE(helpers.works.empty());
}

}  // namespace fresco::test
