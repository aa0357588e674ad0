// Images from the handler to the screen: one request for all who show one, every bad answer, every moment at
// which the last user can go, orphans, animations, the client's own images, lost rendering resources.
#include <gtest/gtest.h>
#include <qorvex/debug_interface.h>
#include <qorvex/frame_stats.h>
#include <qorvex/images_list.h>

#include <algorithm>
#include <chrono>
#include <memory>
#include <set>
#include <thread>

#include "core/frame/client.h"
#include "host/unruly_resource_handler.h"
#include "support/image_files.h"

namespace qorvex {
namespace {

using client::Client;
using test::Gif;
using test::Plain;
using test::Png;

constexpr uint32_t kRed = 0xFF0000FF, kGreen = 0xFF00FF00, kBlue = 0xFFFF0000;
constexpr uint32_t kSeenRed = 0x0000FF, kSeenGreen = 0x00FF00, kSeenBlue = 0xFF0000, kSeenWhite = 0xFFFFFF;

std::string Page(const std::string& style, const std::string& body) {
    return "<html><head><style>body { margin: 0; } div { position: absolute; left: 0; top: 0; width: 20px;"
           "height: 20px; } " +
           style + "</style></head><body>" + body + "</body></html>";
}

class ImageTest : public testing::Test {
  protected:
    void Start(client::Options options = {}) {
        client_ = std::make_unique<Client>(options);
        client_->files.Put("coui://page/red.png", Png(Plain(10, 10, kRed)));
        client_->files.Put("coui://page/green.png", Png(Plain(20, 20, kGreen)));
        client_->files.Put("coui://page/blue.png", Png(Plain(4, 4, kBlue)));
    }
    void Load(const std::string& style, const std::string& body, client::Options options = {}) {
        Start(options);
        client_->Load(Page(style, body));
    }
    void Run(const std::string& script) { client_->view->ExecuteScript(script.c_str()); }
    void Frames(int count) {
        for (int i = 0; i < count; ++i)
            client_->Frame();
    }
    size_t Requests(const std::string& url) const {
        const auto& all = client_->files.requests;
        return static_cast<size_t>(std::count(all.begin(), all.end(), url));
    }
    uint32_t Pixel(unsigned x, unsigned y) const { return client_->Pixel(x, y); }
    client::Log& log() { return client_->log; }
    // (live, orphaned) images.
    std::pair<uint32_t, uint32_t> Cached() {
        SystemCacheStats* stats = client_->system->CreateCacheStats();
        const std::pair<uint32_t, uint32_t> counts{stats->GetData().LiveImageCount,
                                                   stats->GetData().OrphanedImageCount};
        stats->Destroy();
        return counts;
    }

    std::unique_ptr<Client> client_;
};

TEST_F(ImageTest, StyleImagesAreAskedForOnceAndPainted) {
    Load(
        "#a { background: url(red.png) no-repeat 2px 3px; }"
        "#b { left: 30px; background-image: url(red.png), url(green.png); background-repeat: no-repeat, "
        "repeat; }"
        "#c { top: 24px; border: 4px solid black; border-image: url(blue.png) 1 fill; }"
        "#d { left: 30px; top: 24px; background-color: red; mask-image: url(red.png); mask-repeat: "
        "no-repeat; }"
        "#e { display: none; background-image: url(hidden.png); }",
        "<div id=a></div><div id=b></div><div id=c></div><div id=d></div><div id=e></div>");
    EXPECT_EQ(Pixel(1, 2), kSeenWhite);
    EXPECT_EQ(Pixel(2, 3), kSeenRed);
    EXPECT_EQ(Pixel(11, 12), kSeenRed);
    EXPECT_EQ(Pixel(12, 12), kSeenWhite);
    EXPECT_EQ(Pixel(32, 2), kSeenRed);
    EXPECT_EQ(Pixel(48, 18), kSeenGreen);
    EXPECT_EQ(Pixel(1, 40), kSeenBlue);
    EXPECT_EQ(Pixel(35, 30), kSeenRed);
    EXPECT_EQ(Pixel(45, 30), kSeenWhite);  // outside the mask
    for (const char* file : {"red", "green", "blue", "hidden"})
        EXPECT_EQ(Requests(std::string("coui://page/") + file + ".png"), 1u) << file;
    EXPECT_EQ(log().Count("Will reuse image: coui://page/red.png"), 2u);
    EXPECT_TRUE(log().Lines(Logging::Error).empty());

    // A change of style keeps what both name, and asks for what is new in the same frame.
    Run("document.getElementById('b').style.backgroundImage = 'url(blue.png), url(green.png)'");
    Frames(2);
    EXPECT_EQ(Pixel(32, 2), kSeenBlue);
    EXPECT_EQ(Pixel(48, 18), kSeenGreen);
    EXPECT_EQ(Requests("coui://page/green.png"), 1u);
    Run("document.getElementById('b').style.backgroundImage = 'none'");
    Frames(1);
    EXPECT_EQ(Pixel(48, 18), kSeenWhite);
}

TEST_F(ImageTest, TheListNamesWhatThePageShows) {
    Load(
        "#a { background-image: url(red.png); } #b { display: none; background-image: url(green.png); }"
        ".unused { background-image: url(blue.png); }",
        "<div id=a></div><div id=b></div>");
    const auto list = [&](unsigned flags) {
        ImagesList* images = client_->view->GetImagesList(flags);
        std::set<std::string> urls;
        for (int round = 0; round < 2; ++round, images->Reset())
            while (const char* url = images->GetNext())
                urls.insert(url);
        images->Destroy();
        return urls;
    };
    const std::string red = "coui://page/red.png", green = "coui://page/green.png";
    EXPECT_EQ(list(0), std::set<std::string>{red});
    EXPECT_EQ(list(1), (std::set<std::string>{red, green}));
    EXPECT_EQ(list(2).size(), 3u);

    SystemCacheStats* stats = client_->system->CreateCacheStats();
    const SystemCacheStatsData& data = stats->GetData();
    ASSERT_EQ(data.LiveImageCount, 2u);
    EXPECT_EQ(data.LiveImageBytes, (10 * 10 + 20 * 20) * 4u);
    for (uint32_t i = 0; i < 2; ++i)
        EXPECT_EQ(data.LiveImages[i].Width, data.LiveImages[i].URL == red ? 10u : 20u);
    stats->Destroy();
}

TEST_F(ImageTest, BadAnswersFailAndThePageGoesOn) {
    Start();
    std::string cut = Png(Plain(40, 40, kRed));
    cut.resize(cut.size() / 2);
    std::string huge = Png(Plain(1, 1, kRed));
    huge[18] = '\x7F';  // 32,513 pixels wide
    client_->files.Put("coui://page/cut.png", cut);
    client_->files.Put("coui://page/huge.png", huge);
    client_->files.Put("coui://page/noise.png", "not an image at all");
    client_->files.Put("coui://page/empty.png", "");
    std::string body;
    int top = 0;
    for (const char* file : {"cut.png", "huge.png", "noise.png", "empty.png", "missing.png"})
        body +=
            "<div style='top:" + std::to_string(top++) + "px; background-image: url(" + file + ")'></div>";
    body += "<div style='left: 30px; background: green; mask-image: url(missing.png)'></div>";
    client_->Load(Page("", body));
    EXPECT_EQ(log().Count("CachedImagesManager: Decode error for image "), 3u);
    EXPECT_EQ(log().Count("CachedImagesManager: Bad response data for image "), 2u);
    EXPECT_EQ(Pixel(5, 5), kSeenWhite);
    EXPECT_EQ(Pixel(35, 5), kSeenWhite);  // a mask without its image hides everything
    // As long as somebody shows it a bad image costs no second request; then its URL is free for a new try.
    Run("const more = document.createElement('div'); more.style.backgroundImage = 'url(noise.png)';"
        "document.body.appendChild(more);");
    Frames(2);
    EXPECT_EQ(Requests("coui://page/noise.png"), 1u);
    Run("document.body.textContent = ''");
    Frames(1);
    EXPECT_EQ(Cached(), (std::pair<uint32_t, uint32_t>{0, 0}));
    client_->files.Put("coui://page/noise.png", Png(Plain(20, 20, kGreen)));
    Run("document.body.appendChild(more)");
    Frames(3);
    EXPECT_EQ(Requests("coui://page/noise.png"), 2u);
    EXPECT_EQ(Pixel(5, 5), kSeenGreen);
}

// Until vector images can be parsed they fail, and say so once.
TEST_F(ImageTest, VectorImagesFailInOneWay) {
    Start();
    client_->files.Put("coui://page/a.svg", "<svg/>");
    client_->Load(Page("div { background-image: url(a.SVG), url(red.png); mask-image: url(b.svg?x); }",
                       "<div id=a></div><div></div>"));
    EXPECT_EQ(log().Count("SVG images are not available in this build"), 1u);
    EXPECT_EQ(log().Count(" load FAILED"), 2u);
    EXPECT_EQ(log().Count("Will reuse SVG: "), 2u);
    Run("document.body.removeChild(document.getElementById('a'))");
    Frames(2);
    EXPECT_TRUE(log().Lines(Logging::Error).empty());
}

// The last user goes in each state of the image.
TEST_F(ImageTest, TheLastUserGoesWhileTheRequestIsInFlight) {
    Load("", "<div id=a></div>");
    client_->files.SetDeferred(true);
    Run("var a = document.getElementById('a'); a.style.backgroundImage = 'url(red.png)'");
    Frames(1);
    ASSERT_EQ(client_->files.waiting.size(), 1u);
    const unsigned id = client_->files.waiting[0].id;
    Run("a.style.backgroundImage = 'none'");
    Frames(1);
    EXPECT_EQ(client_->files.aborted, std::vector<unsigned>{id});
    EXPECT_EQ(Cached().first, 0u);
    client_->files.AnswerAll();  // late, and nobody minds
    Frames(2);
    EXPECT_TRUE(log().Lines(Logging::Error).empty());
    client_->files.SetDeferred(false);
    Run("a.style.backgroundImage = 'url(red.png)'");
    Frames(3);
    EXPECT_EQ(Pixel(5, 5), kSeenRed);
}

TEST_F(ImageTest, TheLastUserGoesBeforeOrAfterDecoding) {
    Load("", "<div id=a></div>");
    Run("var a = document.getElementById('a'); a.style.backgroundImage = 'url(red.png)'");
    client_->view->Advance(client_->time += 16);  // answered; not decoded yet
    Run("document.body.removeChild(a)");
    client_->view->Advance(client_->time += 16);
    client_->ServeResources();
    EXPECT_TRUE(log().Contains("Freeing decoded data as image "));

    Run("document.body.appendChild(a)");
    client_->view->Advance(client_->time += 16);
    client_->ServeResources();
    Run("document.body.removeChild(a)");
    client_->view->Advance(client_->time += 16);
    EXPECT_TRUE(log().Contains(" upload to GPU canceled."));
    EXPECT_FALSE(log().Contains(" now on GPU "));
    EXPECT_EQ(Cached(), (std::pair<uint32_t, uint32_t>{0, 0}));
    client_->last_frame += 4;
}

TEST_F(ImageTest, OrphansComeBackForFreeAndArePruned) {
    Load("div { background-image: url(red.png); }", "<div id=a></div>");
    Run("var a = document.getElementById('a'); document.body.removeChild(a)");
    Frames(2);
    EXPECT_EQ(Cached(), (std::pair<uint32_t, uint32_t>{0, 1}));
    Run("document.body.appendChild(a)");
    Frames(1);
    EXPECT_EQ(Pixel(5, 5), kSeenRed) << "in the frame that asked";
    EXPECT_TRUE(log().Contains("CachedImagesManager: Resurrecting image: coui://page/red.png assigned id 0"));
    EXPECT_EQ(Requests("coui://page/red.png"), 1u);
    Run("document.body.removeChild(a)");
    Frames(1);
    client_->system->PruneOrphanedResources();
    EXPECT_EQ(Cached(), (std::pair<uint32_t, uint32_t>{0, 0}));
    EXPECT_TRUE(log().Contains("CachedImagesManager: Pruned image coui://page/red.png from cache "));
    Frames(1);
    EXPECT_EQ(log().Count("CachedImagesManager: Freeing GPU resource with id "), 1u);
    Run("document.body.appendChild(a)");
    Frames(3);
    EXPECT_EQ(Requests("coui://page/red.png"), 2u);
    EXPECT_EQ(Pixel(5, 5), kSeenRed);
}

TEST_F(ImageTest, CleaningGoesFromTheHighMarkToTheLow) {
    client::Options options;
    options.image_limits = {3, 1u << 30, 1, 1u << 30};
    Start(options);
    std::string body;
    for (int i = 0; i < 6; ++i) {
        const std::string file = std::to_string(i) + ".png";
        client_->files.Put("coui://page/" + file, Png(Plain(8, 8, kRed)));
        body += "<div style='background-image: url(" + file + ")'></div>";
    }
    client_->Load(Page("", body));
    // Cleaning comes before the addition: four stay, the fifth finds them above the mark.
    const uint32_t expected[] = {1, 2, 3, 4, 2, 3};
    for (const uint32_t orphans : expected) {
        Run("document.body.removeChild(document.body.firstChild)");
        Frames(1);
        EXPECT_EQ(Cached().second, orphans);
    }
    EXPECT_TRUE(log().Contains("Pruned image coui://page/0.png"));
    EXPECT_FALSE(log().Contains("Pruned image coui://page/3.png"));
}

TEST_F(ImageTest, ARequestThatAnotherViewWaitsForGoesOn) {
    Load("", "<div id=a></div>");
    ViewSettings settings;
    settings.Width = settings.Height = 32;
    View* other = client_->system->CreateView(settings);
    client_->files.Put("coui://page/other.html",
                       Page("", "<div style='background-image: url(red.png)'></div>"));
    other->LoadURL("coui://page/other.html");
    for (int i = 0; i < 6; ++i) {
        client_->Frame();
        other->Advance(client_->time);
    }
    EXPECT_EQ(Cached().first, 1u);
    client_->files.SetDeferred(true);
    Run("document.getElementById('a').style.backgroundImage = 'url(green.png)';");
    Frames(1);
    other->ExecuteScript("document.body.firstChild.style.backgroundImage = 'url(green.png)'");
    other->Advance(client_->time);
    EXPECT_EQ(Requests("coui://page/green.png"), 1u);
    client_->view->UnloadDocument();
    EXPECT_TRUE(client_->files.aborted.empty());
    client_->files.AnswerAll();
    client_->ServeResources();
    other->Advance(client_->time);
    EXPECT_EQ(Cached().first, 1u);
    other->Destroy();
}

TEST_F(ImageTest, AnimationsFollowTheClockAndCostNothingOutOfSight) {
    Start();
    client_->files.Put("coui://page/blink.gif", Gif(4, 4, {1, 2, 30}));  // 100, 20 and 300 ms
    client_->Load(Page("div { background-image: url(blink.gif); }", "<div id=a></div>"));
    const auto find = [&](uint32_t color) {
        for (int i = 0; i < 500 && Pixel(5, 5) != color; ++i)
            client_->Frame(1);
        const double start = client_->time;
        for (int i = 0; i < 500 && Pixel(5, 5) == color; ++i)
            client_->Frame(1);
        return client_->time - start;
    };
    find(kSeenGreen);
    EXPECT_NEAR(find(kSeenRed), 100, 2);
    EXPECT_NEAR(find(kSeenBlue), 20, 2);
    EXPECT_NEAR(find(kSeenGreen), 300, 2);

    auto* stats_of_frames =
        static_cast<IFrameStats*>(client_->library->GetFeatureInterface(kFrameStatsFeature));
    stats_of_frames->SetEnabled(client_->view, true);
    const auto painted = [&] {
        uint64_t pixels = 0;
        for (int i = 0; i < 60; ++i) {
            client_->Frame();
            FrameStats stats;
            if (stats_of_frames->GetFrame(client_->view, client_->last_frame - 1, &stats))
                pixels += stats.PaintedPixels;
        }
        return pixels;
    };
    EXPECT_GT(painted(), 0u);
    for (const char* style : {"left = '200px'", "display = 'none'", "visibility = 'hidden'"}) {
        Run(std::string(
                "document.getElementById('a').style.cssText = ''; document.getElementById('a').style.") +
            style);
        Frames(4);
        EXPECT_EQ(painted(), 0u) << style;
    }
    Run("document.getElementById('a').style.cssText = ''");
    EXPECT_GT(painted(), 0u);
}

// A client's own image, whose contents it may change.
class UserImages final : public IAsyncResourceHandler {
  public:
    explicit UserImages(client::Files& files) : files_(files) {
        data_.Width = data_.Height = 8;
        data_.UserImageId = 7;
        data_.Texture = &image_;
        data_.ContentRect[2] = data_.ContentRect[3] = 4;
        image_.pixels = pixels_;
        Fill(kRed);
    }
    // The content is the upper left quarter.
    void Fill(uint32_t color) {
        for (uint32_t i = 0; i < 64; ++i)
            pixels_[i] = i % 8 < 4 && i / 8 < 4 ? color : 0xFF000000;
    }
    void OnResourceRequest(const IAsyncResourceRequest* request, IAsyncResourceResponse* response) override {
        if (!std::string_view(request->GetURL()).ends_with("own"))
            return files_.OnResourceRequest(request, response);
        response->RecieveUserImage(data_);
        response->Finish(IAsyncResourceResponse::Status::Success);
    }
    void OnAbortResourceRequest(unsigned id) override { files_.OnAbortResourceRequest(id); }

  private:
    client::Files& files_;
    UserImageData data_;
    fresco::UserImage image_;
    uint32_t pixels_[64];
};

TEST_F(ImageTest, ClientsOwnImagesShowTheirContents) {
    client::Options options;
    std::unique_ptr<UserImages> user;
    options.wrap_handler = [&](client::Files& files) {
        user = std::make_unique<UserImages>(files);
        return user.get();
    };
    Load("div { background-image: url(own); }", "<div id=a></div>", options);
    EXPECT_EQ(Pixel(1, 1), kSeenRed);
    EXPECT_EQ(Pixel(19, 19), kSeenRed) << "tiles of the content alone";
    user->Fill(kBlue);
    Frames(2);
    EXPECT_EQ(Pixel(5, 5), kSeenRed) << "nobody said that it changed";
    const unsigned ids[] = {0, 7, 8};
    client_->system->UserImagesChanged(ids, 3);
    Frames(1);
    EXPECT_EQ(Pixel(5, 5), kSeenBlue);
    EXPECT_TRUE(
        log().Contains("Trying to update image with ID - 0 (index in provided list 0 out of 3). Skipped."));
    EXPECT_TRUE(log().Contains("Trying to update image with ID 8. Skipped."));
    Run("document.body.removeChild(document.getElementById('a'))");
    Frames(1);
    EXPECT_TRUE(log().Contains("scheduled to be freed with GPU resource id "));
    EXPECT_EQ(Cached(), (std::pair<uint32_t, uint32_t>{0, 0}));
}

TEST_F(ImageTest, LostRenderingResourcesAreLoadedAgain) {
    Load("div { background-image: url(red.png); } #b { left: 30px; background-image: url(green.png); }",
         "<div id=a></div><div id=b></div>");
    Run("document.body.removeChild(document.getElementById('b'))");
    Frames(1);
    client_->renderer->FreeRenderingResources();
    client_->system_renderer->FreeRenderingResources();
    std::fill(client_->pixels.begin(), client_->pixels.end(), 0);
    Frames(4);
    EXPECT_EQ(log().Count("CachedImagesManager: Force reloading all image resources."), 1u);
    EXPECT_EQ(Pixel(5, 5), kSeenRed);
    EXPECT_EQ(Requests("coui://page/red.png"), 2u);
    EXPECT_EQ(Cached(), (std::pair<uint32_t, uint32_t>{1, 0}));
}

// Whatever the handler does and whichever threads there are, a page that keeps swapping images ends with the
// right ones on the screen and nothing left behind.
class UnrulyImages : public ImageTest, public testing::WithParamInterface<int> {};

TEST_P(UnrulyImages, EndRight) {
    client::Options options;
    options.severity = Logging::Warning;
    if (GetParam() >= 1) options.resource_threads = 2;
    if (GetParam() >= 2) {
        options.dedicated_layout = true;
        options.layout_threads = 1;
    }
    options.requests_on_workers = GetParam() >= 3;
    options.image_limits = {4, 1u << 20, 2, 1u << 19};
    std::unique_ptr<host::UnrulyResourceHandler> unruly;
    options.wrap_handler = [&](client::Files& files) {
        unruly = std::make_unique<host::UnrulyResourceHandler>(files, 11);
        for (const char* url : {"coui://page/index.html", "coui://page/red.png", "coui://page/green.png"})
            unruly->Spare(url);
        return unruly.get();
    };
    options.on_frame = [&] { unruly->Step(); };
    Start(options);
    for (int i = 0; i < 12; ++i)
        client_->files.Put("coui://page/" + std::to_string(i) + ".png",
                           Png(Plain(8 + static_cast<uint32_t>(i), 8, kBlue)));
    client_->files.Put("coui://page/index.html", Page("", "<div id=a></div><div id=b></div>"));
    client_->view->LoadURL("coui://page/index.html");
    auto* debug = static_cast<IDebugInterface*>(client_->library->GetFeatureInterface(kDebugFeature));
    for (int i = 0; i < 2000 && !debug->IsLoaded(client_->view); ++i) {
        client_->Frame();
        std::this_thread::sleep_for(std::chrono::milliseconds(1));  // a busy machine runs workers late
    }
    ASSERT_TRUE(debug->IsLoaded(client_->view));
    for (int step = 0; step < 120; ++step) {
        const std::string file = std::to_string(step * 7 % 12) + ".png";
        Run("{ const d = document.createElement('div'); d.style.backgroundImage = 'url(" + file +
            ")'; document.body.appendChild(d);"
            "  const all = document.body.children; if (all.length > 6) document.body.removeChild(all[2]);"
            "  all[all.length - 2].style.maskImage = 'url(" +
            file + ")'; }");
        client_->Frame();
        if (step == 60) client_->renderer->FreeRenderingResources();
    }
    Run("while (document.body.children.length > 2) document.body.removeChild(document.body.lastChild);"
        "document.body.children[0].style.cssText = 'background-image: url(red.png)';"
        "document.body.children[1].style.cssText = 'left: 30px; background-image: url(green.png)';");
    for (int i = 0; i < 400 && !(Pixel(5, 5) == kSeenRed && Pixel(35, 5) == kSeenGreen); ++i) {
        client_->Frame();
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    EXPECT_EQ(Pixel(5, 5), kSeenRed);
    EXPECT_EQ(Pixel(35, 5), kSeenGreen);
    unruly->AnswerAll();
    client_.reset();
}

INSTANTIATE_TEST_SUITE_P(Threads, UnrulyImages, testing::Range(0, 4));

}  // namespace
}  // namespace qorvex
