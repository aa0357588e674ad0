#include "display/transforms.h"
#include "layout/page_fixture.h"

#include <random>

namespace qorvex::test {
namespace {

using layout::LayoutHandle;
using layout::LayoutNode;
using layout::LayoutWork;
using layout::MakeRect;
using layout::Rect;

using TransformTest = LayoutTest;

Rect Mapped(const LayoutHandle* handle) {
    return layout::MapBounds(handle->node().world.Get(), handle->node().box);
}

void ExpectRect(const Rect& rect, float x, float y, float width, float height) {
    EXPECT_TRUE(layout::Near(rect, MakeRect(x, y, width, height)))
        << rect.x << " " << rect.y << " " << rect.width << " " << rect.height;
}

TEST_F(TransformTest, OperationsApplyInOrderAroundTheOrigin) {
    Page page;
    LayoutHandle* box =
        page.Add(page.body, "position: absolute; left: 100px; top: 50px; width: 40px; height: 20px");
    struct Case {
        const char* style;
        float x, y, width, height;
    };
    const Case cases[] = {
        {"transform: translateX(50%)", 120, 50, 40, 20},
        {"transform: translate(10px, 50%)", 110, 60, 40, 20},
        {"transform: rotate(90deg)", 110, 40, 20, 40},
        {"transform: scale(2)", 80, 40, 80, 40},
        {"transform: scale(2); transform-origin: left top", 100, 50, 80, 40},
        {"transform: translateX(10px) scale(2); transform-origin: 0 0", 110, 50, 80, 40},
        {"transform: scale(2) translateX(10px); transform-origin: 0 0", 120, 50, 80, 40},
        {"transform: skewX(45deg); transform-origin: 0 0", 100, 50, 60, 20},
        {"transform: matrix(1, 0, 0, 1, 7, 8)", 107, 58, 40, 20},
        {"transform: rotateY(60deg)", 110, 50, 20, 20},
        {"transform: rotate3d(0, 0, 0, 40deg)", 100, 50, 40, 20},
    };
    for (const Case& c : cases) {
        page.Change(box, "transform-origin: 50% 50%");
        page.Change(box, c.style);
        page.Frame();
        SCOPED_TRACE(c.style);
        ExpectRect(Mapped(box), c.x, c.y, c.width, c.height);
    }
    page.Change(box, "transform: none");
    page.Frame(LayoutWork::Transforms);
    ExpectRect(Mapped(box), 100, 50, 40, 20);
    EXPECT_FALSE(box->node().Local());
}

TEST_F(TransformTest, PerspectiveAppliesToChildrenAndFlatteningDropsDepth) {
    Page page;
    LayoutHandle* scene = page.Add(page.body, "width: 100px; height: 100px; perspective: 100px");
    LayoutHandle* near = page.Add(scene, "width: 100px; height: 100px; transform: translateZ(50px)");
    LayoutHandle* inner = page.Add(near, "width: 100px; height: 100px; transform: translateZ(25px)");
    page.Frame();
    ExpectRect(Mapped(scene), 0, 0, 100, 100);
    ExpectRect(Mapped(near), -50, -50, 200, 200);
    // Flattened: the inner depth does not add up.
    ExpectRect(Mapped(inner), -50, -50, 200, 200);
    page.Change(near, "transform-style: preserve-3d");
    page.Frame(LayoutWork::Transforms);
    ExpectRect(Mapped(inner), -150, -150, 400, 400);
    // At and behind the eye there is nothing, or a part, but nothing broken.
    for (const char* style : {"transform: translateZ(100px)", "transform: translateZ(300px)",
                              "transform: rotateX(80deg) translateZ(90px)", "transform: scale(0)",
                              "transform: translateX(100000000000000000000000000000000000000px)"}) {
        page.Change(near, style);
        page.Frame(LayoutWork::Transforms);
        EXPECT_TRUE(layout::IsFinite(near->node().visualAabb)) << style;
    }
    page.Change(near, "transform: scale(0)");
    page.Frame(LayoutWork::Transforms);
    EXPECT_TRUE(layout::IsEmpty(near->node().PaintBounds()));
}

TEST_F(TransformTest, VisualBoundsIncludeShadowsAndFilters) {
    Page page;
    LayoutHandle* box =
        page.Add(page.body, "position: absolute; left: 100px; top: 100px; width: 50px; height: 50px");
    page.Change(box, "box-shadow: 10px 0 5px 2px black, inset 0 0 500px red");
    page.Frame();
    // Right: offset 10, spread 2, blur 5, and a pixel for antialiasing.
    ExpectRect(box->node().visualAabb, 99, 92, 69, 66);
    page.Change(box, "box-shadow: none; filter: blur(10px)");
    page.Frame();
    EXPECT_GE(layout::Right(box->node().visualAabb), 150 + 32);
    page.Change(box, "filter: none");
    page.Frame(LayoutWork::VisualStyle);
    ExpectRect(box->node().visualAabb, 99, 99, 52, 52);
}

TEST_F(TransformTest, SnappingMovesEdgesToPixels) {
    Page page;
    LayoutHandle* box =
        page.Add(page.body, "position: absolute; left: 1.5px; top: 0.4px; width: 10.2px; height: 3px");
    page.Frame();
    ExpectRect(dsp::PaintBox(box->node(), true), 2, 0, 10, 3);
    ExpectRect(dsp::PaintBox(box->node(), false), 1.5f, 0.4f, 10.2f, 3);
}

TEST_F(TransformTest, DirtyAreasAreOldAndNewBoundsWithinClips) {
    Page page;
    LayoutHandle* clip = page.Add(page.body, "overflow: hidden; width: 100px; height: 100px");
    LayoutHandle* box =
        page.Add(clip, "position: absolute; left: 10px; top: 10px; width: 20px; height: 20px");
    page.Settle();
    page.Change(box, "left: 300px");
    page.Frame();
    // Where it was shows; where it went is clipped away.
    EXPECT_TRUE(layout::Contains(page.dirty.Bounds(), MakeRect(10, 10, 20, 20)));
    EXPECT_LE(layout::Right(page.dirty.Bounds()), 100);
    page.dirty.Clear();
    page.Frame();
    EXPECT_TRUE(page.dirty.Empty());
    page.Change(box, "left: 50px; background-color: red");
    page.Settle();
    page.Change(box, "background-color: blue");
    page.Frame(LayoutWork::VisualStyle);
    EXPECT_TRUE(layout::Contains(page.dirty.Bounds(), MakeRect(50, 10, 20, 20)));
    EXPECT_LE(page.dirty.Bounds().width, 24);
}

TEST_F(TransformTest, ChangesBelowAFilterDirtyAllOfIt) {
    Page page;
    LayoutHandle* blurred = page.Add(page.body, "width: 200px; height: 100px; filter: blur(8px)");
    LayoutHandle* box = page.Add(blurred, "width: 10px; height: 10px; background-color: red");
    page.Settle();
    page.Change(box, "background-color: green");
    page.Frame(LayoutWork::VisualStyle);
    EXPECT_TRUE(layout::Contains(page.dirty.Bounds(), MakeRect(0, 0, 200, 100)));
}

TEST_F(TransformTest, StackingContexts) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 10px; height: 10px");
    LayoutHandle* flex = page.Add(page.body, "display: flex");
    LayoutHandle* item = page.Add(flex, "z-index: 1");
    struct Case {
        const char* style;
        bool context;
        int z;
    };
    const Case cases[] = {
        {"z-index: 1", false, 0},
        {"z-index: 3; position: relative", true, 3},
        {"opacity: 0.5", true, 0},
        {"transform: translateX(0)", true, 0},
        {"perspective: 10px", true, 0},
        {"filter: blur(0)", true, 0},
        {"isolation: isolate", true, 0},
        {"mix-blend-mode: multiply", true, 0},
        {"clip-path: circle(5px)", true, 0},
        {"qor-composition-id: a", true, 0},
        {"overflow: hidden", false, 0},
        {"position: relative", false, 0},
    };
    const css::LaidOutStyle plain = *box->data().style;
    for (const Case& c : cases) {
        page.Restore(box, plain);
        page.Change(box, c.style);
        page.Frame();
        EXPECT_EQ(box->data().establishesStackingContext, c.context) << c.style;
        EXPECT_EQ(box->data().AsBox().zIndex, c.z) << c.style;
    }
    EXPECT_TRUE(item->data().establishesStackingContext);
    EXPECT_EQ(item->data().AsBox().zIndex, 1);
}

// --- The incremental passes against the full ones.

struct Twin {
    Page fast;
    Page slow;
    std::vector<LayoutHandle*> fastNodes;
    std::vector<LayoutHandle*> slowNodes;

    Twin() {
        slow.everything = true;
        fastNodes.push_back(fast.body);
        slowNodes.push_back(slow.body);
    }
    void Add(size_t parent, uint32_t index, std::string_view style) {
        fastNodes.push_back(fast.Insert(fastNodes[parent], index, style));
        slowNodes.push_back(slow.Insert(slowNodes[parent], index, style));
    }
    void Change(size_t node, std::string_view style) {
        fast.Change(fastNodes[node], style);
        slow.Change(slowNodes[node], style);
    }
    void Remove(size_t node) {
        fast.tree.Remove(*fastNodes[node], nullptr);
        slow.tree.Remove(*slowNodes[node], nullptr);
    }
    // A node that was removed comes back somewhere else, alone.
    void Attach(size_t node, size_t parent, uint32_t index) {
        fast.tree.Attach(*fastNodes[node], *fastNodes[parent], index);
        slow.tree.Attach(*slowNodes[node], *slowNodes[parent], index);
    }
    void Frame(LayoutWork work) {
        fast.Frame(work);
        slow.Frame(work);
    }
};

std::string Describe(const LayoutHandle* handle) {
    const LayoutNode& n = handle->node();
    char text[512];
    auto r = [](const Rect& rect) {
        char part[96];
        std::snprintf(part, sizeof(part), "[%g %g %g %g]", rect.x, rect.y, rect.width, rect.height);
        return std::string(part);
    };
    std::snprintf(text, sizeof(text), " scroll %g %g %g %g z %d %d world %g %g %g %g %g %g", n.Scroll().x,
                  n.Scroll().y, n.ScrollSize().width, n.ScrollSize().height, n.ZIndex(),
                  n.establishesStackingContext, n.world.Get().m[0], n.world.Get().m[1], n.world.Get().m[4],
                  n.world.Get().m[5], n.world.Get().m[12], n.world.Get().m[13]);
    return BoxOf(handle) + r(n.box) + r(n.AsBox().aabb) + r(n.PaintBounds()) + r(n.visualAabb) + text;
}

TEST_F(TransformTest, IncrementalPassesEqualFullOnesUnderRandomChanges) {
    const char* styles[] = {
        "width: 40px; height: 30px",
        "width: auto; height: auto",
        "flex: 1",
        "flex: none",
        "display: flex",
        "display: block",
        "padding: 3px",
        "margin: 4px",
        "border: 2px solid red",
        "position: relative; left: 5px",
        "position: absolute; left: 10%; top: 20%; right: auto; bottom: auto",
        "position: absolute; left: auto; top: auto; right: 5px; bottom: 10%",
        "position: fixed; left: 20px; top: 3px",
        "position: fixed; left: auto; right: 7px; top: auto; bottom: 9px",
        "position: static",
        "transform: rotate(10deg)",
        "transform: translateX(20px) scale(1.5)",
        "transform: none",
        "perspective: 300px",
        "perspective: none",
        "overflow: hidden",
        "overflow: visible",
        "opacity: 0.5",
        "opacity: 1",
        "z-index: 2",
        "z-index: auto",
        "box-shadow: 3px 3px 4px black",
        "box-shadow: none",
        "filter: blur(3px)",
        "filter: none",
        "border-top-left-radius: 10%",
        "background-color: blue",
    };
    std::mt19937 random(20);
    Twin twin;
    std::vector<bool> gone(1, false);
    auto pick = [&](size_t count) { return static_cast<size_t>(random() % count); };
    bool simple = false;
    for (int step = 0; step < 400; ++step) {
        const size_t edits = 1 + pick(4);
        for (size_t edit = 0; edit < edits; ++edit) {
            const size_t node = pick(twin.fastNodes.size());
            if (gone[node] || !twin.fastNodes[node]->data().inTree) {
                const size_t parent = pick(twin.fastNodes.size());
                if (!twin.fastNodes[parent]->data().inTree || pick(3) != 0) continue;
                twin.Attach(node, parent, 0);
                gone[node] = false;
                continue;
            }
            const uint32_t children = twin.fastNodes[node]->data().Children().size();
            switch (pick(twin.fastNodes.size() < 60 ? 3 : 8)) {
                case 0:
                case 1: {
                    const uint32_t index = static_cast<uint32_t>(pick(children + 1));
                    twin.Add(node, index, styles[pick(std::size(styles))]);
                    gone.push_back(false);
                    break;
                }
                case 7:
                    if (node == 0) break;
                    twin.Remove(node);
                    gone[node] = true;
                    break;
                case 6: {
                    const layout::ScrollPosition scroll{static_cast<float>(pick(30)),
                                                        static_cast<float>(pick(30))};
                    twin.fast.tree.SetScroll(*twin.fastNodes[node], scroll);
                    twin.slow.tree.SetScroll(*twin.slowNodes[node], scroll);
                    break;
                }
                default:
                    twin.Change(node, styles[pick(std::size(styles))]);
                    break;
            }
        }
        // Now and then the other engine takes over, and Yoga's nodes come and go.
        // That engine leaves the boxes around a changed one alone, and so does not end where a full layout
        // does.
        if (pick(25) == 0) twin.Change(0, (simple = !simple) ? "display: simple" : "display: block");
        twin.Frame(LayoutWork::Layout);
        for (size_t i = 0; i < twin.fastNodes.size() && !simple; ++i) {
            if (!twin.fastNodes[i]->data().inTree) continue;
            ASSERT_EQ(Describe(twin.fastNodes[i]), Describe(twin.slowNodes[i]))
                << "step " << step << " node " << i;
        }
    }
}

TEST_F(TransformTest, OneOfManySiblingsCostsItsGroup) {
    Page page;
    std::vector<LayoutHandle*> boxes;
    for (int i = 0; i < 5000; ++i)
        boxes.push_back(page.Add(page.body, "position: absolute; width: 5px; height: 5px"));
    page.Settle();
    page.Change(boxes[2345], "transform: translateX(3px)");
    page.Frame(LayoutWork::Transforms);
    EXPECT_LE(page.Counters().transformed, 6u);
    EXPECT_EQ(page.Counters().restyled, 1u);
    EXPECT_LE(page.dirty.Bounds().width, 12);
}

}  // namespace
}  // namespace qorvex::test
