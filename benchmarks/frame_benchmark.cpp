// Whole frames through the public interfaces: what an idle frame costs, and that it does not grow with the
// page.
#include <benchmark/benchmark.h>
#include <qorvex/qorvex.h>

#include <cstring>
#include <string>

#include "core/memory/allocator.h"
#include "host/counting_allocator.h"
#include "host/software_render_target.h"

namespace {

using namespace qorvex;

// Serves one page from memory.
class PageHandler final : public IAsyncResourceHandler {
  public:
    explicit PageHandler(std::string page) : page_(std::move(page)) {}
    void OnResourceRequest(const IAsyncResourceRequest*, IAsyncResourceResponse* response) override {
        std::memcpy(response->GetSpace(page_.size()), page_.data(), page_.size());
        response->SetStatus(200);
        response->Finish(IAsyncResourceResponse::Status::Success);
    }

  private:
    std::string page_;
};

class QuietLog final : public Logging::ILogHandler {};

// A loaded and settled page of `elements` boxes.
class Page {
  public:
    explicit Page(int elements) : handler_(Markup(elements)), target_(640, 360) {
        LibraryParams params;
        params.Allocator = &allocator_;
        params.LogHandler = &log_;
        params.LoggingSeverity = 6;
        library_ = Library::Initialize(params);
        SystemSettings system_settings;
        system_settings.ResourceHandler = &handler_;
        system_settings.EmbeddedFallbackFont = 2;
        system_ = library_->CreateSystem(system_settings);
        ViewSettings view_settings;
        view_settings.Width = 640;
        view_settings.Height = 360;
        view_settings.OnFrameComplete = [](void* page, std::uint32_t, std::uint32_t id, std::uint32_t) {
            static_cast<Page*>(page)->frame_ = id;
        };
        view_settings.CallbackUserData = this;
        view_ = system_->CreateView(view_settings);
        system_renderer_ = system_->CreateSystemRenderer({});
        renderer_ = system_renderer_->CreateViewRenderer(view_);
        RenderTargetDescription description;
        description.Width = 640;
        description.Height = 360;
        renderer_->SetRenderTarget(target_.Color(), nullptr, &description);
        view_->LoadURL("bench://page.html");
        for (int i = 0; i < 12; ++i)
            Frame();
    }
    ~Page() {
        renderer_->Destroy();
        system_renderer_->Destroy();
        view_->Destroy();
        system_->Destroy();
        library_->StopWorkers();
        library_->Uninitialize(false);
        // Uninitialize clears the pointer that the other benchmarks rely on.
        SetAllocator(before_);
    }

    void Frame() {
        library_->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, kAllTaskFamilies);
        Advance();
        renderer_->Paint(frame_, false);
    }
    void Advance() { view_->Advance(time_ += 16); }
    void Run(const char* script) { view_->ExecuteScript(script); }
    [[nodiscard]] std::uint64_t Allocations() const { return allocator_.Total().allocations; }

  private:
    static std::string Markup(int elements) {
        std::string page =
            "<style>body{display:flex;flex-wrap:wrap}.b{width:4px;height:4px;background-color:#123456}</"
            "style><body>";
        for (int i = 0; i < elements; ++i)
            page += "<div class=b></div>";
        return page;
    }

    IAllocator* before_ = GetAllocator();
    host::CountingAllocator allocator_;
    QuietLog log_;
    PageHandler handler_;
    host::SoftwareRenderTarget target_;
    std::uint32_t frame_ = 0;
    double time_ = 0;
    Library* library_ = nullptr;
    System* system_ = nullptr;
    View* view_ = nullptr;
    SystemRenderer* system_renderer_ = nullptr;
    ViewRenderer* renderer_ = nullptr;
};

// Frames are painted, so that the ids do not pile up as they would for a client that never draws.
void IdleAdvance(benchmark::State& state, int elements) {
    Page page(elements);
    const std::uint64_t before = page.Allocations();
    for (auto _ : state)
        page.Frame();
    state.counters["allocations"] = static_cast<double>(page.Allocations() - before);
    state.counters["target"] = 1.2;
}
BENCHMARK_CAPTURE(IdleAdvance, large, 10000)->Name("idle_advance");
BENCHMARK_CAPTURE(IdleAdvance, small, 100)->Name("idle_advance_baseline");

}  // namespace
