// Animated pictures: which frame shows is a matter of the view's time, and what is not seen costs nothing.
#include <gtest/gtest.h>
#include <qorvex/debug_interface.h>

#include "core/frame/client.h"
#include "support/image_files.h"

namespace {

using client::Client;
using qorvex::test::Gif;

// As the pixel's three low bytes: r, g, b from low to high.
constexpr uint32_t kRed = 0x0000ff;
constexpr uint32_t kGreen = 0x00ff00;
constexpr uint32_t kBlue = 0xff0000;

class AnimatedImage : public testing::Test {
  protected:
    void Load() {
        // 100, 50 and, for want of a usable delay, 100 milliseconds.
        client_.files.Put("coui://page/beat.gif", Gif(8, 8, {10, 5, 1}));
        client_.Load(
            "<html><head><style>body{margin:0} img{position:absolute;left:0;top:0}</style></head><body>"
            "<img id=beat src=beat.gif></body></html>");
        debug_ = static_cast<qorvex::IDebugInterface*>(
            client_.library->GetFeatureInterface(qorvex::kDebugFeature));
    }

    void Script(const char* text) {
        client_.view->ExecuteScript(text);
        client_.Frame(1);
        client_.Frame(1);
    }

    uint32_t Color() const { return client_.Pixel(4, 4); }

    bool ChangesIn(double milliseconds) {
        client_.Frame(milliseconds);
        return debug_->HasChanged(client_.view);
    }

    // To the first millisecond of a frame.
    void RunUntil(uint32_t color) {
        for (int i = 0; i < 300 && Color() == color; ++i)
            client_.Frame(1);
        for (int i = 0; i < 300 && Color() != color; ++i)
            client_.Frame(1);
        ASSERT_EQ(Color(), color);
    }

    Client client_;
    qorvex::IDebugInterface* debug_ = nullptr;
};

TEST_F(AnimatedImage, EachFrameShowsForItsTimeAndIsPaintedOnce) {
    Load();
    RunUntil(kRed);
    std::vector<std::pair<uint32_t, int>> shown;
    int painted = 0;
    for (int time = 0; time < 500; time += 10) {
        if (shown.empty() || shown.back().first != Color()) shown.push_back({Color(), 0});
        shown.back().second += 10;
        painted += ChangesIn(10);
    }
    const std::vector<std::pair<uint32_t, int>> expected = {{kRed, 100}, {kBlue, 50}, {kGreen, 100},
                                                            {kRed, 100}, {kBlue, 50}, {kGreen, 100}};
    EXPECT_EQ(shown, expected);
    EXPECT_EQ(painted, 6);
}

TEST_F(AnimatedImage, WhatIsOutOfSightIsNotPainted) {
    Load();
    RunUntil(kRed);
    for (const char* hide : {"beat.style.left = '500px'", "beat.style.display = 'none'"}) {
        Script((std::string("var beat = document.getElementById('beat');") + hide).c_str());
        for (int i = 0; i < 30; ++i)
            EXPECT_FALSE(ChangesIn(20)) << hide;
    }
    // It comes back with the frame of the moment: of 250 ms a round, the hidden ones and a few went by.
    Script("beat.style.left = 0; beat.style.display = 'block'");
    RunUntil(kBlue);
    EXPECT_TRUE(ChangesIn(50));
    EXPECT_EQ(Color(), kGreen);
    Script("document.body.removeChild(beat)");
    for (int i = 0; i < 30; ++i)
        EXPECT_FALSE(ChangesIn(20));
}

TEST_F(AnimatedImage, ALongSleepSkipsWholeRounds) {
    Load();
    RunUntil(kBlue);
    client_.Frame(250.0 * 400000);
    EXPECT_EQ(Color(), kBlue);
    EXPECT_TRUE(ChangesIn(50));
    EXPECT_EQ(Color(), kGreen);
}

TEST_F(AnimatedImage, HostileFilesAreRefusedAndThePageGoesOn) {
    client_.files.Put("coui://page/many.gif", Gif(1, 1, std::vector<uint32_t>(10001)));
    client_.files.Put("coui://page/cut.gif", Gif(200, 200, {0, 0}).substr(0, 20000));
    client_.files.Put("coui://page/long.gif", Gif(4, 4, std::vector<uint32_t>(1000)));
    client_.Load(
        "<html><head><style>body{margin:0} img{display:block}</style></head><body>"
        "<img id=many src=many.gif><img id=cut src=cut.gif><img id=long src=long.gif></body></html>");
    client_.view->ExecuteScript(
        "console.log('sizes ' + ['many', 'cut', 'long'].map(id => document.getElementById(id).width))");
    EXPECT_TRUE(client_.log.Contains("Refusing to decode an animation of 10001 frames of 1 x 1 pixels"));
    EXPECT_TRUE(client_.log.Contains("sizes 0,200,4"));
}

}  // namespace
