// Frames that repaint what changed show the same pixels as frames that repaint everything, and what many
// changes have led to looks like a page that was loaded so.
#include <gtest/gtest.h>
#include <qorvex/debug_interface.h>

#include "core/frame/client.h"
#include "pages/random_page.h"

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
#define QORVEX_SLOW_BUILD
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
#define QORVEX_SLOW_BUILD
#endif
#endif

namespace qorvex::pages {
namespace {

#ifdef QORVEX_SLOW_BUILD
constexpr int kFrames = 40;
#else
constexpr int kFrames = 250;
#endif
constexpr unsigned kWidth = 160;
constexpr unsigned kHeight = 120;

// Another view of the client's system, with a renderer and a target of its own.
class OtherView {
  public:
    OtherView(client::Client& game, bool repaintsAll) : game_(game), pixels(kWidth * kHeight) {
        ViewSettings settings;
        settings.Width = kWidth;
        settings.Height = kHeight;
        settings.OnFrameComplete = [](void* self, uint32_t, uint32_t id, uint32_t) {
            static_cast<OtherView*>(self)->frame_ = id;
        };
        settings.CallbackUserData = this;
        settings.EnableComplexCSSSelectorsStyling = game.options.complex_selectors;
        view_ = game.system->CreateView(settings);
        view_->ContinuousRepaint(repaintsAll);
        renderer_ = game.system_renderer->CreateViewRenderer(view_);
        target_ = {pixels.data(), kWidth, kHeight, kWidth * 4};
        renderer_->SetRenderTargetSimple(&target_, nullptr, kWidth, kHeight, 1);
    }
    ~OtherView() {
        renderer_->Destroy();
        view_->Destroy();
    }
    OtherView(const OtherView&) = delete;
    OtherView& operator=(const OtherView&) = delete;

    void Frame() {
        view_->Advance(game_.time);
        renderer_->Paint(frame_, true);
    }
    void Load(const char* url) {
        auto* debug = static_cast<IDebugInterface*>(game_.library->GetFeatureInterface(kDebugFeature));
        view_->LoadURL(url);
        for (int i = 0; i < 200 && !(debug->IsLoaded(view_) && debug->GetPendingWork(view_) == 0); ++i) {
            game_.Frame();
            Frame();
        }
        ASSERT_TRUE(debug->IsLoaded(view_));
        Frame();
    }
    void Run(const std::string& script) { view_->ExecuteScript(script.c_str()); }

  private:
    client::Client& game_;

  public:
    std::vector<uint32_t> pixels;

  private:
    fresco::CpuRenderTarget target_;
    View* view_;
    ViewRenderer* renderer_;
    uint32_t frame_ = 0;
};

client::Options SmallView() {
    client::Options options;
    options.width = kWidth;
    options.height = kHeight;
    options.severity = Logging::Warning;
    return options;
}

class RandomRedraw : public testing::TestWithParam<uint32_t> {
  protected:
    RandomRedraw() : full_(std::make_unique<OtherView>(client_, true)) {
        client_.Load(RandomPage::Html(), kUrl);
        full_->Load(kUrl);
    }
    ~RandomRedraw() override { full_.reset(); }

    // "" when the pixels are the same.
    std::string Difference(const std::vector<uint32_t>& other) const {
        size_t count = 0, first = 0;
        for (size_t i = other.size(); i-- > 0;) {
            if (client_.pixels[i] == other[i]) continue;
            first = i;
            ++count;
        }
        if (count == 0) return "";
        char text[120];
        std::snprintf(text, sizeof(text), "%zu pixels differ, the first at %zu, %zu: %08x instead of %08x",
                      count, first % kWidth, first / kWidth, client_.pixels[first], other[first]);
        return text;
    }

    static constexpr char kUrl[] = "coui://case/index.html";
    client::Client client_{SmallView()};
    std::unique_ptr<OtherView> full_;
};

TEST_P(RandomRedraw, PaintsLikeFullFrames) {
    RandomPage changes(GetParam());
    for (int frame = 0; frame < kFrames; ++frame) {
        const std::string script = changes.NextFrame();
        client_.view->ExecuteScript(script.c_str());
        full_->Run(script);
        client_.Frame();
        full_->Frame();
        ASSERT_EQ(Difference(full_->pixels), "") << "frame " << frame << " after\n" << script;
    }
}

// What is left of many changes looks as if it had been made at once.
TEST_P(RandomRedraw, ChangesLeadToTheSamePage) {
    auto* debug = static_cast<IDebugInterface*>(client_.library->GetFeatureInterface(kDebugFeature));
    std::string tree;
    debug->SetConsoleCallback(
        [](void* out, const ConsoleMessage& message) {
            static_cast<std::string*>(out)->assign(message.Text, message.Length);
        },
        &tree);
    RandomPage changes(GetParam() + 100);
    for (int round = 0; round < 5; ++round) {
        for (int frame = 0; frame < kFrames / 10; ++frame) {
            client_.view->ExecuteScript(changes.NextFrame().c_str());
            client_.Frame();
        }
        client_.Frame();
        client_.Frame();
        client_.view->ExecuteScript("console.log(JSON.stringify(dump(document.body)))");
        OtherView fresh(client_, false);
        fresh.Load(kUrl);
        fresh.Run("build(" + tree + ")");
        fresh.Frame();
        fresh.Frame();
        fresh.Run("scroll()");
        fresh.Frame();
        fresh.Frame();
        EXPECT_EQ(Difference(fresh.pixels), "") << "round " << round << "\n" << tree;
    }
    debug->SetConsoleCallback(nullptr, nullptr);
}

INSTANTIATE_TEST_SUITE_P(Seeds, RandomRedraw, testing::Range(1u, 9u));

}  // namespace
}  // namespace qorvex::pages
