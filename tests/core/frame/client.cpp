#include "core/frame/client.h"

#include <gtest/gtest.h>

namespace client {

Client::Client(Options given) : options(given) {
    qorvex::LibraryParams params;
    params.Allocator = &allocator;
    params.LogHandler = &log;
    params.LoggingSeverity = options.severity;
    params.UseDedicatedLayoutThread = options.dedicated_layout;
    params.UseObjectPools = options.pools;
    params.AdditionalOptions = options.switches;
    library = qorvex::Library::Initialize(params);

    qorvex::SystemSettings system_settings;
    system_settings.ResourceHandler = options.wrap_handler ? options.wrap_handler(files) : &files;
    system_settings.ResourceRequestsOnWorkers = options.requests_on_workers;
    system_settings.EmbeddedFallbackFont = 2;
    system_settings.ImageCacheLimits = options.image_limits;
    system = library->CreateSystem(system_settings);

    qorvex::ViewSettings view_settings;
    view_settings.Listener = &listener;
    view_settings.Width = options.width;
    view_settings.Height = options.height;
    view_settings.OnFrameComplete = &OnFrameComplete;
    view_settings.CallbackUserData = this;
    view_settings.WaitForViewRendererToRecord = options.wait_for_renderer;
    view_settings.EnableComplexCSSSelectorsStyling = options.complex_selectors;
    view = system->CreateView(view_settings);

    system_renderer = system->CreateSystemRenderer({});
    system_renderer->RegisterRenderThread(nullptr, nullptr, 0);
    MakeRenderer();

    const unsigned family = view->GetTaskFamilyId();
    for (int i = 0; i < options.layout_threads; ++i)
        workers_.emplace_back([this, family] {
            library->ExecuteWork(qorvex::WorkType::Layout, qorvex::WorkExecutionMode::RunUntilStopped,
                                 family);
        });
    for (int i = 0; i < options.resource_threads; ++i)
        workers_.emplace_back([this] {
            library->ExecuteWork(qorvex::WorkType::Resources, qorvex::WorkExecutionMode::RunUntilStopped, 0);
        });
}

void Client::MakeRenderer() {
    if (renderer) renderer->Destroy();
    renderer = system_renderer->CreateViewRenderer(view);
    pixels.assign(static_cast<size_t>(options.width) * options.height, 0);
    target_ = {pixels.data(), options.width, options.height, options.width * 4};
    renderer->SetRenderTargetSimple(&target_, nullptr, options.width, options.height, 1);
}

void Client::DestroyView() {
    if (renderer) renderer->Destroy();
    renderer = nullptr;
    if (view) view->Destroy();
    view = nullptr;
}

Client::~Client() {
    DestroyView();
    if (system_renderer) system_renderer->Destroy();
    if (system) system->Destroy();
    library->StopWorkers();
    for (std::thread& worker : workers_)
        worker.join();
    library->Uninitialize(false);
    EXPECT_EQ(allocator.blocks(), 0);
    EXPECT_EQ(allocator.wrong_tags(), 0u);
}

void Client::OnFrameComplete(void* user, uint32_t, uint32_t frame, uint32_t) {
    auto* self = static_cast<Client*>(user);
    std::lock_guard<std::mutex> lock(self->mutex_);
    self->completed.push_back(frame);
}

void Client::ServeResources() {
    if (options.resource_threads == 0)
        library->ExecuteWork(qorvex::WorkType::Resources, qorvex::WorkExecutionMode::RunUntilEmpty, 0);
}

void Client::Frame(double dt) {
    Advance(dt);
    Paint();
}

void Client::Advance(double dt) {
    if (options.on_frame) options.on_frame();
    ServeResources();
    time += dt;
    system->Advance(time);
    view->Advance(time);
    ++last_frame;
}

void Client::Paint() {
    if (renderer) renderer->Paint(last_frame - 1, options.layout_threads > 0 || !options.dedicated_layout);
}

void Client::Load(const std::string& html, const std::string& url) {
    files.Put(url, html);
    view->LoadURL(url.c_str());
    RunUntilLoaded();
}

void Client::RunUntilLoaded() {
    auto* debug = static_cast<qorvex::IDebugInterface*>(library->GetFeatureInterface(qorvex::kDebugFeature));
    for (int i = 0; i < 200; ++i) {
        while (debug->GetPendingWork(view) > 0) {
            ServeResources();
            std::this_thread::yield();
        }
        Frame();
        if (debug->IsLoaded(view) && debug->GetPendingWork(view) == 0) break;
    }
    EXPECT_TRUE(debug->IsLoaded(view));
    Frame();
    Frame();
}

uint32_t Client::Pixel(unsigned x, unsigned y) const {
    const uint32_t pixel = pixels[static_cast<size_t>(y) * options.width + x];
    const uint32_t alpha = pixel >> 24;
    uint32_t result = 0;
    for (int shift = 0; shift < 24; shift += 8)
        result |= std::min(255u, ((pixel >> shift) & 255u) + (255u - alpha)) << shift;
    return result;
}

}  // namespace client
