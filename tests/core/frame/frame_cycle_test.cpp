// The frame cycle from a page to pixels. For the order of things the log is the witness.
#include <gtest/gtest.h>

#include "core/frame/client.h"

namespace {

using client::Client;
using client::Options;

constexpr const char* kPage =
    "<html><head><style>body{margin:0;background-color:#ff0000}"
    "#box{position:absolute;left:8px;top:8px;width:16px;height:16px;background-color:#0000ff}</style></head>"
    "<body><div id=\"box\"></div></body></html>";

constexpr uint32_t kRed = 0x0000ff;  // as the pixel's three low bytes: r, g, b from low to high
constexpr uint32_t kBlue = 0xff0000;
constexpr uint32_t kGreen = 0x00ff00;

TEST(FrameCycle, PageBecomesPixels) {
    Client client;
    client.Load(kPage);
    EXPECT_EQ(client.Pixel(2, 2), kRed);
    EXPECT_EQ(client.Pixel(12, 12), kBlue);
    EXPECT_EQ(client.Pixel(40, 40), kRed);
    const std::vector<std::string> expected = {"navigate coui://page/index.html", "context", "built",
                                               "loaded coui://page/index.html"};
    EXPECT_EQ(client.listener.events, expected);
    EXPECT_EQ(client.log.Lines(qorvex::Logging::Error), std::vector<std::string>());
}

TEST(FrameCycle, TaskGraphRunsInItsOrder) {
    Client client;
    client.files.Put("coui://page/index.html", kPage);
    client.view->LoadURL("coui://page/index.html");
    client.log.Clear();
    client.RunUntilLoaded();
    const std::vector<std::string> names = {
        "Executing task Layout",          "Executing task RecalculateVisualStyle",
        "Executing task RecordRendering", "Executing task SignalFrameCompletion",
        "Executing task SyncTrees",       "Executing task UnblockLayout"};
    std::vector<std::string> ran = client.log.Matching(names);
    ASSERT_GE(ran.size(), names.size());
    ran.resize(names.size());
    EXPECT_EQ(ran, names);
}

TEST(FrameCycle, IdleFramesCostNothing) {
    Options options;
    options.severity = qorvex::Logging::Info;
    Client client(options);
    client.Load(kPage);
    for (int i = 0; i < 3; ++i)
        client.Frame();
    const size_t completed = client.completed.size();
    const uint64_t requests = client.allocator.requests();
    client.view->Advance(client.time += 16);
    client.view->Advance(client.time += 16);
    EXPECT_EQ(client.completed.size(), completed + 2) << "each Advance completes its frame";
    EXPECT_EQ(client.allocator.requests(), requests) << "an idle Advance allocates nothing";
    EXPECT_EQ(client.renderer->Paint(client.last_frame, false), qorvex::PaintStatus::Complete);
    EXPECT_EQ(client.renderer->Paint(client.last_frame, false), qorvex::PaintStatus::FrameMissing);
    EXPECT_EQ(client.renderer->Paint(client.last_frame + 1, false), qorvex::PaintStatus::Complete);
    client.last_frame += 2;
}

// What a large page needed to load is given back by the frames that follow, not by idle ones.
TEST(FrameCycle, IdleFramesCostNothingAfterALargePage) {
    Options options;
    options.severity = qorvex::Logging::Info;
    Client client(options);
    std::string page = kPage;
    for (int i = 0; i < 1000; ++i)
        page += "<div></div>";
    client.Load(page);
    const uint64_t requests = client.allocator.requests();
    for (int i = 0; i < 20; ++i)
        client.Frame();
    EXPECT_EQ(client.allocator.requests(), requests);
}

TEST(FrameCycle, AdvanceWithoutDocumentCountsFrames) {
    Client client;
    client.Frame();
    client.Frame();
    EXPECT_EQ(client.completed, (std::vector<uint32_t>{0, 1}));
}

TEST(FrameCycle, ScriptChangesReachTheNextPixels) {
    Client client;
    client.Load(kPage);
    client.view->ExecuteScript("document.getElementById('box').style.backgroundColor = '#00ff00'");
    client.Frame();
    client.Frame();
    EXPECT_EQ(client.Pixel(12, 12), kGreen);
    EXPECT_EQ(client.Pixel(2, 2), kRed);
}

TEST(FrameCycle, AllThreadModesGiveTheSamePixels) {
    std::vector<std::vector<uint32_t>> pictures;
    for (int mode = 0; mode < 3; ++mode) {
        Options options;
        options.dedicated_layout = mode > 0;
        options.layout_threads = mode > 0 ? 1 : 0;
        options.resource_threads = mode == 2 ? 3 : 0;
        options.requests_on_workers = mode == 2;
        Client client(options);
        client.Load(kPage);
        client.view->ExecuteScript("document.getElementById('box').style.left = '20px'");
        for (int i = 0; i < 4; ++i)
            client.Frame();
        pictures.push_back(client.pixels);
        EXPECT_EQ(client.Pixel(22, 12), kBlue) << "mode " << mode;
    }
    EXPECT_EQ(pictures[0], pictures[1]);
    EXPECT_EQ(pictures[0], pictures[2]);
}

TEST(FrameCycle, HelpingThreadsPaintTheSamePixels) {
    std::vector<std::vector<uint32_t>> pictures;
    for (const char* switches : {"", "--paint-helpers=2", "--paint-helpers=nonsense"}) {
        Options options;
        options.width = 640, options.height = 400;
        options.resource_threads = 2;
        options.switches = switches;
        Client client(options);
        client.Load(
            "<html><body style='margin:0'><div style='margin:40px;height:300px;border-radius:50px;"
            "background-image:linear-gradient(45deg,red,blue);filter:blur(3px)'></div></body></html>");
        for (int i = 0; i < 6; ++i) {
            const std::string color = "rgb(0,0," + std::to_string(i) + ")";
            client.view->ExecuteScript(("document.body.style.backgroundColor = '" + color + "'").c_str());
            client.Frame();
        }
        pictures.push_back(client.pixels);
        EXPECT_EQ(client.log.Contains("Executing task PaintBands"),
                  std::string(switches) == "--paint-helpers=2");
        EXPECT_EQ(client.log.Lines(qorvex::Logging::Error), std::vector<std::string>());
    }
    EXPECT_EQ(pictures[0], pictures[1]);
    EXPECT_EQ(pictures[0], pictures[2]);
}

TEST(FrameCycle, TimeGoingBackIsReportedAndIgnored) {
    Client client;
    client.view->Advance(100);
    client.view->Advance(200);
    client.view->Advance(150);  // below the last one only: time goes back without a word
    EXPECT_EQ(client.log.Count("Time given to Advance is less"), 0u);
    client.view->Advance(100);
    EXPECT_TRUE(client.log.Contains(
        "Time given to Advance is less than last advance time, last advance time: 200 / time given: 100"));
}

TEST(FrameCycle, FreedRenderingResourcesRedrawTheWholeView) {
    Client client;
    client.Load(kPage);
    client.renderer->FreeRenderingResources();
    std::fill(client.pixels.begin(), client.pixels.end(), 0);
    client.Frame();
    client.Frame();
    EXPECT_TRUE(client.log.Contains("Rendering resources reset detected. Next valid frame id "));
    EXPECT_EQ(client.Pixel(40, 40), kRed);
    EXPECT_EQ(client.Pixel(12, 12), kBlue);
}

// Frames wait for a client that paints nothing for a while, but not for ever.
TEST(FrameCycle, AClientThatPaintsAgainSeesWhatItMissed) {
    Client client;
    client.Load(kPage);
    client.view->ExecuteScript("document.getElementById('box').style.backgroundColor = '#00ff00'");
    for (int i = 0; i < 300; ++i, ++client.last_frame)
        client.view->Advance(client.time += 16);
    client.Paint();
    client.Frame();
    EXPECT_EQ(client.Pixel(12, 12), kGreen);
    EXPECT_EQ(client.Pixel(40, 40), kRed);
}

// A box whose shadow lives in a surface of its own, filled by the frame that first shows it.
constexpr const char* kShadowPage =
    "<html><body style='margin:0;background-color:#ff0000'><div id='box' style='position:absolute;left:20px;"
    "top:10px;width:10px;height:10px;box-shadow:0 0 6px 4px #0000ff'></div></body></html>";

TEST(FrameCycle, NewRenderersGetTheWholeView) {
    for (bool wait : {false, true}) {
        Options options;
        options.wait_for_renderer = wait;
        Client client(options);
        client.renderer->Destroy();
        client.renderer = nullptr;
        client.Load(kShadowPage);
        client.MakeRenderer();
        client.Frame();
        EXPECT_EQ(client.Pixel(2, 2), kRed) << "wait " << wait;
        EXPECT_NE(client.Pixel(18, 15), kRed) << "the shadow, wait " << wait;
        const std::vector<uint32_t> first = client.pixels;
        client.MakeRenderer();
        client.Frame();
        EXPECT_EQ(client.pixels, first) << "wait " << wait;
    }
}

// A shadow that goes frees its surface in the next frame, which a new renderer drops.
TEST(FrameCycle, DroppedFramesFreeTheirSurfacesAllTheSame) {
    Client client;
    client.Load(kShadowPage);
    const auto shadow = [&](int blur) {
        client.view->ExecuteScript(("document.getElementById('box').style.boxShadow = '0 0 " +
                                    std::to_string(blur) + "px 4px #0000ff'")
                                       .c_str());
    };
    const auto rounds = [&](int count) {
        for (int i = 0; i < count; ++i) {
            shadow(4);
            client.Frame();
            client.view->ClearCaches(static_cast<uint32_t>(qorvex::CacheType::Shadows));
            shadow(8);
            client.Advance();
            client.MakeRenderer();
            client.Frame();
        }
        client.Frame();
        return client.allocator.blocks();
    };
    const int64_t few = rounds(5);
    EXPECT_LE(rounds(40), few + 10);
    EXPECT_NE(client.Pixel(18, 15), kRed) << "the shadow";
}

TEST(FrameCycle, AClientMaySkipFrameIds) {
    Client client;
    client.Load(kPage);
    const auto move = [&](int left) {
        client.view->ExecuteScript(
            ("document.getElementById('box').style.left = '" + std::to_string(left) + "px'").c_str());
    };
    for (int i = 0; i < 600; ++i) {
        move(8 + i % 30);
        client.Advance();
        if (i % 7 == 0) client.Paint();
    }
    // The newest first; an older one still waits for its turn, and has one.
    const uint32_t newest = client.last_frame - 1;
    EXPECT_EQ(client.renderer->Paint(newest, false), qorvex::PaintStatus::Complete);
    EXPECT_EQ(client.renderer->Paint(newest - 3, false), qorvex::PaintStatus::Complete);
    EXPECT_EQ(client.renderer->Paint(newest - 3, false), qorvex::PaintStatus::FrameMissing);
    // Those that were never painted have gone long ago, and what they would have drawn is drawn again.
    EXPECT_EQ(client.renderer->Paint(newest - 500, false), qorvex::PaintStatus::FrameMissing);
    move(8);
    client.Frame();
    client.Frame();
    EXPECT_EQ(client.Pixel(12, 12), kBlue);
    EXPECT_EQ(client.Pixel(30, 12), kRed);
    EXPECT_EQ(client.Pixel(44, 12), kRed);
}

TEST(FrameCycle, PaintOptionDrawsTheWholeViewOnEveryChange) {
    Client client;
    client.Load(kPage);
    const auto paints_far_corner = [&] {
        std::fill(client.pixels.begin(), client.pixels.end(), 0);
        client.view->ExecuteScript(
            "var b = document.getElementById('box').style; b.left = b.left == '9px' "
            "? '8px' : '9px'");
        client.Frame();
        client.Frame();
        return client.Pixel(60, 40) == kRed;
    };
    EXPECT_FALSE(paints_far_corner());
    client.view->SetPaintOption(true);
    EXPECT_TRUE(paints_far_corner());
}

TEST(FrameCycle, PaintRectanglesFadeFromAStillPage) {
    Client client;
    client.Load(kPage);
    const std::vector<uint32_t> plain = client.pixels;
    client.view->ShowPaintRectangles(true);
    client.view->ExecuteScript("document.getElementById('box').style.left = '9px'");
    client.Frame();
    EXPECT_NE(client.pixels, plain);
    client.view->ExecuteScript("document.getElementById('box').style.left = '8px'");
    for (int i = 0; i < 20; ++i)
        client.Frame();
    EXPECT_EQ(client.pixels, plain);
    auto* debug =
        static_cast<qorvex::IDebugInterface*>(client.library->GetFeatureInterface(qorvex::kDebugFeature));
    EXPECT_FALSE(debug->HasChanged(client.view)) << "nothing is left to fade";
}

TEST(FrameCycle, CaptureHandsOutTheFrame) {
    Client client;
    client.Load(kPage);
    size_t size = 0;
    client.view->CaptureNextFrame(
        [](void* user, const qorvex::FrameCapture& capture) {
            *static_cast<size_t*>(user) = capture.GetSize();
        },
        &size);
    client.Frame();
    client.Frame();
    EXPECT_GT(size, 0u);
}

TEST(FrameCycle, PaintOfADiscardedFrameDrawsNothing) {
    Client client;
    client.Load(kPage);
    client.view->ContinuousRepaint(true);
    client.view->Advance(client.time += 16);
    const uint32_t frame = client.last_frame++;
    client.renderer->FreeRenderingResources();
    EXPECT_EQ(client.renderer->Paint(frame, true), qorvex::PaintStatus::NothingExecuted);
    EXPECT_EQ(client.renderer->Paint(frame, true), qorvex::PaintStatus::FrameMissing);
}

TEST(FrameCycle, RenderThreadPaintsBesideTheMainThread) {
    Options options;
    options.dedicated_layout = true;
    options.layout_threads = 1;
    options.resource_threads = 2;
    options.severity = qorvex::Logging::Warning;
    Client client(options);
    client.Load(kPage);
    std::atomic<uint32_t> published{client.last_frame};
    std::atomic<bool> done{false};
    std::thread render([&, next = client.last_frame]() mutable {
        while (!done || next < published) {
            if (next == published) {
                std::this_thread::yield();
                continue;
            }
            client.renderer->Paint(next, next % 2 == 0);
            if (next % 11 == 0) client.renderer->FreeRenderingResources();
            ++next;
        }
    });
    for (int i = 0; i < 60; ++i) {
        const std::string left = std::to_string(i % 40);
        client.view->ExecuteScript(("document.getElementById('box').style.left = '" + left + "px'").c_str());
        client.view->Advance(client.time += 16);
        published = ++client.last_frame;
    }
    done = true;
    render.join();
    client.view->ExecuteScript("document.getElementById('box').style.left = '20px'");
    client.renderer->FreeRenderingResources();
    for (int i = 0; i < 4; ++i)
        client.Frame();
    EXPECT_EQ(client.Pixel(22, 12), kBlue);
    EXPECT_EQ(client.Pixel(12, 40), kRed);
    EXPECT_EQ(client.log.Lines(qorvex::Logging::Error), std::vector<std::string>());
}

}  // namespace
