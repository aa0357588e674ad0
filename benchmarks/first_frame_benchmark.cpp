// From nothing to the first painted frame of examples/hello, against what the script engine alone takes to
// make its first context. Both are measured in a fresh process each time: the first context of a process
// costs several times what the next ones do.
//
// The time is what the calling thread takes of its processor from the call of Library::Initialize on;
// programs are loaded before it on both sides. Nothing waits for another thread here: layout, parsing and
// painting run on it as well. The first frame that is painted is the one that shows the loaded page.
#include "benchmarks/first_frame_benchmark.h"

#include <JavaScriptCore/JavaScript.h>
#include <benchmark/benchmark.h>
#include <qorvex/qorvex.h>
#include <qorvex/view_listener.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <string>
#include <vector>

#include <unistd.h>

#include "host/counting_allocator.h"
#include "host/file_system.h"
#include "host/folder_resource_handler.h"
#include "host/software_render_target.h"
#include "script/engine_seam.h"

namespace qorvex::bench {

namespace {

double ThreadSeconds() {
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

// As the player sets up, with layout on the calling thread: one processor does all the work.
class HelloPage final : private IViewListener {
  public:
    // Leaves the page standing: the process ends after it.
    void Run() {
        LibraryParams params;
        params.Allocator = &allocator_;
        params.LogHandler = &log_;
        params.FileSystemReader = &files_;
        params.DefaultFontFamily = "DejaVu Sans";
        params.AdditionalOptions = "--system-fonts=/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";
        Library* library = Library::Initialize(params);
        SystemSettings system_settings;
        system_settings.ResourceHandler = &resources_;
        system_settings.EmbeddedFallbackFont = 2;
        System* system = library->CreateSystem(system_settings);
        ViewSettings view_settings;
        view_settings.Listener = this;
        view_settings.Width = 1280;
        view_settings.Height = 720;
        view_settings.OnFrameComplete = [](void* page, std::uint32_t, std::uint32_t id, std::uint32_t) {
            static_cast<HelloPage*>(page)->frame_ = id;
        };
        view_settings.CallbackUserData = this;
        view_settings.EnableComplexCSSSelectorsStyling = true;
        View* view = system->CreateView(view_settings);
        SystemRenderer* system_renderer = system->CreateSystemRenderer({});
        system_renderer->RegisterRenderThread(nullptr, nullptr, 0);
        ViewRenderer* renderer = system_renderer->CreateViewRenderer(view);
        RenderTargetDescription description;
        description.Width = 1280;
        description.Height = 720;
        renderer->SetRenderTarget(target_.Color(), nullptr, &description);
        view->LoadURL(host::FileURL(Folder() / "index.html").c_str());
        for (double time = 16; time < 1600 && !loaded_; time += 16) {
            library->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, kAllTaskFamilies);
            system->Advance(time);
            view->Advance(time);
        }
        renderer->Paint(frame_, false);
    }

    // Text and tiles are there, not only a background.
    bool ShowsPage() {
        const auto& pixels = target_.Pixels();
        size_t changes = 0;
        for (size_t i = 4; i < pixels.size(); i += 4)
            changes += pixels[i] != pixels[i - 4];
        return loaded_ && changes > 5000;
    }

  private:
    static std::filesystem::path Folder() {
        return std::filesystem::path(QORVEX_SOURCE_DIR) / "examples/hello";
    }
    void OnFinishLoad(const char*) override { loaded_ = true; }

    class QuietLog final : public Logging::ILogHandler {};

    host::CountingAllocator allocator_;
    QuietLog log_;
    host::FileSystem files_;
    host::FolderResourceHandler resources_{Folder()};
    host::SoftwareRenderTarget target_{1280, 720};
    std::uint32_t frame_ = 0;
    bool loaded_ = false;
};

void MakeFirstContext() {
    script::StartScriptEngine();
    JSContextGroupRef group = JSContextGroupCreate();
    JSGlobalContextCreateInGroup(group, nullptr);
}

// Seconds that a child of this program prints.
double RunChild(const char* what) {
    const std::string command = "/proc/" + std::to_string(getpid()) + "/exe " + what;
    std::FILE* child = popen(command.c_str(), "r");
    std::array<char, 64> line{};
    const bool read = child && std::fgets(line.data(), line.size(), child);
    if (child) pclose(child);
    if (!read) std::abort();
    return std::atof(line.data());
}

// Both sides in turn, process by process, since the pace of a processor changes from one second to the next;
// of some rounds the median each, since a mean is that of the few that something else on the machine held up.
class InTurn {
  public:
    double Next(std::size_t side) {
        if (medians_[side].empty()) Measure();
        const double median = medians_[side].front();
        medians_[side].erase(medians_[side].begin());
        return median;
    }

  private:
    void Measure() {
        std::array<std::array<double, 15>, 2> times{};
        for (std::size_t round = 0; round < times[0].size(); ++round) {
            for (std::size_t side = 0; side < 2; ++side)
                times[side][round] = RunChild(side == 0 ? kFirstFrameChild : kFirstContextChild);
        }
        for (std::size_t side = 0; side < 2; ++side) {
            const auto middle = times[side].begin() + times[side].size() / 2;
            std::nth_element(times[side].begin(), middle, times[side].end());
            medians_[side].push_back(*middle);
        }
    }
    std::array<std::vector<double>, 2> medians_;
};

void FreshProcess(benchmark::State& state, std::size_t side) {
    static InTurn in_turn;
    for (auto _ : state)
        state.SetIterationTime(in_turn.Next(side));
    state.counters["target"] = 2.0;
}
BENCHMARK_CAPTURE(FreshProcess, frame, 0)->Name("first_frame")->UseManualTime()->Iterations(1);
BENCHMARK_CAPTURE(FreshProcess, context, 1)->Name("first_frame_baseline")->UseManualTime()->Iterations(1);

}  // namespace

bool RunFirstFrameChild(std::string_view what) {
    if (what != kFirstFrameChild && what != kFirstContextChild) return false;
    static HelloPage page;
    const double start = ThreadSeconds();
    if (what == kFirstFrameChild) {
        page.Run();
    } else {
        MakeFirstContext();
    }
    const double took = ThreadSeconds() - start;
    if (what == kFirstFrameChild && !page.ShowsPage()) std::abort();
    std::printf("%.9f\n", took);
    std::fflush(stdout);
    std::_Exit(0);
}

}  // namespace qorvex::bench
