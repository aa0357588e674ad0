// A page made of layout handles alone: elements with styles from declaration texts, and frames as the view
// runs them.
#pragma once

#include "css/values/layout_style_refs.h"
#include "display/box.h"
#include "display/dirty_region.h"
#include "display/page_elements.h"
#include "display/visual_style.h"
#include "layout/layout_tree.h"
#include "layout/perform_layout.h"
#include "support/scoped_library_state.h"
#include "support/style_text.h"

#include <deque>
#include <string>
#include <vector>

namespace qorvex::test {

// A leaf of a fixed size, which wraps like text: width given, it takes as many lines as it needs.
class FakeText final : public dsp::IDisplayElement {
  public:
    FakeText(float width, float height) : IDisplayElement(kMeasures), width_(width), height_(height) {}
    void Paint(dsp::PaintContext&, bool, const layout::LayoutNode&, fresco::CommandBuffer&) override {
        ++paints;
    }
    void Measure(layout::LayoutHandle&, float availableWidth, float, dsp::MeasureMode mode, dsp::MeasureMode,
                 layout::Size& out) override {
        ++measures;
        const bool wraps = mode != dsp::MeasureMode::Undefined && availableWidth < width_;
        const float lines = wraps ? std::ceil(width_ / std::max(availableWidth, 1.0f)) : 1;
        out = {wraps ? availableWidth : width_, height_ * lines};
    }
    void SetWidth(float width) { width_ = width; }
    int measures = 0;
    int paints = 0;

  private:
    float width_;
    float height_;
};

// Keeps the flag that the layout tree mirrors to its node.
class FakeNode final : public layout::INodeLink {
  public:
    void AddRef() noexcept override { ++references; }
    void Release() noexcept override { --references; }
    void SetInLayoutTree(bool in) override { inTree = in; }
    std::string_view DebugName() const override { return "div"; }
    void Receive(layout::DOMTaskKind, const layout::DOMTaskData&) override {}
    int references = 0;
    bool inTree = false;
};

class Page {
  public:
    explicit Page(uint32_t width = 1000, uint32_t height = 500) : viewWidth(width), viewHeight(height) {
        root = Keep(tree.CreateRoot({Store(Style("")), MakeRef<dsp::DisplayHTML>(), nullptr, {}, false}));
        body = Add(root, "");
    }
    Page(const Page&) = delete;
    Page& operator=(const Page&) = delete;

    static css::LayoutStyleRefs Style(std::string_view text) {
        css::LayoutStyleRefs style = css::DefaultStyles();
        EXPECT_TRUE(ApplyDeclarations(style, text)) << text;
        return style;
    }

    // For a handle: the commit reads the style where it stands.
    css::LayoutStyleRefs& Store(const css::LayoutStyleRefs& style) { return styles_.emplace_back(style); }

    layout::LayoutHandle* Add(layout::LayoutHandle* parent, std::string_view style) {
        return Insert(parent, parent->data().Children().size(), style);
    }
    layout::LayoutHandle* Insert(layout::LayoutHandle* parent, uint32_t index, std::string_view style,
                                 layout::NodeLinkPtr link = nullptr) {
        return Keep(
            tree.AddChild(*parent, index, {Store(Style(style)), MakeRef<dsp::Box>(), link, {}, false}));
    }
    layout::LayoutHandle* AddText(layout::LayoutHandle* parent, RefPtr<FakeText> text,
                                  std::string_view style = "") {
        return Keep(tree.AddChild(*parent, parent->data().Children().size(),
                                  {Store(Style(style)), text, nullptr, {}, false}));
    }
    // Adds declarations to the style that the handle has.
    void Change(layout::LayoutHandle* handle, std::string_view style) {
        css::LayoutStyleRefs& own = OwnStyle(handle);
        own.written.Clear();
        EXPECT_TRUE(ApplyDeclarations(own, style)) << style;
        tree.UpdateStyle(*handle, own);
    }
    void Restore(layout::LayoutHandle* handle, const css::LaidOutStyle& style) {
        static_cast<css::LaidOutStyle&>(OwnStyle(handle)) = style;
        tree.UpdateStyle(*handle, OwnStyle(handle));
    }

    layout::LayoutPass MakePass() {
        return {*update, tree.Root(), viewWidth, viewHeight, dirty, algorithm, false, snapToPixels};
    }

    // A frame up to the recording.
    void Frame(layout::LayoutWork work = layout::LayoutWork::Layout) {
        update = MakeRef<layout::LayoutUpdateData>();
        update->bodyDisplay = body->data().style->layout->display;
        tree.Commit(*update, work == layout::LayoutWork::Layout ? nullptr : &dirty, nullptr);
        layout::LayoutPass pass = MakePass();
        pass.everything = everything;
        if (work == layout::LayoutWork::Layout) layout::PerformLayout(pass);
        if (work == layout::LayoutWork::Transforms) layout::UpdateNodeTransforms(pass);
        if (work == layout::LayoutWork::VisualStyle) layout::UpdateNodeFlags(pass);
        dsp::RecalculateVisualStyle(pass);
        if (sync) layout::SyncTrees(*update);
    }
    // Lays out and forgets what became dirty.
    void Settle() {
        Frame();
        dirty.Clear();
    }

    const layout::WorkCounters& Counters() const { return update->counters; }

    uint32_t viewWidth;
    uint32_t viewHeight;
    bool everything = false;
    bool sync = true;
    bool snapToPixels = true;
    layout::FlexAlgorithm algorithm = layout::FlexAlgorithm::Yoga;
    layout::LayoutTree tree;
    dsp::DirtyRegion dirty;
    layout::LayoutUpdatePtr update = MakeRef<layout::LayoutUpdateData>();
    layout::LayoutHandle* root;
    layout::LayoutHandle* body;

  private:
    layout::LayoutHandle* Keep(layout::HandlePtr handle) {
        kept_.push_back(handle);
        return handle.get();
    }
    // All styles of this page come from Store.
    static css::LayoutStyleRefs& OwnStyle(layout::LayoutHandle* handle) {
        return const_cast<css::LayoutStyleRefs&>(
            static_cast<const css::LayoutStyleRefs&>(*handle->data().style));
    }
    std::deque<css::LayoutStyleRefs> styles_;
    std::vector<layout::HandlePtr> kept_;
};

class LayoutTest : public QorvexTest {
  protected:
    LayoutTest() { css::CreateDefaultStyles(); }
    ~LayoutTest() override { css::DestroyDefaultStyles(); }
};

// "x y width height" as scripts read it.
inline std::string BoxOf(const layout::LayoutHandle* handle) {
    const layout::LayoutResult& r = handle->data().result;
    char text[96];
    std::snprintf(text, sizeof(text), "%g %g %g %g", r.left, r.top, r.width, r.height);
    return text;
}

}  // namespace qorvex::test
