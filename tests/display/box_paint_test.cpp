#include "display/recording.h"

namespace qorvex::test {
namespace {

using layout::LayoutHandle;

using BoxPaintTest = RecordTest;

constexpr const char* kBox = "position: absolute; left: 100px; top: 50px; width: 60px; height: 40px; ";

TEST_F(BoxPaintTest, BackgroundsAndBorders) {
    LayoutHandle* box = page.Add(page.body, kBox);
    const css::LaidOutStyle plain = *box->data().style;
    struct Case {
        const char* style;
        const char* records;
    };
    const Case cases[] = {
        {"", ""},
        {"background-color: red", "FillRect 100 50 60 40 #ff0000ff\n"},
        {"background-color: transparent; border-top-left-radius: 5px", ""},
        {"background-color: red; visibility: hidden", ""},
        {"background-color: red; border: 1px solid blue",
         "FillRect 100 50 60 40 #ff0000ff\nStrokeRect 100.5 50.5 59 39 #0000ffff\n"},
        // Inset below borders wider than a pixel.
        {"background-color: red; border: 4px solid blue",
         "FillRect 101 51 58 38 #ff0000ff\nStrokeRect 102 52 56 36 #0000ffff\n"},
        // Takes room, paints nothing, hides nothing.
        {"background-color: red; border: 4px dashed blue", "FillRect 100 50 60 40 #ff0000ff\n"},
        {"border-top: 4px solid blue; border-left: 2px solid red",
         "FillQuad 100 50 102 50 102 90 100 90 #ff0000ff\nFillQuad 100 50 102 54 160 54 160 50 #0000ffff\n"},
        // A translucent side must not lie on its neighbour.
        {"border-top: 4px solid #0000ff80; border-left: 2px solid red",
         "FillQuad 100 50 102 54 102 90 100 90 #ff0000ff\nFillQuad 100 50 102 54 160 54 160 50 #0000ff80\n"},
        // Of one colour: no joint that shows.
        {"border-top: 4px solid blue; border-left: 2px solid blue",
         "FillQuad 100 54 102 54 102 90 100 90 #0000ffff\nFillQuad 100 50 100 54 160 54 160 50 #0000ffff\n"},
        {"background-color: red; border-radius: 8px",
         "FillRoundedRect 100 50 60 40 r 8 8 8 8 8 8 8 8 #ff0000ff\n"},
        // Too large: all radii shrink by the same factor.
        {"background-color: red; border-radius: 80px 40px 40px 0",
         "FillRoundedRect 100 50 60 40 r 40 40 20 20 20 20 0 0 #ff0000ff\n"},
        {"background-color: red; border-radius: 50%", "FillEllipse 130 70 30 20 #ff0000ff\n"},
        {"background-color: red; width: 40px; border-radius: 50%", "FillEllipse 120 70 20 20 #ff0000ff\n"},
        {"border: 2px solid blue; border-radius: 8px",
         "StrokeRoundedRect 101 51 58 38 r 7 7 7 7 7 7 7 7 #0000ffff\n"},
        // No stroke has outer corners that are round and inner ones that are not.
        {"border: 16px solid blue; border-radius: 8px",
         "PushState 2\nMultiplyTransform 1 0 0 1 100 50\nFillPath #0000ffff\nPopState 0\n"},
        {"border: 2px solid blue; border-radius: 50%", "StrokeEllipse 130 70 29 19 #0000ffff\n"},
        {"border: 2px solid blue; border-top-width: 6px; border-radius: 8px",
         "PushState 2\nMultiplyTransform 1 0 0 1 100 50\nFillPath #0000ffff\nPopState 0\n"},
    };
    for (const Case& c : cases) {
        page.Restore(box, plain);
        page.Change(box, c.style);
        std::string records = Join(Frame());
        EXPECT_EQ(records, c.records) << c.style;
    }
    EXPECT_EQ(caches.paths.Size(), 2u);
}

TEST_F(BoxPaintTest, ImagesReachAPixelBelowTheSidesThatHideThem) {
    LayoutHandle* box =
        page.Add(page.body, std::string(kBox) + "background-image: linear-gradient(red, blue)");
    page.Change(box, "border: 4px solid blue");
    EXPECT_EQ(CountOf(Frame(), "ClipRect 103 53 54 34 2"), 1u);
    page.Change(box, "border: 4px solid #0000ff80; border-top: 1px solid blue");
    EXPECT_EQ(CountOf(Frame(), "ClipRect 100 50 60 40 2"), 1u);
}

TEST_F(BoxPaintTest, RoundBordersOfSeveralColoursClipEachSide) {
    LayoutHandle* box = page.Add(page.body, kBox);
    page.Change(box, "border: 4px solid blue; border-left-color: red; border-radius: 10px");
    const auto lines = Frame();
    EXPECT_EQ(CountOf(lines, "ClipQuad"), 4u);
    EXPECT_EQ(CountOf(lines, "StrokeRoundedRect"), 4u);
    EXPECT_EQ(CountOf(lines, "PushState"), CountOf(lines, "PopState"));
}

TEST_F(BoxPaintTest, RoundBordersKeepTheColoursOfSidesThatDoNotMeet) {
    LayoutHandle* box = page.Add(page.body, kBox);
    page.Change(box, "border-top: 2px solid red; border-bottom: 4px solid blue; border-radius: 10px");
    const auto lines = Frame();
    EXPECT_EQ(CountOf(lines, "ClipQuad"), 2u);
    EXPECT_EQ(CountOf(lines, "FillPath #ff0000ff"), 1u);
    EXPECT_EQ(CountOf(lines, "FillPath #0000ffff"), 1u);
}

TEST_F(BoxPaintTest, EqualShadowsShareOneSurface) {
    page.Add(page.body, std::string(kBox) + "box-shadow: 3px 4px 5px 2px black; background-color: white");
    page.Add(page.body,
             std::string(kBox) + "left: 400px; box-shadow: 9px 9px 5px 2px black; background-color: white");
    auto lines = Frame();
    EXPECT_EQ(caches.shadows.Size(), 1u);
    ASSERT_EQ(frame.resourceBuffers.size(), 1u);
    const auto surface = Records(*frame.resourceBuffers[0]);
    EXPECT_EQ(CountOf(surface, "CreateSurface"), 1u);
    EXPECT_EQ(CountOf(surface, "FillRect 5 5 64 44 #000000ff"), 1u);
    EXPECT_EQ(CountOf(surface, "ApplyBlur 5"), 1u);
    EXPECT_EQ(CountOf(lines, "DrawSurface"), 2u);
    // Rendered once: the next frame draws it again without a resource.
    lines = Frame();
    EXPECT_TRUE(frame.resourceBuffers.empty());
    EXPECT_EQ(CountOf(lines, "DrawSurface"), 2u);
}

TEST_F(BoxPaintTest, AFullShadowCacheEvictsTheOldest) {
    caches.shadows.SetCapacity(1);
    page.Add(page.body, std::string(kBox) + "box-shadow: 0 0 5px black");
    page.Add(page.body, std::string(kBox) + "box-shadow: 0 0 6px black");
    Frame();
    EXPECT_EQ(frame.resourceBuffers.size(), 2u);
    EXPECT_EQ(frame.surfacesToFree.size(), 1u);
    Frame();
    EXPECT_EQ(frame.resourceBuffers.size(), 2u);
    EXPECT_EQ(caches.shadows.Size(), 1u);
    caches.shadows.Clear();
    page.Frame();
    page.dirty.Clear();
    EXPECT_EQ(Record().surfacesToFree.size(), 1u);
}

TEST_F(BoxPaintTest, SharpAndInsetShadows) {
    LayoutHandle* box =
        page.Add(page.body, std::string(kBox) + "background-color: white; border: 2px solid red");
    page.Change(box, "box-shadow: 3px 4px 0 1px black");
    auto lines = Frame();
    EXPECT_EQ(lines[0], "FillRect 102 53 62 42 #000000ff");
    // Below a translucent box the shadow is cut out.
    page.Change(box, "background-color: rgba(255, 255, 255, 0.4)");
    lines = Frame();
    EXPECT_EQ(lines[1], "ClipRoundedRect 100 50 60 40 r 0 0 0 0 0 0 0 0 1");
    page.Change(box, "box-shadow: inset 5px 0 0 1px black");
    lines = Frame();
    EXPECT_EQ(CountOf(lines, "ClipRect 102 52 56 36 2"), 1u);
    EXPECT_EQ(CountOf(lines, "FillRect 102 53 6 34 #000000ff"), 1u);
    page.Change(box, "box-shadow: inset 0 0 4px black; border-radius: 5px");
    lines = Frame();
    EXPECT_EQ(CountOf(lines, "DrawSurface"), 1u);
    page.Change(box, "box-shadow: 0 0 99999999px 99999999px red, inset 0 0 99999999px 9999px red");
    Frame();
    EXPECT_TRUE(frame.resourceBuffers.empty());
}

TEST_F(BoxPaintTest, Gradients) {
    LayoutHandle* box = page.Add(page.body, kBox);
    struct Case {
        const char* style;
        const char* record;
        size_t count;
    };
    const Case cases[] = {
        {"background-image: linear-gradient(red, blue)",
         "FillLinearGradient 100 50 60 40 #000000ff 0.5 0 0.5 0.666667", 1},
        {"background-image: linear-gradient(to right, red, blue)",
         "FillLinearGradient 100 50 60 40 #000000ff 0 0.333333 1 0.333333", 1},
        {"background-image: radial-gradient(circle closest-side, red, blue)",
         "FillRadialGradient 100 50 60 40 #000000ff 0.5 0.333333 0.333333 0.333333", 1},
        // A last stop beyond the shape makes it that much larger.
        {"background-image: radial-gradient(circle closest-side, red, blue 200%)",
         "FillRadialGradient 100 50 60 40 #000000ff 0.5 0.333333 0.666667 0.666667", 1},
        {"background-image: linear-gradient(red, blue); background-size: 30px 20px", "FillLinearGradient", 4},
        {"background-image: linear-gradient(red, blue); background-size: 30px 20px; background-repeat: "
         "no-repeat; "
         "background-position-x: right; background-position-y: 50%",
         "FillLinearGradient 130 60 30 20", 1},
        {"background-image: linear-gradient(red, blue), linear-gradient(blue, red); background-repeat: "
         "repeat; "
         "background-size: auto",
         "FillLinearGradient 100 50 60 40", 2},
    };
    for (const Case& c : cases) {
        page.Change(box, c.style);
        EXPECT_EQ(CountOf(Frame(), c.record), c.count) << c.style;
    }
}

}  // namespace
}  // namespace qorvex::test
