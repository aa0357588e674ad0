// The CPU back end on whole frames: a game's interface against the same scene in Cairo, a small repaint
// against the full one, and a full-screen layer against memcpy.
#include <benchmark/benchmark.h>
#include <fresco/library.h>

#include <condition_variable>
#include <cstring>
#include <mutex>
#include <thread>

#include "hud_cairo.h"
#include "hud_fresco.h"

namespace {

using namespace qorvex::benchmarks;

// Both painters must show the same picture, or the ratio means nothing: the mean difference a channel.
double MeanDifference(const HudFresco& fresco, const HudCairo& cairo) {
    double sum = 0;
    for (int y = 0; y < HudScene::kHeight; ++y) {
        for (int x = 0; x < HudScene::kWidth; ++x) {
            const std::uint32_t a = fresco.pixels()[static_cast<std::size_t>(y) * HudScene::kWidth +
                                                    static_cast<std::size_t>(x)],
                                b = cairo.PixelAt(x, y);
            for (int shift = 0; shift < 32; shift += 8) {
                const int difference =
                    static_cast<int>(a >> shift & 255) - static_cast<int>(b >> shift & 255);
                sum += difference < 0 ? -difference : difference;
            }
        }
    }
    return sum / (4.0 * HudScene::kWidth * HudScene::kHeight);
}

HudFresco& Fresco() {
    static HudFresco painter;
    return painter;
}

HudCairo& Cairo() {
    static HudCairo painter(Fresco().hud());
    return painter;
}

void PaintHud(benchmark::State& state) {
    HudFresco& painter = Fresco();
    fresco::CommandBuffer* frame = painter.Record(nullptr);
    for (auto _ : state)
        painter.Draw(frame);
    Cairo().Paint();
    const double difference = MeanDifference(painter, Cairo());
    if (difference > 1) state.SkipWithError("the two painters draw different pictures");
    state.counters["difference"] = difference;
    state.counters["target"] = 0.33;
    frame->Release();
}
BENCHMARK(PaintHud)->Name("paint_hud")->Unit(benchmark::kMicrosecond);

// One thread beside the painting one, as a client lends it.
class OneHelper final : public fresco::IPaintHelpers {
  public:
    OneHelper() : thread_([this] { Serve(); }) {}
    ~OneHelper() override {
        {
            const std::lock_guard lock(mutex_);
            stopping_ = true;
        }
        arrived_.notify_one();
        thread_.join();
        if (work_) work_->Release();
    }
    std::uint32_t GetCount() override { return 1; }
    void Post(fresco::IPaintWork* work) override {
        fresco::IPaintWork* old = nullptr;
        {
            const std::lock_guard lock(mutex_);
            old = std::exchange(work_, work);
        }
        if (old) old->Release();
        arrived_.notify_one();
    }

  private:
    void Serve() {
        std::unique_lock lock(mutex_);
        while (!stopping_) {
            fresco::IPaintWork* work = std::exchange(work_, nullptr);
            if (!work) {
                arrived_.wait(lock);
                continue;
            }
            lock.unlock();
            work->Run();
            work->Release();
            lock.lock();
        }
    }

    std::mutex mutex_;
    std::condition_variable arrived_;
    fresco::IPaintWork* work_ = nullptr;
    bool stopping_ = false;
    std::thread thread_;
};

void PaintHudHelped(benchmark::State& state) {
    HudFresco& painter = Fresco();
    OneHelper helper;
    painter.library().SetPaintHelpers(&helper);
    fresco::CommandBuffer* frame = painter.Record(nullptr);
    for (auto _ : state)
        painter.Draw(frame);
    state.counters["target"] = 0.2;
    frame->Release();
    painter.library().SetPaintHelpers(nullptr);
}
BENCHMARK(PaintHudHelped)->Name("paint_hud_helped")->Unit(benchmark::kMicrosecond)->UseRealTime();

void PaintHudCairo(benchmark::State& state) {
    for (auto _ : state)
        Cairo().Paint();
}
BENCHMARK(PaintHudCairo)->Name("paint_hud_baseline")->Unit(benchmark::kMicrosecond);
BENCHMARK(PaintHudCairo)->Name("paint_hud_helped_baseline")->Unit(benchmark::kMicrosecond)->UseRealTime();

void PaintDirty(benchmark::State& state) {
    HudFresco& painter = Fresco();
    const fresco::Rect dirty{900, 500, 0, 100, 100};
    fresco::CommandBuffer* frame = painter.Record(&dirty);
    for (auto _ : state)
        painter.Draw(frame);
    state.counters["target"] = 0.03;
    frame->Release();
}
BENCHMARK(PaintDirty)->Name("paint_dirty")->Unit(benchmark::kMicrosecond);

void PaintFull(benchmark::State& state) {
    HudFresco& painter = Fresco();
    fresco::CommandBuffer* frame = painter.Record(nullptr);
    for (auto _ : state)
        painter.Draw(frame);
    frame->Release();
}
BENCHMARK(PaintFull)->Name("paint_dirty_baseline")->Unit(benchmark::kMicrosecond);

// A surface of the screen's size, translucent everywhere: no pixel can be skipped or copied.
void Composite(benchmark::State& state) {
    using namespace fresco;
    HudFresco& painter = Fresco();
    const SurfaceId surface = Library::GetSurfaceName();
    CommandBuffer* content = Library::CreateBufferForSurface(surface, 256, 0);
    content->CreateSurface(surface, {HudScene::kWidth, HudScene::kHeight, PixelFormat::RGBA8}, 0);
    const GradientStop stops[] = {{0, {0.5f, 0, 0, 0.5f}}, {1, {0, 0, 0.8f, 0.8f}}};
    content->FillLinearGradient({0, 0, 0, HudScene::kWidth, HudScene::kHeight}, Paint{}, stops, 2,
                                {{0, 0}, {1, 0.5f}});
    painter.scene().ExecuteFrontEnd(&content, 1);
    content->Release();
    CommandBuffer* frame = Library::CreateBuffer(0, 0);
    frame->DrawSurface(surface, {}, {0, 0, 0, HudScene::kWidth, HudScene::kHeight}, Paint{});
    for (auto _ : state)
        painter.Draw(frame);
    state.counters["target"] = 1.5;
    frame->Release();
    painter.scene().FreeSurfaces(&surface, 1);
}
BENCHMARK(Composite)->Name("composite")->Unit(benchmark::kMicrosecond);

void CopyScreen(benchmark::State& state) {
    HudFresco& painter = Fresco();
    const std::vector<std::uint32_t>& target = painter.pixels();
    const std::vector<std::uint32_t> layer(target.size(), 0x80402010u);
    for (auto _ : state) {
        std::memcpy(const_cast<std::uint32_t*>(target.data()), layer.data(), layer.size() * 4);
        benchmark::ClobberMemory();
    }
}
BENCHMARK(CopyScreen)->Name("composite_baseline")->Unit(benchmark::kMicrosecond);

}  // namespace
