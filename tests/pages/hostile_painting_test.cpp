// Pages that ask for more than can be painted: what is sound in them shows, soon and in bounded memory.
#include <gtest/gtest.h>

#include "core/frame/client.h"
#include "support/repeat.h"

namespace qorvex::pages {
namespace {

using test::Repeat;

class HostilePainting : public testing::Test {
  protected:
    static constexpr unsigned kWidth = 96;
    static constexpr unsigned kHeight = 64;
    static constexpr uint32_t kLime = 0x00FF00;

    static client::Options Quiet() {
        client::Options options;
        options.width = kWidth;
        options.height = kHeight;
        options.severity = Logging::Warning;
        return options;
    }

    // The body under a mark that shows when the frame was painted to its end.
    void Load(const std::string& style, const std::string& body) {
        client_.Load(
            "<html><head><style>html{background-color:white}body{margin:0;width:96px;height:64px}"
            "#mark{position:absolute;z-index:9;left:90px;top:60px;width:6px;height:4px;"
            "background-color:#0f0}" +
                style + "</style></head><body>" + body + "<div id=mark></div></body></html>",
            "coui://case/index.html");
        EXPECT_EQ(client_.Pixel(93, 62), kLime);
    }
    // One box for each of the values, in the middle of the page.
    void LoadBoxes(const std::string& property, std::initializer_list<const char*> values) {
        std::string body;
        for (const char* value : values)
            body += "<div class=b style=\"" + property + ":" + value + "\">text</div>";
        Load(".b{position:absolute;left:30px;top:20px;width:30px;height:20px;background-color:#00f8}", body);
    }
    static constexpr int64_t kMegabyte = 1 << 20;

    client::Client client_{Quiet()};
};

TEST_F(HostilePainting, ShadowsAndBlursOfTenThousandPixels) {
    LoadBoxes("box-shadow", {"0 0 10000px red", "inset 0 0 10000px red", "0 0 10000px 10000px red",
                             "0 0 9px -10000px red", "10000px 10000px 10000px 10000px red", "0 0 1e30px red",
                             "inset 0 0 1e30px 1e30px red", "1e38px -1e38px 0 1e38px red"});
    LoadBoxes("text-shadow", {"0 0 10000px red", "10000px 0 10000px red", "0 0 1e30px red"});
    LoadBoxes("filter", {"blur(10000px)", "blur(1e30px)", "drop-shadow(0 0 10000px red)",
                         "drop-shadow(1e30px -1e30px 1e30px red)", "blur(10000px) blur(10000px)",
                         "brightness(1e30) contrast(1e30) saturate(1e30)"});
    EXPECT_LT(client_.allocator.peak_bytes(), 600 * kMegabyte);
    // A shadow far larger than the view fills it.
    Load("#a{position:absolute;left:40px;top:30px;width:8px;height:8px;box-shadow:0 0 20px 10000px #f00}",
         "<div id=a></div>");
    EXPECT_EQ(client_.Pixel(2, 2), 0x0000FFu);
}

TEST_F(HostilePainting, ThousandsOfLayersAndClips) {
    for (const char* style :
         {"opacity:0.999", "overflow:hidden", "overflow:hidden;border-radius:20px", "filter:blur(1px)",
          "isolation:isolate", "mix-blend-mode:multiply", "clip-path:circle(90%)", "transform:rotate(1deg)",
          "mask-image:linear-gradient(black,#000e)", "perspective:100px;transform:rotateY(1deg)"}) {
        SCOPED_TRACE(style);
        Load(std::string("div.n{") + style + ";width:80px;height:50px}",
             Repeat("<div class=n>", 1000) + "deep" + Repeat("</div>", 1000));
    }
    EXPECT_LT(client_.allocator.peak_bytes(), 900 * kMegabyte);
}

TEST_F(HostilePainting, MatricesThatMapToNothing) {
    LoadBoxes("transform",
              {"scale(0)", "scale(0,1)", "matrix(0,0,0,0,0,0)", "matrix(1,1,1,1,0,0)", "scale(1e30)",
               "scale(1e-30)", "rotateY(90deg)", "rotate3d(0,0,0,40deg)", "skewX(90deg)",
               "translate(1e38px,1e38px) scale(1e38)", "matrix3d(0,0,0,0,0,0,0,0,0,0,0,0,0,0,0,0)",
               "matrix3d(1,0,0,1e38,0,1,0,1e38,0,0,1,0,0,0,0,1)", "matrix(1e38,1e38,1e38,1e38,1e38,1e38)",
               "scale(1e20) scale(1e20) scale(1e-40)"});
    // Around layers, clips and scrolling, which invert what they stand in.
    for (const char* inner : {"opacity:0.5", "overflow:scroll", "filter:blur(2px)", "clip-path:inset(1px)"}) {
        SCOPED_TRACE(inner);
        Load(std::string(".o{transform:scale(0,1)}.p{transform:scale(1e30)}.i{width:20px;height:20px;") +
                 inner + "}",
             "<div class=o><div class=i>a</div></div><div class=p><div class=i>b</div></div>");
    }
}

TEST_F(HostilePainting, WhatLiesBehindTheEyeIsNotSeen) {
    Load(
        "#eye{perspective:40px;width:60px;height:40px}.b{position:absolute;left:10px;top:10px;width:30px;"
        "height:20px;"
        "background-color:red}#behind{transform:translateZ(50px)}#at{transform:translateZ(40px)}",
        "<div id=eye><div class=b id=behind>x</div><div class=b id=at "
        "style='filter:blur(2px)'>x</div></div>");
    for (unsigned y = 0; y < 56; y += 7)
        for (unsigned x = 0; x < kWidth; x += 5)
            EXPECT_EQ(client_.Pixel(x, y), 0xFFFFFFu) << x << ", " << y;
    // A part of a plane that turns through the eye is in front of it.
    Load(
        "#eye{perspective:40px;width:90px;height:60px}.b{position:absolute;left:5px;top:5px;width:80px;"
        "height:50px;"
        "background-color:red;box-shadow:0 0 9px blue}.x{transform:rotateY(80deg) scale(9)}",
        "<div id=eye><div class='b x'>text</div><div class='b x' style='overflow:hidden;border-radius:9px'>"
        "<div class=b>text</div></div></div>");
}

TEST_F(HostilePainting, AHundredThousandDraws) {
    Load(
        ".b{position:absolute;left:0;top:0;width:64px;height:64px;background-size:1px 1px;"
        "background-image:linear-gradient(#0001,#f001)}",
        Repeat("<div class=b></div>", 25));
    Load(
        ".b{position:absolute;left:3px;top:3px;width:9px;height:9px;border-radius:3px;background-color:#00f1;"
        "border:1px solid red;border-left-color:blue;box-shadow:1px 1px 2px black}",
        Repeat("<div class=b></div>", 10000));
}

TEST_F(HostilePainting, TargetsAndViewsWithoutRoom) {
    Load("#a{filter:blur(2px);box-shadow:0 0 9px red;overflow:hidden}", "<div id=a>text</div>");
    fresco::CpuRenderTarget none{nullptr, 0, 0, 0};
    client_.renderer->SetRenderTargetSimple(&none, nullptr, 0, 0, 1);
    client_.view->ContinuousRepaint(true);
    client_.Frame();
    client_.renderer->SetRenderTargetSimple(nullptr, nullptr, 0, 0, 1);
    client_.Frame();
    for (const auto& [width, height] : {std::pair{0u, 0u}, {0u, 40u}, {1u, 1u}, {16384u, 1u}}) {
        client_.view->Resize(width, height);
        client_.Frame();
        client_.view->SetVirtualResolution(height, width);
        client_.Frame();
    }
    client_.view->Resize(kWidth, kHeight);
    client_.view->SetVirtualResolution(kWidth, kHeight);
    fresco::CpuRenderTarget target{client_.pixels.data(), kWidth, kHeight, kWidth * 4};
    client_.renderer->SetRenderTargetSimple(&target, nullptr, kWidth, kHeight, 1);
    client_.Frame();
    client_.Frame();
    EXPECT_EQ(client_.Pixel(93, 62), kLime);
}

}  // namespace
}  // namespace qorvex::pages
