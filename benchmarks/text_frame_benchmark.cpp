// Frames of a page of labels: what one changed label costs among many, and what a page costs in which nothing
// changes.
#include <benchmark/benchmark.h>
#include <qorvex/qorvex.h>

#include <cstring>
#include <string>

#include "core/memory/allocator.h"
#include "host/counting_allocator.h"
#include "host/icu_text_services.h"
#include "host/software_render_target.h"

namespace {

using namespace qorvex;

constexpr int kPanels = 10;
constexpr int kRows = 10;
constexpr int kLabels = 10;

// Panels of rows of labels, as a game's screens are; the label that changes stands in the last row.
std::string Markup(int panels, int rows, int labels) {
    std::string page =
        "<style>body{font-size:12px}.p{position:absolute;width:300px;height:200px}"
        ".r{display:flex;flex-direction:row;height:16px}.l{width:28px}</style><body>";
    for (int panel = 0; panel < panels; ++panel) {
        page += "<div class=p>";
        for (int row = 0; row < rows; ++row) {
            page += "<div class=r>";
            for (int label = 0; label < labels; ++label)
                page += "<div class=l>12</div>";
            page += "</div>";
        }
        page += "</div>";
    }
    return page +
           "<script>var l=document.querySelectorAll('.l');var last=l[l.length-1].firstChild;var n=0;"
           "</script></body>";
}

class LabelPage final : public IAsyncResourceHandler {
  public:
    LabelPage(int panels, int rows, int labels) : markup_(Markup(panels, rows, labels)), target_(640, 360) {
        LibraryParams params;
        params.Allocator = &allocator_;
        params.LogHandler = &log_;
        params.LoggingSeverity = 6;
        library_ = Library::Initialize(params);
        SystemSettings system_settings;
        system_settings.ResourceHandler = this;
        system_settings.EmbeddedFallbackFont = 2;
        system_settings.InternationalizationManager = &i18n_;
        system_ = library_->CreateSystem(system_settings);
        ViewSettings view_settings;
        view_settings.Width = 640;
        view_settings.Height = 360;
        view_settings.EnableComplexCSSSelectorsStyling = true;
        view_settings.OnFrameComplete = [](void* page, std::uint32_t, std::uint32_t id, std::uint32_t) {
            static_cast<LabelPage*>(page)->frame_ = id;
        };
        view_settings.CallbackUserData = this;
        view_ = system_->CreateView(view_settings);
        system_renderer_ = system_->CreateSystemRenderer({});
        renderer_ = system_renderer_->CreateViewRenderer(view_);
        RenderTargetDescription description;
        description.Width = 640;
        description.Height = 360;
        renderer_->SetRenderTarget(target_.Color(), nullptr, &description);
        view_->LoadURL("bench://labels.html");
        for (int i = 0; i < 12; ++i)
            Frame();
    }
    ~LabelPage() {
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
        view_->Advance(time_ += 16);
        renderer_->Paint(frame_, false);
    }
    void Change() { view_->ExecuteScript("last.data=String(10+n++%90)"); }
    [[nodiscard]] std::uint64_t Allocations() const { return allocator_.Total().allocations; }

    void OnResourceRequest(const IAsyncResourceRequest*, IAsyncResourceResponse* response) override {
        std::memcpy(response->GetSpace(markup_.size()), markup_.data(), markup_.size());
        response->SetStatus(200);
        response->Finish(IAsyncResourceResponse::Status::Success);
    }

  private:
    class QuietLog final : public Logging::ILogHandler {};

    const std::string markup_;
    IAllocator* before_ = GetAllocator();
    host::CountingAllocator allocator_;
    QuietLog log_;
    host::IcuInternationalization i18n_;
    host::SoftwareRenderTarget target_;
    std::uint32_t frame_ = 0;
    double time_ = 0;
    Library* library_ = nullptr;
    System* system_ = nullptr;
    View* view_ = nullptr;
    SystemRenderer* system_renderer_ = nullptr;
    ViewRenderer* renderer_ = nullptr;
};

void ChangeOne(benchmark::State& state, int panels, int rows, int labels) {
    LabelPage page(panels, rows, labels);
    for (auto _ : state) {
        page.Change();
        page.Frame();
    }
    state.counters["target"] = 1.3;
}
BENCHMARK_CAPTURE(ChangeOne, many, kPanels, kRows, kLabels)->Name("text_change");
BENCHMARK_CAPTURE(ChangeOne, alone, 1, 1, 1)->Name("text_change_baseline");

void Idle(benchmark::State& state, int panels, int rows, int labels) {
    LabelPage page(panels, rows, labels);
    const std::uint64_t before = page.Allocations();
    for (auto _ : state)
        page.Frame();
    state.counters["allocations"] = static_cast<double>(page.Allocations() - before);
    state.counters["target"] = 1.2;
}
BENCHMARK_CAPTURE(Idle, many, kPanels, kRows, kLabels)->Name("text_idle");
BENCHMARK_CAPTURE(Idle, alone, 1, 1, 1)->Name("text_idle_baseline");

}  // namespace
