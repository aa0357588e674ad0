// The library and its systems: start, stop, and what stands beside them.
#include <fresco/rendering_library.h>
#include <gtest/gtest.h>

#include "core/frame/client.h"

namespace {

using client::Allocator;
using client::Client;
using client::Log;

std::string Decode(const std::string& text) {
    unsigned length = 0;
    qorvex::Library::DecodeURLString(text.data(), static_cast<unsigned>(text.size()), nullptr, &length);
    std::string out(length, 'x');
    qorvex::Library::DecodeURLString(text.data(), static_cast<unsigned>(text.size()), out.data(), &length);
    EXPECT_EQ(out.size(), length);
    EXPECT_EQ(out.back(), '\0');
    out.pop_back();
    return out;
}

TEST(LibraryTest, StartsAndStopsInOrder) {
    const std::vector<std::string> lines = {"Initializing QORVEX ver. 1.14.1.18",
                                            "Initializing task system...",
                                            "Initializing scripting...",
                                            "Initializing Fresco...",
                                            "QORVEX library initialized!",
                                            "Uninitializing task system...",
                                            "Task system stopped",
                                            "Uninitializing Fresco...",
                                            "Uninitializing scripting...",
                                            "Uninitializing QORVEX library!"};
    Allocator allocator;
    Log log;
    qorvex::LibraryParams params;
    params.Allocator = &allocator;
    params.LogHandler = &log;
    params.LoggingSeverity = qorvex::Logging::Trace;
    for (int round = 0; round < 2; ++round) {
        log.Clear();
        qorvex::Library* library = qorvex::Library::Initialize(params);
        ASSERT_NE(library, nullptr);
        EXPECT_EQ(library->GetFeatureInterface(99), nullptr);
        EXPECT_NE(library->GetFeatureInterface(5), nullptr);
        EXPECT_NE(library->GetFeatureInterface(6), nullptr);
        library->StopWorkers();
        library->Uninitialize(false);
        EXPECT_EQ(log.Matching(lines), lines);
        EXPECT_EQ(allocator.blocks(), 0);
        EXPECT_EQ(allocator.wrong_tags(), 0u);
    }
}

TEST(LibraryTest, UninitializeStopsForgottenWorkers) {
    Allocator allocator;
    Log log;
    qorvex::LibraryParams params;
    params.Allocator = &allocator;
    params.LogHandler = &log;
    qorvex::Library::Initialize(params)->Uninitialize(false);
    EXPECT_TRUE(log.Contains("You must call StopWorkers before Uninitialize!"));
}

TEST(LibraryTest, DecodesPercentEscapes) {
    Client client;
    EXPECT_EQ(Decode(""), "");
    EXPECT_EQ(Decode("a%20b"), "a b");
    EXPECT_EQ(Decode("%4a%4A"), "JJ");
    EXPECT_EQ(Decode("%zz"), "%zz");
    EXPECT_EQ(Decode("%4"), "%4");
    EXPECT_EQ(Decode("%4g%41"), "%4gA");
    EXPECT_EQ(Decode("%"), "%");
    EXPECT_EQ(Decode("100%%41"), "100%A");
}

TEST(LibraryTest, RenderingLibraryOfTheClient) {
    Allocator allocator;
    Log log;
    fresco::IAllocator* adapted_allocator = nullptr;
    fresco::Logging::ILogHandler* adapted_log = nullptr;
    qorvex::AdaptRenderingAllocatorAndLoggerFromQorvex(&allocator, &log, &adapted_allocator, &adapted_log);
    fresco::RenderingLibraryParams rendering;
    rendering.allocator = adapted_allocator;
    rendering.logHandler = adapted_log;
    fresco::IRenderingLibrary* external = fresco::CreateNullRenderingLibrary(rendering);
    qorvex::LibraryParamsWithExternalRenderingLibrary params;
    params.Allocator = &allocator;
    params.LogHandler = &log;
    params.LoggingSeverity = qorvex::Logging::Debug;
    qorvex::Library* library = qorvex::Library::InitializeWithRenderingLibrary(params, external);
    ASSERT_NE(library, nullptr);
    client::Files files;
    files.Put("coui://a/b.html", "<html><body>x</body></html>");
    qorvex::SystemSettings settings;
    settings.ResourceHandler = &files;
    qorvex::System* system = library->CreateSystem(settings);
    EXPECT_EQ(system->CreateSystemRenderer({}), nullptr);
    EXPECT_TRUE(log.Contains("Cannot use CreateSystemRenderer with external rendering library."));
    qorvex::SystemRenderer* renderer = system->CreateSystemRendererWithExternalRenderingLibrary();
    renderer->RegisterRenderThread(nullptr, nullptr, 0);
    renderer->FreeRenderingResources();
    EXPECT_TRUE(log.Contains("RegisterRenderThread cannot be used when using external RenderingLibrary!"));
    EXPECT_TRUE(log.Contains("FreeRenderingResources cannot be used when using external RenderingLibrary!"));
    qorvex::ViewSettings view_settings;
    view_settings.Width = view_settings.Height = 10;
    qorvex::View* view = system->CreateView(view_settings);
    qorvex::ViewRenderer* view_renderer = renderer->CreateViewRenderer(view);
    view->LoadURL("coui://a/b.html");
    for (unsigned frame = 0; frame < 4; ++frame) {
        library->ExecuteWork(qorvex::WorkType::Resources, qorvex::WorkExecutionMode::RunUntilEmpty, 0);
        system->Advance(frame);
        view->Advance(frame);
        EXPECT_EQ(view_renderer->Paint(frame, true), qorvex::PaintStatus::Complete);
    }
    view_renderer->Destroy();
    renderer->Destroy();
    view->Destroy();
    system->Destroy();
    library->StopWorkers();
    library->Uninitialize(false);
    external->Destroy();
    qorvex::DestroyAdaptedRenderingAllocatorAndLogger(&allocator, adapted_allocator, adapted_log);
    EXPECT_EQ(allocator.blocks(), 0);
}

TEST(LibraryTest, CacheSettingsAreCheckedAndKept) {
    using qorvex::CacheType;
    Client client;
    unsigned current = 0, capacity = 0;
    size_t bytes = 0;
    client.view->GetCacheCountStats(CacheType::Shadows, &current, &capacity);
    EXPECT_EQ(capacity, 32u);
    client.view->GetCacheCountStats(CacheType::Paths, &current, &capacity);
    EXPECT_EQ(capacity, 64u);
    for (CacheType type :
         {CacheType::Shadows, CacheType::Paths, CacheType::ScratchLayers, CacheType::ScratchTextures})
        client.view->SetCacheCountSize(type, 0);
    EXPECT_EQ(client.log.Count("because this is not a supported cache size!"), 4u);
    client.view->SetCacheCountSize(CacheType::RenderingLibrary, 0);
    EXPECT_EQ(client.log.Count("because this is not a supported cache size!"), 4u);
    client.view->SetCacheBytesSize(CacheType::ScratchLayers, 4194303);
    EXPECT_TRUE(client.log.Contains("Scratch layer capacity cannot be set to less than 4MB"));
    client.view->SetCacheBytesSize(CacheType::ScratchTextures, 4194304);
    client.view->GetCacheBytesStats(CacheType::ScratchTextures, nullptr, &bytes);
    EXPECT_EQ(bytes, 4194304u);
    client.view->GetCacheBytesStats(CacheType::Shadows, nullptr, &bytes);
    EXPECT_TRUE(client.log.Contains("The specified cache doesn't have the bytes statistic!"));
    client.view->GetCacheCountStats(static_cast<CacheType>(3), nullptr, nullptr);
    EXPECT_TRUE(client.log.Contains("Trying to get cache count stats for unknown type of cache!"));
    client.Load("<html><body>x</body></html>");
    EXPECT_TRUE(client.log.Contains("Executing task HandleQueuedCacheOperations") ||
                client.log.Contains("Execute Paint"));
}

TEST(LibraryTest, LaterOperationsSayThatTheyAreMissing) {
    Client client;
    client.view->MouseEvent({}, nullptr, nullptr);
    EXPECT_TRUE(client.log.Contains("View::MouseEvent is not available in this build"));
    bool handled = false;
    client.view->KeyEvent({}, &handled, nullptr);
    EXPECT_TRUE(client.log.Contains("The 'handled' parameter is deprecated!"));
}

}  // namespace
