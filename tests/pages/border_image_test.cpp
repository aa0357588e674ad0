// Border images by what must look the same: a gradient whose nine parts are put together again is the
// gradient.
#include <gtest/gtest.h>

#include "core/frame/client.h"

namespace qorvex::pages {
namespace {

constexpr unsigned kSide = 100;

client::Options SquareView() {
    client::Options options;
    options.width = options.height = kSide;
    return options;
}

class BorderImages : public testing::Test {
  protected:
    std::vector<uint32_t> Draw(const std::string& style) {
        client_.Load(
            "<html><head><style>html{background-color:white}body{margin:0}"
            "#a{position:absolute;left:20px;top:30px;width:60px;height:40px;" +
                style + "}</style></head><body><div id=a></div></body></html>",
            "coui://case/index.html");
        return client_.pixels;
    }
    // The largest difference of a channel.
    static int Difference(const std::vector<uint32_t>& a, const std::vector<uint32_t>& b) {
        int largest = 0;
        for (size_t i = 0; i < a.size(); ++i)
            for (int shift = 0; shift < 32; shift += 8)
                largest = std::max(largest, std::abs(static_cast<int>(a[i] >> shift & 255) -
                                                     static_cast<int>(b[i] >> shift & 255)));
        return largest;
    }

    client::Client client_{SquareView()};
};

TEST_F(BorderImages, LookLikeWhatTheyAreMadeOf) {
    const std::string slope = "linear-gradient(30deg,red,lime 40%,blue)";
    const std::string rows = "linear-gradient(red,lime 10px,lime 30px,blue)";
    const std::string disc = "radial-gradient(circle at 40% 60%,red,lime 20px,blue)";
    const struct {
        std::string style, same;
    } cases[] = {
        {"border-image:" + slope + " 10 fill / 10px", "background-image:" + slope},
        {"border-image:" + disc + " 5 7 9 3 fill / 5px 7px 9px 3px", "background-image:" + disc},
        {"border-image:" + slope + " 25% fill / 25%", "background-image:" + slope},
        {"border:10px solid black;border-image:" + disc + " 10 fill", "background-image:" + disc},
        // Around the box.
        {"left:30px;top:40px;width:40px;height:20px;border-image:" + slope + " 10 fill / 10px / 10px",
         "background-image:" + slope},
        {"border-image:" + slope + " 20 30 / 20px 30px", "background-image:" + slope},
        // Widths that do not fit shrink together.
        {"border-image:" + slope + " 20 30 / 40px 60px", "background-image:" + slope},
        // Copies side by side of what is the same everywhere.
        {"border-image:" + rows + " 10 fill / 10px stretch", "background-image:" + rows},
        {"border-image:" + rows + " 10 20 fill / 10px 13px repeat stretch", "background-image:" + rows},
        {"border-image:" + rows + " 10 25 fill / 10px 3px round stretch", "background-image:" + rows},
    };
    for (const auto& [style, same] : cases) {
        EXPECT_LE(Difference(Draw(style), Draw(same)), 2) << style;
    }
}

TEST_F(BorderImages, RepeatAndRoundCountTheirCopies) {
    // Stripes of 10 px across a source of 60 px; the part between the slices is one red and one blue stripe.
    const std::string stripes = "border-image:repeating-linear-gradient(90deg,red 0 10px,blue 10px 20px)";
    auto row = [](const std::vector<uint32_t>& pixels) {
        std::string colors;
        for (unsigned x = 20; x < 80; ++x) {
            const uint32_t pixel = pixels[32 * kSide + x] & 0xFFFFFF;
            const char color = pixel == 0x0000FF ? 'r' : pixel == 0xFF0000 ? 'b' : '-';
            if (colors.empty() || colors.back() != color) colors += color;
        }
        return colors;
    };
    // 20 px of the source on 60 px: three copies, with their middle one in the middle.
    const std::vector<uint32_t> repeated = Draw(stripes + " 10 20 / 10px 0 repeat");
    EXPECT_EQ(row(repeated), "rbrbrb");
    // Without fill the middle stays empty.
    EXPECT_EQ(repeated[50 * kSide + 50], 0xFFFFFFFFu);
    EXPECT_EQ(row(Draw(stripes + " 10 20 / 10px 0 stretch")), "rb");
    // Twice as thick, twice as long: one whole copy and halves beside it; rounded to two.
    EXPECT_EQ(row(Draw(stripes + " 10 20 / 20px 0 repeat")), "brbr");
    EXPECT_EQ(row(Draw(stripes + " 10 20 / 20px 0 round")), "rbrb");
}

}  // namespace
}  // namespace qorvex::pages
