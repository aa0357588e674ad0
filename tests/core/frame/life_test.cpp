// Ends in every order, answers that come wrong, and what a client must not do.
#include <gtest/gtest.h>

#include <cmath>

#include "core/frame/client.h"

namespace {

using client::Client;
using client::Options;
using qorvex::PaintStatus;
using Status = qorvex::IAsyncResourceResponse::Status;

constexpr const char* kPage = "<html><body style=\"margin:0;background-color:#ff0000\">x</body></html>";
constexpr const char* kUrl = "coui://page/index.html";

TEST(Life, ASystemDoesNotWaitForASheetThatNeverComes) {
    Client client;
    client.files.SetDeferred(true);
    client.system->PreloadAndCacheStylesheet("coui://page/never.css");
    client.system->PreloadAndCacheHTML("coui://page/never.html");
    client.DestroyView();
    client.system->Destroy();
    client.system = nullptr;
    EXPECT_EQ(client.files.aborted.size(), 2u);
    client.files.waiting[0].response->Finish(Status::Success);  // late; the other one never
}

TEST(Life, APageThatArrivesAfterItsViewReachesNobody) {
    Client client;
    client.files.Put(kUrl, kPage);
    client.files.SetDeferred(true);
    client.view->LoadURL(kUrl);
    client.DestroyView();
    EXPECT_EQ(client.files.aborted.size(), 1u);
    client.files.AnswerAll();
    client.ServeResources();
    client.system->Advance(16);
    EXPECT_EQ(client.listener.events, std::vector<std::string>{std::string("navigate ") + kUrl});
}

TEST(Life, PagesAndScriptsMayBeFinishedTwice) {
    Client client;
    client.files.Put(kUrl, "<html><body><script src=\"a.js\"></script></body></html>");
    client.files.Put("coui://page/a.js", "console.log('once')");
    client.files.SetDeferred(true);
    client.view->LoadURL(kUrl);
    for (int i = 0; i < 3; ++i) {
        const auto all = client.files.waiting;
        client.files.AnswerAll();
        for (const auto& entry : all)
            entry.response->Finish(Status::Failure);
        client.Frame();
    }
    EXPECT_EQ(client.log.Matching({"once "}).size(), 1u);
    EXPECT_EQ(client.log.Count("Finished more than once"), 2u);
}

TEST(Life, ARendererMayOutliveItsViewAndSystem) {
    Client client;
    client.Load(kPage);
    client.view->ContinuousRepaint(true);
    client.view->Advance(client.time += 16);
    client.view->Destroy();
    client.view = nullptr;
    EXPECT_EQ(client.renderer->Paint(client.last_frame, true), PaintStatus::FrameMissing);
    client.renderer->FreeRenderingResources();
    client.system->Destroy();
    client.system = nullptr;
    EXPECT_EQ(client.renderer->Paint(0, false), PaintStatus::FrameMissing);
}

TEST(Life, PaintBeforeTheFirstFrameFindsNothing) {
    Client client;
    for (const unsigned id : {0u, 1u, 0xFFFFFFFFu})
        EXPECT_EQ(client.renderer->Paint(id, true), PaintStatus::FrameMissing);
}

// Layout is asynchronous, and nobody ever serves it: the main thread does before it would wait.
TEST(Life, AFrameThatNoThreadServesHoldsNothingUp) {
    for (const bool stop_first : {false, true}) {
        Options options;
        options.dedicated_layout = true;
        Client client(options);
        client.files.Put(kUrl, kPage);
        client.view->LoadURL(kUrl);
        for (int i = 0; i < 6; ++i)
            client.Frame();
        client.view->ContinuousRepaint(true);
        client.view->Advance(client.time += 16);
        if (!stop_first) continue;
        client.library->StopWorkers();
        client.view->Advance(client.time += 16);
        EXPECT_TRUE(client.log.Contains("View::Advance called after StopWorkers"));
        EXPECT_EQ(client.renderer->Paint(client.last_frame, true), PaintStatus::NothingExecuted)
            << "dropped, and not waited for";
    }
}

// Whoever waits for the layout side runs what has come in since, another page for example.
TEST(Life, ADumpIsOfThePageThatIsThereWhenItHasWaited) {
    client::Options options;
    options.dedicated_layout = true;
    Client client(options);
    client.files.Put(kUrl,
                     "<body>x<script>requestAnimationFrame(() => console.log('drawn'))</script></body>");
    client.files.Put("coui://page/next.html", "<html><body></body></html>");
    // Within a frame, behind its own results: the page stands in the queue before what ends the frame.
    bool drawn = false;
    client.log.on_line = [&](const std::string& line) {
        if (line != "drawn ") return;
        drawn = true;
        client.view->LoadURL("coui://page/next.html");
    };
    client.system->PreloadAndCacheHTML("coui://page/next.html");
    client.view->LoadURL(kUrl);
    client.view->ContinuousRepaint(true);
    for (int i = 0; i < 9 && !drawn; ++i) {
        client.library->ExecuteWork(qorvex::WorkType::Layout, qorvex::WorkExecutionMode::RunUntilEmpty,
                                    client.view->GetTaskFamilyId());
        client.Advance();
    }
    ASSERT_EQ(client.log.Count("has new HTML content"), 1u);
    if (qorvex::DebugDump* layers = client.view->DumpStackingContexts()) layers->Destroy();
    EXPECT_EQ(client.log.Count("has new HTML content"), 2u);
}

TEST(Life, WhatIsForgottenGoesWithTheLibrary) {
    client::Allocator allocator;
    client::Log log;
    client::Files files;
    qorvex::LibraryParams params;
    params.Allocator = &allocator;
    params.LogHandler = &log;
    qorvex::Library* library = qorvex::Library::Initialize(params);
    qorvex::SystemSettings settings;
    settings.ResourceHandler = &files;
    qorvex::System* system = library->CreateSystem(settings);
    qorvex::View* view = system->CreateView({});
    qorvex::SystemRenderer* renderer = system->CreateSystemRenderer({});
    renderer->CreateViewRenderer(view);
    files.SetDeferred(true);
    view->LoadURL(kUrl);
    library->StopWorkers();
    library->Uninitialize(false);
    EXPECT_TRUE(log.Contains("Library::Uninitialize called before its systems were destroyed"));
    EXPECT_TRUE(log.Contains("System::Destroy called before its views were destroyed"));
    EXPECT_TRUE(log.Contains("Library::Uninitialize called before its renderers were destroyed"));
    EXPECT_EQ(allocator.blocks(), 0);
    EXPECT_EQ(allocator.wrong_tags(), 0u);
}

// The strings of its pages go with the last view; sheets in the cache keep theirs.
TEST(Life, AViewThatGoesLeavesNoStringsBehind) {
    Client client;
    client.files.Put("coui://page/kept.css", ".kept { width: 77px }");
    client.system->PreloadAndCacheStylesheet("coui://page/kept.css");
    client.ServeResources();
    client.system->Advance(1);
    client.DestroyView();
    int64_t blocks = 0;
    for (const char* letter : {"a", "b", "c"}) {
        qorvex::ViewSettings settings;
        settings.Width = settings.Height = 8;
        client.view = client.system->CreateView(settings);
        client.last_frame = 0;
        client.MakeRenderer();
        client.Load(
            "<html><head><link rel=\"stylesheet\" href=\"kept.css\"></head><body><p class=\"kept\"></p>"
            "</body></html>");
        client.view->ExecuteScript((std::string("var p = document.querySelector('p');"
                                                "for (var i = 0; i < 4000; ++i) p.setAttribute('title', '") +
                                    letter +
                                    "' + i);"
                                    "console.log(getComputedStyle(p).width)")
                                       .c_str());
        client.DestroyView();
        if (*letter > 'b') {
            EXPECT_LT(client.allocator.blocks() - blocks, 40);
        }
        blocks = client.allocator.blocks();
    }
    EXPECT_EQ(client.log.Count("77px"), 3u);
}

// A listener that ends what is calling it.
class Destroyer final : public qorvex::IViewListener {
  public:
    explicit Destroyer(Client& client) : client_(client) {}
    void OnDOMBuilt() override {
        view->Destroy();
        client_.system->Destroy();
        client_.library->Uninitialize(false);
        view->Advance(0);
        ++calls;
    }
    qorvex::View* view = nullptr;
    int calls = 0;

  private:
    Client& client_;
};

TEST(Life, EndsFromInsideAnOperationAreRefused) {
    Client client;
    client.files.Put(kUrl, kPage);
    Destroyer listener(client);
    qorvex::ViewSettings settings;
    settings.Listener = &listener;
    settings.Width = settings.Height = 8;
    listener.view = client.system->CreateView(settings);
    listener.view->LoadURL(kUrl);
    for (int i = 0; i < 4; ++i) {
        client.Frame();
        listener.view->Advance(client.time);
        if (listener.calls) break;
    }
    EXPECT_EQ(listener.calls, 1);
    EXPECT_EQ(client.log.Lines(qorvex::Logging::Error).size(), 4u);
    listener.view->Destroy();
}

TEST(Life, OtherThreadsThanTheMainOneAreRefused) {
    Client client;
    client.Load(kPage);
    const std::function<void()> calls[] = {
        [&] { client.view->Advance(client.time + 16); },
        [&] { client.view->LoadURL(kUrl); },
        [&] { client.view->Resize(1, 1); },
        [&] { EXPECT_EQ(client.view->GetImagesList(0), nullptr); },
        [&] { EXPECT_EQ(client.view->GetWidth(), 0u); },
        [&] { client.view->ContinuousRepaint(true); },
        [&] { client.view->SetGestureScrollThreshold(99); },
        [&] { client.view->Destroy(); },
        [&] { client.system->SetId(9); },
        [&] { EXPECT_EQ(client.system->CreateView({}), nullptr); },
        [&] { client.system->ClearStylesheetCache(); },
        [&] { EXPECT_FALSE(client.system->RemoveHTMLCacheEntry(kUrl)); },
        [&] { client.system->Destroy(); },
        [&] { EXPECT_EQ(client.library->CreateSystem({}), nullptr); },
    };
    const std::vector<std::string> lines = {"View::Advance",
                                            "View::LoadURL",
                                            "View::Resize",
                                            "View::GetImagesList",
                                            "View::GetWidth",
                                            "View::ContinuousRepaint",
                                            "View::SetGestureScrollThreshold",
                                            "View::Destroy",
                                            "System::SetId",
                                            "System::CreateView",
                                            "System::ClearStylesheetCache",
                                            "System::RemoveHTMLCacheEntry",
                                            "System::Destroy",
                                            "Library::CreateSystem"};
    client.log.Clear();
    const size_t requests = client.files.requests.size();
    const auto pixels = client.pixels;
    const float threshold = client.view->GetGestureScrollThreshold();
    std::thread([&] {
        for (const auto& call : calls)
            call();
    }).join();
    std::vector<std::string> wanted;
    for (const std::string& line : lines)
        wanted.push_back(line + " must be called on the main thread");
    EXPECT_EQ(client.log.Lines(qorvex::Logging::Error), wanted);
    client.Frame();
    EXPECT_EQ(client.files.requests.size(), requests);
    EXPECT_EQ(client.pixels, pixels);
    EXPECT_EQ(client.view->GetGestureScrollThreshold(), threshold);
    EXPECT_NE(client.system->GetId(), 9u);
}

TEST(Life, TimesThatAreNoneAreReportedAndIgnored) {
    Client client;
    client.Load(kPage);
    client.view->ExecuteScript("setTimeout(function () { console.log('rang'); }, 30)");
    client.view->Advance(std::nan(""));
    client.view->Advance(HUGE_VAL);
    client.last_frame += 2;
    EXPECT_EQ(client.log.Count("Time given to Advance is not finite"), 2u);
    EXPECT_FALSE(client.log.Contains("rang "));
    for (int i = 0; i < 3; ++i)
        client.Frame();
    EXPECT_TRUE(client.log.Contains("rang "));
}

// A frame without drawing still gives back surfaces that the last one needed no more.
TEST(Life, AFrameMayFreeSurfacesAlone) {
    Client client;
    client.Load(
        "<html><body><div style=\"width:20px;height:20px;box-shadow:0 0 6px #000\"></div></body></html>");
    client.view->ClearCaches(static_cast<uint32_t>(qorvex::CacheType::Shadows));
    client.view->Resize(0, 0);
    for (int i = 0; i < 3; ++i)
        client.Frame();
    EXPECT_EQ(client.log.Lines(qorvex::Logging::Assert), std::vector<std::string>());
}

}  // namespace
