// qorvex-rounds: views that come, show a page and go, one after the other in one system. What a view leaves
// behind would add up: the client's allocator counts by tag, the process's resident memory by page.
#include <qorvex/qorvex.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "host/counting_allocator.h"
#include "host/manual_clock.h"
#include "host/software_render_target.h"
#include "site.h"

namespace {

using namespace qorvex;

// Rounds until caches, pools and the script engine's heap have their size. The engine keeps the response
// objects of the last few hundred requests.
constexpr unsigned long kWarmUp = 160;
// What is live after a round depends on where an animation stands and which images came in time, and comes
// round again within some forty rounds. The most of so many rounds is compared.
constexpr unsigned long kWindow = 100;
// Resident memory may move by so much: the script engine collects when it likes, and never gives back some
// 680 bytes of each context group, even in a program that does nothing but make and release them.
constexpr double kSlackMegabytes = 4;
constexpr double kScriptEngineMegabytesARound = 680 / (1024.0 * 1024.0);

double ResidentMegabytes() {
    long pages = 0;
    if (std::FILE* file = std::fopen("/proc/self/statm", "r")) {
        if (std::fscanf(file, "%*d %ld", &pages) != 1) pages = 0;
        std::fclose(file);
    }
    return static_cast<double>(pages) * static_cast<double>(sysconf(_SC_PAGESIZE)) / (1024.0 * 1024.0);
}

class Errors final : public Logging::ILogHandler {
  public:
    void WriteLog(Logging::Severity severity, const char* text, unsigned) override {
        // The site's scripts throw on purpose.
        if (severity >= Logging::Assert) std::fprintf(stderr, "%s\n", text), ++asserts;
    }
    unsigned long asserts = 0;
};

class Rounds {
  public:
    Rounds() {
        LibraryParams params;
        params.Allocator = &allocator_;
        params.LogHandler = &errors_;
        params.LoggingSeverity = Logging::Error;
        library_ = Library::Initialize(params);
        SystemSettings settings;
        settings.ResourceHandler = &site_;
        settings.EmbeddedFallbackFont = 2;
        system_ = library_->CreateSystem(settings);
        renderer_ = system_->CreateSystemRenderer({});
        renderer_->RegisterRenderThread(nullptr, nullptr, 0);
    }

    // One view from its creation to its end, with each page of the site that exists in turn.
    void Round(unsigned long number) {
        ViewSettings settings;
        settings.Width = target_.Width();
        settings.Height = target_.Height();
        settings.GetCurrentTime = &host::ManualClock::Read;
        settings.CallbackUserData = &clock_;
        settings.EnableComplexCSSSelectorsStyling = true;
        View* view = system_->CreateView(settings);
        ViewRenderer* renderer = renderer_->CreateViewRenderer(view);
        renderer->SetRenderTargetSimple(target_.Color(), nullptr, target_.Width(), target_.Height(), 1);
        view->LoadURL(stress::kPages[number % 5]);
        for (unsigned frame = 0; frame < 8; ++frame) {
            library_->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, 0);
            system_->Advance(clock_.Step(16));
            view->Advance(clock_.Now());
            renderer->Paint(frame, true);
        }
        renderer->Destroy();
        view->Destroy();
    }

    [[nodiscard]] host::CountingAllocator& Allocator() { return allocator_; }
    [[nodiscard]] unsigned long Asserts() const { return errors_.asserts; }

    void End() {
        renderer_->Destroy();
        system_->Destroy();
        library_->StopWorkers();
        library_->Uninitialize(false);
    }

  private:
    host::CountingAllocator allocator_;
    Errors errors_;
    stress::Site site_;
    host::ManualClock clock_;
    host::SoftwareRenderTarget target_{160, 120};
    Library* library_ = nullptr;
    System* system_ = nullptr;
    SystemRenderer* renderer_ = nullptr;
};

using Counts = std::array<host::CountingAllocator::Count, kMemoryTagLimit>;

Counts Count(const host::CountingAllocator& allocator) {
    Counts counts;
    for (unsigned tag = 0; tag < counts.size(); ++tag)
        counts[tag] = allocator.ForTag(static_cast<MemoryTag>(tag));
    return counts;
}

void RaiseTo(Counts& most, const Counts& counts) {
    for (unsigned tag = 0; tag < most.size(); ++tag) {
        most[tag].blocks = std::max(most[tag].blocks, counts[tag].blocks);
        most[tag].bytes = std::max(most[tag].bytes, counts[tag].bytes);
    }
}

// Blocks or bytes that a tag has more than before.
bool HasGrown(const Counts& before, const Counts& after) {
    bool grown = false;
    for (unsigned tag = 0; tag < before.size(); ++tag) {
        if (after[tag].blocks <= before[tag].blocks && after[tag].bytes <= before[tag].bytes) continue;
        std::fprintf(stderr, "tag %u grew from %llu blocks, %llu bytes to %llu blocks, %llu bytes\n", tag,
                     static_cast<unsigned long long>(before[tag].blocks),
                     static_cast<unsigned long long>(before[tag].bytes),
                     static_cast<unsigned long long>(after[tag].blocks),
                     static_cast<unsigned long long>(after[tag].bytes));
        grown = true;
    }
    return grown;
}

}  // namespace

int main(int count, char** values) {
    unsigned long rounds = 10000;
    if (count == 3 && std::strcmp(values[1], "--rounds") == 0) {
        rounds = std::strtoul(values[2], nullptr, 10);
    } else if (count != 1) {
        std::fprintf(stderr, "usage: qorvex-rounds [--rounds N]\n");
        return 2;
    }
    Rounds run;
    for (unsigned long i = 0; i < kWarmUp; ++i)
        run.Round(i);
    Counts before{}, after{};
    for (unsigned long i = 0; i < kWindow; ++i) {
        run.Round(i);
        RaiseTo(before, Count(run.Allocator()));
    }
    const double resident_before = ResidentMegabytes();
    // Half way through too: a heap that settles late has stopped growing by then, a leak has not.
    double resident_half = 0;
    for (unsigned long i = 0; i < rounds; ++i) {
        run.Round(i);
        if (i == rounds / 2) resident_half = ResidentMegabytes();
        if (i + kWindow >= rounds) RaiseTo(after, Count(run.Allocator()));
    }
    const bool grown = HasGrown(before, after);
    const double resident_after = ResidentMegabytes();
    const auto total = run.Allocator().Total();
    run.End();

    std::printf(
        "%lu rounds after %lu: %llu blocks and %llu bytes live in between, %llu allocations, resident %.1f, "
        "%.1f half way, "
        "%.1f MB\n",
        rounds, kWarmUp + kWindow, static_cast<unsigned long long>(total.blocks),
        static_cast<unsigned long long>(total.bytes), static_cast<unsigned long long>(total.allocations),
        resident_before, resident_half, resident_after);
    const auto left = run.Allocator().Total();
    if (left.blocks > 0 || run.Allocator().Mismatches() > 0)
        std::fprintf(stderr, "%llu blocks are left, %llu went back wrongly\n",
                     static_cast<unsigned long long>(left.blocks),
                     static_cast<unsigned long long>(run.Allocator().Mismatches()));
    // A sanitizer keeps freed blocks for a while, and a short run is all warm-up.
    const bool judge_resident =
        rounds >= 5 * kWarmUp && !std::getenv("ASAN_OPTIONS") && !std::getenv("TSAN_OPTIONS");
    const double allowed = kSlackMegabytes + kScriptEngineMegabytesARound * static_cast<double>(rounds);
    const bool resident_grown = judge_resident && resident_after > resident_before + allowed;
    if (resident_grown) std::fprintf(stderr, "resident memory grew\n");
    return grown || resident_grown || left.blocks > 0 || run.Allocator().Mismatches() > 0 ||
           run.Asserts() > 0;
}
