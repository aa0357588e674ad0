#include "display/recording.h"

#include <random>

namespace qorvex::test {
namespace {

using layout::LayoutHandle;
using layout::LayoutWork;

TEST_F(RecordTest, EmptyDirtyRegionRecordsNothing) {
    page.Add(page.body, "height: 10px; background-color: red");
    page.Settle();
    EXPECT_TRUE(Record().Empty());
    page.Change(page.body, "background-color: blue");
    page.Frame(LayoutWork::VisualStyle);
    EXPECT_FALSE(Record().Empty());
    EXPECT_TRUE(Record().Empty());
}

TEST_F(RecordTest, OneChangeRecordsOneElement) {
    std::vector<LayoutHandle*> boxes;
    for (int i = 0; i < 400; ++i) {
        char style[128];
        std::snprintf(style, sizeof(style),
                      "position: absolute; width: 10px; height: 10px; left: %dpx; top: %dpx; %s", i % 20 * 40,
                      i / 20 * 24, "background-color: red");
        boxes.push_back(page.Add(page.body, style));
    }
    page.Frame();
    Record();
    page.Change(boxes[217], "background-color: blue");
    page.Frame(LayoutWork::VisualStyle);
    const dsp::FrameRecord record = Record();
    ASSERT_EQ(record.buffers.size(), 1u);
    EXPECT_TRUE(record.isPartial);
    EXPECT_EQ(CountOf(Records(*record.buffers[0]), "FillRect"), 1u);
    // The box, and the body and root that lie below it.
    EXPECT_LE(page.Counters().recorded, 3u);
    // Groups of siblings out of sight are not even looked at.
    EXPECT_LE(page.Counters().visited, 70u);
}

TEST_F(RecordTest, ScissorsAreTheDirtyRectangles) {
    LayoutHandle* a =
        page.Add(page.body, "position: absolute; width: 10px; height: 10px; left: 100px; top: 100px");
    LayoutHandle* b =
        page.Add(page.body, "position: absolute; width: 10px; height: 10px; left: 700px; top: 400px");
    page.Settle();
    page.Change(a, "background-color: red");
    page.Change(b, "background-color: red");
    page.Frame(LayoutWork::VisualStyle);
    const auto lines = Records(*Record().buffers[0]);
    EXPECT_EQ(CountOf(lines, "BeginScissor"), 1u);
    EXPECT_EQ(CountOf(lines, "ClipRect"), 2u);
    EXPECT_EQ(CountOf(lines, "ClearRect"), 2u);
    EXPECT_EQ(lines.back(), "PopState 0");
    scale = 2;
    page.Change(a, "background-color: blue");
    page.Frame(LayoutWork::VisualStyle);
    const auto scaled = Records(*Record().buffers[0]);
    EXPECT_EQ(scaled[0], "MultiplyTransform 2 0 0 2 0 0");
    EXPECT_EQ(CountOf(scaled, "ClipQuad"), 1u);
}

// What the last frame left must not show through, and need not be cleared where the canvas hides it.
TEST_F(RecordTest, ClearsOnlyWhatTheCanvasDoesNotHide) {
    page.Settle();
    const auto clears = [this](const char* root_style) {
        const std::string plain =
            "background-color: red; opacity: 1; visibility: visible; transform: none;"
            "clip-path: none; mix-blend-mode: normal;";
        page.Change(page.root, plain + root_style);
        page.Frame();
        page.dirty.Add(layout::MakeRect(0, 0, 1000, 500));
        return CountOf(Records(*Record().buffers[0]), "ClearRect");
    };
    EXPECT_EQ(clears(""), 0u);
    for (const char* style : {"background-color: transparent", "background-color: rgba(255, 0, 0, 0.9)",
                              "opacity: 0.5", "visibility: hidden", "transform: scale(0.5)",
                              "clip-path: circle(40px)", "mix-blend-mode: multiply"}) {
        EXPECT_EQ(clears(style), 1u) << style;
    }
    scale = 1.5f;
    EXPECT_EQ(clears(""), 1u);
}

TEST_F(RecordTest, LayersOpenOnlyWhereAsked) {
    LayoutHandle* box = page.Add(page.body, "width: 10px; height: 10px; background-color: red");
    page.Add(box, "width: 5px; height: 5px; background-color: blue");
    const css::LaidOutStyle plain = *box->data().style;
    struct Case {
        const char* style;
        const char* layer;
        size_t count;
        size_t fills;
    };
    const Case cases[] = {
        {"", "BeginLayer", 0, 2},
        {"transform: translateX(1px)", "BeginLayer", 0, 2},
        {"opacity: 0.5", "BeginLayer 1024 #80808080", 1, 2},
        {"opacity: 0", "BeginLayer", 0, 0},
        {"filter: blur(0)", "BeginLayerWithEffects", 1, 2},
        {"mix-blend-mode: multiply", "BeginLayerWithEffects", 1, 2},
        {"isolation: isolate", "BeginLayer 1024", 1, 2},
        {"qor-composition-id: a", "Annotate", 5, 2},
        {"clip-path: circle(0)", "FillRect", 0, 0},
        {"clip-path: circle(5px)", "ClipEllipse 5 5 5 5 2", 1, 2},
        {"clip-path: inset(1px 2px 3px 4px)", "ClipRect 4 1 4 6 2", 1, 2},
        {"clip-path: polygon(0 0, 10px 0, 0 10px)", "ClipPath", 1, 2},
        {"mask-image: url(a.png)", "FillRect", 0, 0},
        {"mask-image: linear-gradient(red, transparent)", "BeginLayer", 2, 2},
    };
    for (const Case& c : cases) {
        page.Restore(box, plain);
        page.Change(box, c.style);
        const auto lines = Frame();
        EXPECT_EQ(CountOf(lines, c.layer), c.count) << c.style;
        EXPECT_EQ(CountOf(lines, "FillRect"), c.fills) << c.style;
        EXPECT_EQ(CountOf(lines, "PushState"), CountOf(lines, "PopState")) << c.style;
        EXPECT_EQ(CountOf(lines, "BeginLayer"), CountOf(lines, "EndLayer")) << c.style;
    }
}

TEST_F(RecordTest, ClipsAndScrollingWrapTheChildren) {
    LayoutHandle* box = page.Add(page.body,
                                 "overflow: hidden; width: 100px; height: 50px; border: 5px solid red; "
                                 "border-radius: 10px");
    page.Add(box, "height: 300px; background-color: blue");
    page.Settle();
    page.tree.SetScroll(*box, {0, 20});
    EXPECT_EQ(Join(Frame()),
              "StrokeRoundedRect 2.5 2.5 95 45 r 7.5 7.5 7.5 7.5 7.5 7.5 7.5 7.5 #ff0000ff\n"
              "PushState 3\n"
              "ClipRoundedRect 5 5 90 40 r 5 5 5 5 5 5 5 5 2\n"
              "MultiplyTransform 1 0 0 1 0 -20\n"
              "FillRect 5 5 90 300 #0000ffff\n"
              "PopState 0\n");
}

TEST_F(RecordTest, TransformsNestAsTheWorldMatrixDoes) {
    LayoutHandle* outer = page.Add(page.body, "width: 100px; height: 100px; perspective: 200px");
    LayoutHandle* inner = page.Add(outer,
                                   "width: 50px; height: 50px; background-color: red; "
                                   "transform: rotateY(30deg); transform-style: preserve-3d");
    page.Add(inner, "width: 50px; height: 50px; background-color: blue; transform: translateZ(10px)");
    const auto lines = Frame();
    EXPECT_EQ(CountOf(lines, "MultiplyTransform"), 3u);
    EXPECT_EQ(CountOf(lines, "FlattenTransform"), 0u);
    page.Change(inner, "transform-style: flat");
    EXPECT_EQ(CountOf(Frame(), "FlattenTransform"), 1u);
}

TEST_F(RecordTest, RootBackgroundCoversTheView) {
    page.Change(page.root, "background-color: red");
    EXPECT_EQ(Join(Frame()), "FillRect 0 0 1000 500 #ff0000ff\n");
}

TEST_F(RecordTest, PaintRectanglesFadeFromFullFrames) {
    highlights = true;
    LayoutHandle* box = page.Add(page.body, "width: 10px; height: 10px");
    page.Settle();
    page.Change(box, "background-color: red");
    page.Frame(LayoutWork::VisualStyle);
    const dsp::FrameRecord first = Record();
    EXPECT_FALSE(first.isPartial);
    EXPECT_EQ(CountOf(Records(*first.buffers[0]), "StrokeRect"), 1u);
    page.Settle();
    EXPECT_FALSE(Record().Empty());
    EXPECT_TRUE(caches.highlighted.Empty());
    EXPECT_TRUE(Record().Empty());
}

// What a partial frame leaves out lies outside of its scissors: every draw of the full frame that touches a
// dirty rectangle is in the partial one too.
TEST_F(RecordTest, PartialFramesHoldAllThatTouchesTheirRectangles) {
    std::mt19937 random(7);
    std::vector<LayoutHandle*> boxes{page.body};
    auto number = [&](uint32_t below) { return static_cast<int>(random() % below); };
    for (int i = 0; i < 120; ++i) {
        char style[192];
        std::snprintf(
            style, sizeof(style),
            "position: %s; width: %dpx; height: %dpx; left: %dpx; top: %dpx; background-color: red; %s",
            number(2) ? "absolute" : "relative", 5 + number(200), 5 + number(100), number(300), number(200),
            number(4) == 0   ? "overflow: hidden"
            : number(4) == 0 ? "opacity: 0.5"
                             : "");
        boxes.push_back(
            page.Add(boxes[static_cast<size_t>(number(static_cast<uint32_t>(boxes.size())))], style));
    }
    page.Frame();
    Record();
    for (int step = 0; step < 60; ++step) {
        char style[64];
        std::snprintf(style, sizeof(style), "left: %dpx; top: %dpx", number(400), number(300));
        page.Change(boxes[1 + static_cast<size_t>(number(119))], style);
        page.Frame();
        const dsp::FrameRecord part = Record();
        page.dirty.Add(layout::MakeRect(0, 0, 1000, 500));
        const dsp::FrameRecord full = Record();
        if (part.buffers.empty()) continue;
        const auto partLines = Records(*part.buffers[0]);
        const auto fullLines = Records(*full.buffers[0]);
        EXPECT_LE(partLines.size(), fullLines.size() + 14);
        for (const std::string& line : fullLines) {
            layout::Rect r{};
            if (std::sscanf(line.c_str(), "FillRect %f %f %f %f", &r.x, &r.y, &r.width, &r.height) != 4)
                continue;
            bool touches = false;
            for (const layout::Rect& rect : part.dirtyRects)
                touches = touches || layout::Intersects(rect, r);
            const bool present = std::find(partLines.begin(), partLines.end(), line) != partLines.end();
            // A draw may touch a rectangle only where its clips hide it; then it may be missing.
            if (touches && !present) {
                const auto hidden = [&] {
                    for (const LayoutHandle* box : boxes) {
                        const layout::LayoutNode& node = box->node();
                        if (!layout::Near(dsp::PaintBox(node, true), r)) continue;
                        const layout::Rect seen = dsp::ClipToAncestors(node);
                        for (const layout::Rect& rect : part.dirtyRects) {
                            if (layout::Intersects(rect, seen)) return false;
                        }
                    }
                    return true;
                };
                EXPECT_TRUE(hidden()) << "step " << step << ": " << line;
            }
        }
    }
}

}  // namespace
}  // namespace qorvex::test
