// The smallest complete embedding: one thread, one view, a loop. It draws a page into memory and prints how
// many pixels are not empty. docs/embedding.md walks through it.
#include <qorvex/qorvex.h>

#include <cstdio>
#include <filesystem>

#include "host/counting_allocator.h"
#include "host/folder_resource_handler.h"
#include "host/print_log_handler.h"
#include "host/software_render_target.h"

using namespace qorvex;

// The game learns the id of each finished frame and paints it.
static void OnFrameComplete(void* frame, std::uint32_t, std::uint32_t id, std::uint32_t) {
    *static_cast<std::uint32_t*>(frame) = id;
}

int main(int count, char** arguments) {
    const std::filesystem::path page = count > 1 ? arguments[1] : "examples/embed/page.html";

    // 1. The library: memory and log come from the game.
    host::CountingAllocator allocator;
    host::PrintLogHandler log;
    LibraryParams params;
    params.Allocator = &allocator;
    params.LogHandler = &log;
    params.LoggingSeverity = Logging::Warning;
    Library* library = Library::Initialize(params);
    if (!library) return 1;

    // 2. A system: resources come from the game.
    host::FolderResourceHandler resources(page.has_parent_path() ? page.parent_path() : ".");
    SystemSettings system_settings;
    system_settings.ResourceHandler = &resources;
    system_settings.EmbeddedFallbackFont = 2;  // the large one: letters, digits and signs of ASCII
    System* system = library->CreateSystem(system_settings);

    // 3. A view, and its renderer on the thread that draws.
    std::uint32_t frame = 0;
    ViewSettings view_settings;
    view_settings.Width = 640;
    view_settings.Height = 360;
    view_settings.OnFrameComplete = OnFrameComplete;
    view_settings.CallbackUserData = &frame;
    View* view = system->CreateView(view_settings);
    SystemRenderer* system_renderer = system->CreateSystemRenderer({});
    system_renderer->RegisterRenderThread(nullptr, nullptr, 0);
    ViewRenderer* renderer = system_renderer->CreateViewRenderer(view);
    host::SoftwareRenderTarget target(640, 360);
    RenderTargetDescription description;
    description.Width = 640;
    description.Height = 360;
    renderer->SetRenderTarget(target.Color(), nullptr, &description);

    // 4. The game's loop. A real game runs it until the player leaves, and gives the resource work to its own
    //    job system.
    view->LoadURL(host::FileURL(page).c_str());
    for (int tick = 1; tick <= 30; ++tick) {
        library->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, kAllTaskFamilies);
        system->Advance(tick * 16.0);
        view->Advance(tick * 16.0);
        renderer->Paint(frame, false);
    }

    std::size_t drawn = 0;
    for (std::size_t i = 3; i < target.Pixels().size(); i += 4)
        drawn += target.Pixels()[i] != 0;
    std::printf("%zu pixels drawn\n", drawn);

    // 5. The end, in reverse.
    renderer->Destroy();
    system_renderer->Destroy();
    view->Destroy();
    system->Destroy();
    library->StopWorkers();
    library->Uninitialize(true);
    return drawn > 0 && allocator.Total().blocks == 0 && log.CountFrom(Logging::Error) == 0 ? 0 : 1;
}
