// Recording: a whole page of boxes against a walk over as many nodes, and one changed box of many against one
// of few.
#include <benchmark/benchmark.h>

#include <memory>
#include <vector>

#include "css/values/layout_style_refs.h"
#include "display/box.h"
#include "display/page_elements.h"
#include "display/record_rendering.h"
#include "display/visual_style.h"
#include "layout/layout_tree.h"
#include "layout/perform_layout.h"

namespace {

using namespace qorvex;

// Panels of a hundred boxes each: layout handles alone, without documents.
class RecordPage {
  public:
    explicit RecordPage(int boxes) {
        css::CreateDefaultStyles();
        css::LayoutStyleRefs& wrapping = containers_[0];
        wrapping = css::DefaultStyles();
        wrapping.Mutable<css::LayoutStyle>().flexDirection = css::CSSFlexDirection::Row;
        wrapping.Mutable<css::LayoutStyle>().flexWrap = css::CSSFlexWrap::Wrap;
        css::LayoutStyleRefs& panel = containers_[1];
        panel = wrapping;
        Size(panel, 10 * kSide);
        for (css::LayoutStyleRefs& style : colors_) {
            style = css::DefaultStyles();
            Size(style, kSide);
        }
        colors_[0].Mutable<css::VisualStyle>().backgroundColor = {0.2f, 0.4f, 0.6f, 1};
        colors_[1].Mutable<css::VisualStyle>().backgroundColor = {0.6f, 0.4f, 0.2f, 1};
        root_ = tree_.CreateRoot({css::DefaultStyles(), MakeRef<dsp::DisplayHTML>(), nullptr, {}, false});
        const layout::HandlePtr body = Add(*root_, wrapping);
        layout::HandlePtr parent;
        for (int i = 0; i < boxes; ++i) {
            if (i % kPanel == 0) parent = Add(*body, panel);
            boxes_.push_back(Add(*parent, colors_[0]));
        }
        Commit();
        layout::LayoutPass pass = MakePass();
        layout::PerformLayout(pass);
        dsp::RecalculateVisualStyle(pass);
        layout::SyncTrees(*update_);
        Record();
    }
    ~RecordPage() {
        boxes_.clear();
        update_.reset();
        tree_.Clear(nullptr);
        root_.reset();
        for (css::LayoutStyleRefs* style : {&colors_[0], &colors_[1], &containers_[0], &containers_[1]})
            *style = css::LayoutStyleRefs();
        css::DestroyDefaultStyles();
    }

    void MarkAllDirty() { dirty_.Add({0, 0, 0, kWidth, kHeight}); }
    size_t Record() {
        layout::LayoutPass pass = MakePass();
        const dsp::FrameRecord record = dsp::RecordRendering(pass, {caches_});
        return record.buffers.empty() ? 0 : record.buffers[0]->GetStreamSize();
    }
    // A frame in which one box gets another colour.
    size_t FrameOfOneChange() {
        layout::LayoutHandle& box = *boxes_[boxes_.size() / 2];
        on_ = !on_;
        css::LaidOutStyle& style = colors_[on_];
        style.written = {};
        style.written.Add(css::StyleGroup::Visual);
        tree_.UpdateStyle(box, style);
        Commit();
        layout::LayoutPass pass = MakePass();
        layout::UpdateNodeFlags(pass);
        dsp::RecalculateVisualStyle(pass);
        const size_t size = Record();
        layout::SyncTrees(*update_);
        return size;
    }
    [[nodiscard]] const layout::LayoutHandle& root() const { return *root_; }
    [[nodiscard]] size_t CountRecorded() const { return update_->counters.recorded; }

  private:
    static constexpr int kSide = 4;
    static constexpr int kPanel = 100;
    static constexpr float kWidth = 1920;
    static constexpr float kHeight = 1080;

    static void Size(css::LayoutStyleRefs& style, float side) {
        style.Mutable<css::LayoutStyle>().width = css::Extent::Pixels(side);
        style.Mutable<css::LayoutStyle>().height = css::Extent::Pixels(side);
    }
    layout::HandlePtr Add(layout::LayoutHandle& parent, const css::LaidOutStyle& style) {
        return tree_.AddChild(parent, parent.data().Children().size(),
                              {style, MakeRef<dsp::Box>(), nullptr, {}, false});
    }
    void Commit() {
        update_ = MakeRef<layout::LayoutUpdateData>();
        tree_.Commit(*update_, &dirty_, nullptr);
    }
    layout::LayoutPass MakePass() {
        return {*update_, root_.get(), static_cast<uint32_t>(kWidth), static_cast<uint32_t>(kHeight), dirty_};
    }

    layout::LayoutTree tree_;
    layout::HandlePtr root_;
    std::vector<layout::HandlePtr> boxes_;
    css::LayoutStyleRefs colors_[2];
    css::LayoutStyleRefs containers_[2];
    dsp::DirtyRegion dirty_;
    dsp::RenderCaches caches_;
    layout::LayoutUpdatePtr update_;
    bool on_ = false;
};

void RecordFull(benchmark::State& state) {
    RecordPage page(10000);
    for (auto _ : state) {
        page.MarkAllDirty();
        benchmark::DoNotOptimize(page.Record());
    }
    if (page.CountRecorded() == 0) state.SkipWithError("nothing was recorded");
    state.counters["target"] = 4;
}
BENCHMARK(RecordFull)->Name("record_full")->Unit(benchmark::kMicrosecond);

// The least that a recording could be: a pointer to each node, and 64 bytes for it.
struct PlainNode {
    PlainNode* next = nullptr;
    float box[4] = {};
    float color[4] = {};
};
struct PlainRecord {
    uint32_t type = 1;
    uint32_t size = 64;
    float box[4];
    float color[4];
    float rest[6] = {};
};
static_assert(sizeof(PlainRecord) == 64);

void WalkNodes(benchmark::State& state) {
    constexpr int kNodes = 10000;
    std::vector<std::unique_ptr<PlainNode>> nodes;
    for (int i = 0; i < kNodes; ++i) {
        nodes.push_back(std::make_unique<PlainNode>());
        nodes.back()->box[0] = static_cast<float>(i);
        if (i > 0) nodes[static_cast<size_t>(i) - 1]->next = nodes.back().get();
    }
    std::vector<PlainRecord> records(kNodes);
    for (auto _ : state) {
        PlainRecord* out = records.data();
        for (const PlainNode* node = nodes[0].get(); node != nullptr; node = node->next, ++out) {
            PlainRecord record;
            std::copy(node->box, node->box + 4, record.box);
            std::copy(node->color, node->color + 4, record.color);
            *out = record;
        }
        benchmark::ClobberMemory();
    }
}
BENCHMARK(WalkNodes)->Name("record_full_baseline")->Unit(benchmark::kMicrosecond);

void RecordOne(benchmark::State& state, int boxes) {
    RecordPage page(boxes);
    for (auto _ : state)
        benchmark::DoNotOptimize(page.FrameOfOneChange());
    if (page.CountRecorded() == 0) state.SkipWithError("nothing was recorded");
    state.counters["target"] = 1.5;
}
BENCHMARK_CAPTURE(RecordOne, many, 10000)->Name("record_one")->Unit(benchmark::kMicrosecond);
BENCHMARK_CAPTURE(RecordOne, few, 100)->Name("record_one_baseline")->Unit(benchmark::kMicrosecond);

}  // namespace
