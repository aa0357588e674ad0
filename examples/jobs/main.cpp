// A client that gives the engine's work to its own job system of two threads, and whose main loop never waits
// for it. docs/threads.md tells which call may come from where.
#include <qorvex/qorvex.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <filesystem>

#include "examples/jobs/job_system.h"
#include "host/counting_allocator.h"
#include "host/folder_resource_handler.h"
#include "host/print_log_handler.h"
#include "host/software_render_target.h"

using namespace qorvex;

namespace {

constexpr std::uint32_t kWidth = 640;
constexpr std::uint32_t kHeight = 360;

struct Frames {
    std::uint32_t begun = 0;                 // main thread
    std::atomic<std::uint32_t> recorded{0};  // written on whatever thread did the layout job
    std::atomic<std::uint32_t> newest{0};

    static void OnFrameComplete(void* frames, std::uint32_t, std::uint32_t id, std::uint32_t) {
        auto* self = static_cast<Frames*>(frames);
        self->newest = id;
        ++self->recorded;
    }
    // Only then does Advance find the layout side idle, and return without waiting for it.
    [[nodiscard]] bool LastIsRecorded() const { return recorded == begun; }
};

}  // namespace

int main(int count, char** arguments) {
    const std::filesystem::path page = count > 1 ? arguments[1] : "examples/hello/index.html";

    host::CountingAllocator allocator;
    host::PrintLogHandler log;
    JobSystem jobs;
    LibraryParams params;
    params.Allocator = &allocator;
    params.LogHandler = &log;
    params.LoggingSeverity = Logging::Warning;
    params.UseDedicatedLayoutThread = true;  // layout becomes a job too
    params.OnWorkAvailable = &JobSystem::OnWorkAvailable;
    params.OnWorkAvailableUserData = &jobs;
    Library* library = Library::Initialize(params);
    if (!library) return 1;
    jobs.Start(*library);

    host::FolderResourceHandler resources(page.has_parent_path() ? page.parent_path() : ".");
    SystemSettings system_settings;
    system_settings.ResourceHandler = &resources;
    system_settings.EmbeddedFallbackFont = 2;
    System* system = library->CreateSystem(system_settings);

    Frames frames;
    ViewSettings view_settings;
    view_settings.Width = kWidth;
    view_settings.Height = kHeight;
    view_settings.OnFrameComplete = &Frames::OnFrameComplete;
    view_settings.CallbackUserData = &frames;
    View* view = system->CreateView(view_settings);
    SystemRenderer* system_renderer = system->CreateSystemRenderer({});
    system_renderer->RegisterRenderThread(nullptr, nullptr, 0);
    ViewRenderer* renderer = system_renderer->CreateViewRenderer(view);
    host::SoftwareRenderTarget target(kWidth, kHeight);
    renderer->SetRenderTargetSimple(target.Color(), nullptr, kWidth, kHeight, 1);

    view->LoadURL(host::FileURL(page).c_str());
    for (int tick = 1; tick <= 100; ++tick) {
        system->Advance(tick * 16.0);
        // A frame that is late is not waited for: the game goes on with the picture it has.
        if (frames.LastIsRecorded()) {
            if (frames.begun > 0) renderer->Paint(frames.newest, false);
            ++frames.begun;
            view->Advance(tick * 16.0);
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(2));  // the rest of the game's own frame
    }

    std::size_t drawn = 0;
    for (std::size_t i = 3; i < target.Pixels().size(); i += 4)
        drawn += target.Pixels()[i] != 0;
    std::printf("%u frames, %zu pixels drawn\n", frames.begun, drawn);

    // The jobs serve the engine until the last view has ended its last frame.
    renderer->Destroy();
    system_renderer->Destroy();
    view->Destroy();
    system->Destroy();
    library->StopWorkers();
    jobs.Stop();
    library->Uninitialize(true);
    return drawn > 0 && allocator.Total().blocks == 0 && log.CountFrom(Logging::Error) == 0 ? 0 : 1;
}
