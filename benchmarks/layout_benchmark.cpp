// Boxes of a whole page against bare Yoga on the same tree, and one moving box in large and small pages.
#include <benchmark/benchmark.h>
#include <yoga/Yoga.h>

#include <deque>
#include <vector>

#include "css/values/layout_style_refs.h"
#include "display/box.h"
#include "display/page_elements.h"
#include "layout/layout_tree.h"
#include "layout/perform_layout.h"

namespace {

using namespace qorvex;
using css::Extent;
using css::LayoutStyle;
using layout::LayoutHandle;

constexpr uint32_t kFan = 10;
constexpr uint32_t kViewWidth = 1280;
constexpr uint32_t kViewHeight = 720;

template <typename F>
css::LayoutStyleRefs MakeStyle(F&& write) {
    css::LayoutStyleRefs style = css::DefaultStyles();
    write(style.Mutable<LayoutStyle>());
    return style;
}

// One shared style a kind of box, as style solving gives to boxes of one class.
css::LayoutStyleRefs NestedStyle(bool leaf, bool row, float padding) {
    return MakeStyle([&](LayoutStyle& style) {
        style.display = css::CSSDisplay::Flex;
        style.flexDirection = row ? css::CSSFlexDirection::Row : css::CSSFlexDirection::Column;
        style.flex = {false, true, true, css::FlexBasisKind::Auto, 1, 1, {}};
        style.paddingLeft = style.paddingTop = style.paddingRight = style.paddingBottom =
            css::Length::Pixels(padding);
        if (!leaf) return;
        style.width = Extent::Pixels(9);
        style.height = Extent::Pixels(7);
    });
}

css::LayoutStyleRefs AbsoluteStyle(float left) {
    return MakeStyle([&](LayoutStyle& style) {
        style.position = css::CSSPosition::Absolute;
        style.left = Extent::Pixels(left);
        style.top = Extent::Pixels(30);
        style.width = Extent::Pixels(20);
        style.height = Extent::Pixels(10);
    });
}

class DefaultStylesScope {
  public:
    DefaultStylesScope() { css::CreateDefaultStyles(); }
    ~DefaultStylesScope() { css::DestroyDefaultStyles(); }
};

// A layout tree without a document, and the layout side of its frames.
class LayoutPage {
  public:
    explicit LayoutPage(css::CSSDisplay display)
        : root_(tree_.CreateRoot({css::DefaultStyles(), MakeRef<dsp::DisplayHTML>(), nullptr, {}, false})),
          display_(display) {
        body_ = Add(*root_, MakeStyle([&](LayoutStyle& style) { style.display = display; }));
    }

    LayoutHandle* Add(LayoutHandle& parent, const css::LayoutStyleRefs& style) {
        own_styles_.push_back(style);
        return tree_
            .AddChild(parent, parent.data().Children().size(),
                      {own_styles_.back(), MakeRef<dsp::Box>(), nullptr, {}, false})
            .get();
    }
    // Every box holds ten others, rows and columns in turn.
    void AddNested(uint32_t count) {
        levels_.push_back({body_, 0});
        for (uint32_t parent = 0; boxes_.size() < count; ++parent) {
            const auto [handle, depth] = levels_[parent];
            for (uint32_t i = 0; i < kFan && boxes_.size() < count; ++i) {
                const bool leaf = levels_.size() * kFan > count;
                boxes_.push_back({Add(*handle, NestedStyle(leaf, depth % 2 == 0, 1)), leaf, depth % 2 == 0});
                levels_.push_back({boxes_.back().handle, depth + 1});
            }
        }
    }
    LayoutHandle& AddAbsolute(LayoutHandle& parent) { return *Add(parent, AbsoluteStyle(0)); }
    void Change(LayoutHandle& handle, const css::LayoutStyleRefs& style) {
        auto& own = const_cast<css::LaidOutStyle&>(*handle.data().style);
        own = style;
        own.written = {};
        own.written.Add(css::StyleGroup::Layout);
        tree_.UpdateStyle(handle, own);
    }
    void Commit() {
        update_ = MakeRef<layout::LayoutUpdateData>();
        update_->bodyDisplay = display_;
        tree_.Commit(*update_, nullptr, nullptr);
    }
    void LayOut() {
        layout::LayoutPass pass{*update_, tree_.Root(), kViewWidth, kViewHeight, dirty_};
        layout::PerformLayout(pass);
        dirty_.Clear();
    }
    void Frame() {
        Commit();
        LayOut();
        layout::SyncTrees(*update_);
    }

    struct Nested {
        LayoutHandle* handle;
        bool leaf;
        bool row;
    };
    const std::vector<Nested>& boxes() const { return boxes_; }
    LayoutHandle& body() { return *body_; }
    LayoutHandle& root() { return *root_; }
    const layout::WorkCounters& counters() const { return update_->counters; }

  private:
    struct Level {
        LayoutHandle* handle;
        uint32_t depth;
    };
    const DefaultStylesScope styles_;
    std::deque<css::LayoutStyleRefs> own_styles_;  // of the handles
    layout::LayoutTree tree_;
    layout::HandlePtr root_;
    css::CSSDisplay display_;
    LayoutHandle* body_ = nullptr;
    std::vector<Nested> boxes_;
    std::vector<Level> levels_;
    dsp::DirtyRegion dirty_;
    layout::LayoutUpdatePtr update_;
};

// Bare Yoga with the tree and the styles that the engine gave to its own nodes.
class YogaTree {
  public:
    explicit YogaTree(LayoutHandle& root) : config_(YGConfigNew()) {
        YGConfigSetPointScaleFactor(config_, 0);
        root_ = Copy(root);
    }
    ~YogaTree() {
        YGNodeFreeRecursive(root_);
        YGConfigFree(config_);
    }
    YogaTree(const YogaTree&) = delete;
    YogaTree& operator=(const YogaTree&) = delete;

    // In the order of a walk from the root, each parent before its children.
    const std::vector<YGNodeRef>& nodes() const { return nodes_; }
    YGNodeRef NodeOf(const LayoutHandle& handle) const {
        for (const YGNodeRef node : nodes_) {
            if (YGNodeGetContext(node) == &handle) return node;
        }
        return nullptr;
    }
    void Calculate() { YGNodeCalculateLayout(root_, kViewWidth, kViewHeight, YGDirectionLTR); }

  private:
    YGNodeRef Copy(LayoutHandle& handle) {
        const YGNodeRef node = YGNodeNewWithConfig(config_);
        YGNodeSetContext(node, &handle);
        YGNodeCopyStyle(node, handle.node().flex);
        nodes_.push_back(node);
        uint32_t index = 0;
        for (const layout::HandlePtr& child : handle.node().Children())
            YGNodeInsertChild(node, Copy(*child), index++);
        return node;
    }

    YGConfigRef config_;
    YGNodeRef root_;
    std::vector<YGNodeRef> nodes_;
};

// --- All boxes: the padding of each changes, so that nothing in any cache holds.

constexpr float kPaddings[] = {1, 2};

void LayoutFull(benchmark::State& state, uint32_t count) {
    LayoutPage page(css::CSSDisplay::Block);
    page.AddNested(count);
    page.Frame();
    css::LayoutStyleRefs styles[2][2][2];
    for (int i = 0; i < 8; ++i)
        styles[i & 1][i >> 1 & 1][i >> 2] = NestedStyle(i >> 1 & 1, i >> 2, kPaddings[i & 1]);
    uint32_t turn = 0;
    for (auto _ : state) {
        state.PauseTiming();
        ++turn;
        for (const LayoutPage::Nested& box : page.boxes())
            page.Change(*box.handle, styles[turn & 1][box.leaf][box.row]);
        page.Commit();
        state.ResumeTiming();
        page.LayOut();
    }
    if (page.counters().synced < count || page.counters().laidOut < count)
        state.SkipWithError("less was laid out");
    state.counters["items"] = count;
    state.counters["target"] = 1.4;
}

void LayoutFullBaseline(benchmark::State& state, uint32_t count) {
    LayoutPage page(css::CSSDisplay::Block);
    page.AddNested(count);
    page.Frame();
    YogaTree yoga(page.root());
    yoga.Calculate();
    uint32_t turn = 0;
    for (auto _ : state) {
        ++turn;
        const float padding = kPaddings[turn & 1];
        for (size_t i = 2; i < yoga.nodes().size(); ++i) {
            for (const YGEdge edge : {YGEdgeLeft, YGEdgeTop, YGEdgeRight, YGEdgeBottom})
                YGNodeStyleSetPadding(yoga.nodes()[i], edge, padding);
        }
        yoga.Calculate();
    }
    state.counters["items"] = count;
}
BENCHMARK_CAPTURE(LayoutFull, small, 1000)->Name("layout_full_1000");
BENCHMARK_CAPTURE(LayoutFullBaseline, small, 1000)->Name("layout_full_1000_baseline");
BENCHMARK_CAPTURE(LayoutFull, large, 10000)->Name("layout_full_10000");
BENCHMARK_CAPTURE(LayoutFullBaseline, large, 10000)->Name("layout_full_10000_baseline");

// --- One absolute box moves: from the style's change to the numbers that scripts read.

void MoveOne(benchmark::State& state, LayoutPage& page, LayoutHandle& box) {
    const css::LayoutStyleRefs places[] = {AbsoluteStyle(40), AbsoluteStyle(90)};
    uint32_t turn = 0;
    page.Frame();
    for (auto _ : state) {
        page.Change(box, places[++turn & 1]);
        page.Frame();
    }
    if (box.data().result.left != (turn & 1 ? 90 : 40)) state.SkipWithError("the box did not move");
    state.counters["visited"] = page.counters().transformed;
}

// All boxes stand beside each other in the body, as the markers of a map do.
void LayoutOneSimple(benchmark::State& state, uint32_t count) {
    LayoutPage page(css::CSSDisplay::Simple);
    std::vector<LayoutHandle*> boxes;
    for (uint32_t i = 0; i < count; ++i)
        boxes.push_back(&page.AddAbsolute(page.body()));
    MoveOne(state, page, *boxes[count / 2]);
    state.counters["target"] = 1.2;
}
BENCHMARK_CAPTURE(LayoutOneSimple, large, 10000)->Name("layout_one_simple");
BENCHMARK_CAPTURE(LayoutOneSimple, small, 1000)->Name("layout_one_simple_baseline");

void LayoutOneFlex(benchmark::State& state) {
    LayoutPage page(css::CSSDisplay::Block);
    page.AddNested(10000);
    MoveOne(state, page, page.AddAbsolute(*page.boxes()[500].handle));
    state.counters["target"] = 1.2;
}
BENCHMARK(LayoutOneFlex)->Name("layout_one_flex");

void LayoutOneFlexBaseline(benchmark::State& state) {
    LayoutPage page(css::CSSDisplay::Block);
    page.AddNested(10000);
    const LayoutHandle& box = page.AddAbsolute(*page.boxes()[500].handle);
    page.Frame();
    YogaTree yoga(page.root());
    yoga.Calculate();
    const YGNodeRef node = yoga.NodeOf(box);
    uint32_t turn = 0;
    for (auto _ : state) {
        YGNodeStyleSetPosition(node, YGEdgeLeft, ++turn & 1 ? 90 : 40);
        yoga.Calculate();
    }
}
BENCHMARK(LayoutOneFlexBaseline)->Name("layout_one_flex_baseline");

}  // namespace
