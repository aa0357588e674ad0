#include "layout/perform_layout.h"

#include "core/logging/log.h"
#include "core/memory/temp_vector.h"
#include "css/values/length_context.h"
#include "display/display_paragraph.h"
#include "display/transforms.h"
#include "layout/flex_children.h"
#include "layout/flex_measure.h"
#include "layout/flex_results.h"
#include "layout/flex_style.h"
#include "layout/layout_store.h"
#include "layout/node_flags.h"
#include "layout/prefetch.h"
#include "layout/simple_layout.h"

#include <yoga/Yoga.h>

#include <algorithm>
#include <array>
#include <functional>
#include <utility>

namespace qorvex::layout {

namespace {

// Everything that a style resolves against besides itself; when it differs from the last layout's, no style
// that was written then holds any more.
bool TakeMetrics(LayoutPass& pass, LayoutStore::Engine engine) {
    LayoutStore& store = pass.root->store();
    const LayoutStore::Metrics now{pass.viewWidth, pass.viewHeight,
                                   pass.root->node().style->text->computedFontSize};
    const bool same = store.metrics == now && store.engine == engine;
    store.metrics = now;
    store.engine = engine;
    return !same;
}

bool FlowsChildren(const LayoutNode& node) {
    return node.display && node.display->Has(dsp::IDisplayElement::kFlowsChildren);
}

void SyncAllStyles(LayoutPass& pass, FlexStyleContext& context) {
    const TempMark mark;
    TempVector<LayoutHandle*> stack;
    stack.push_back(pass.root);
    while (!stack.empty()) {
        LayoutHandle* handle = stack.back();
        stack.pop_back();
        if (SyncStyleToYoga(*handle, context)) ++pass.update.counters.synced;
        dsp::InvalidateParagraphs(*handle);
        if (YGNodeGetChildCount(handle->node().flex) == 0 && !FlowsChildren(handle->node())) continue;
        for (const HandlePtr& child : handle->node().Children())
            stack.push_back(child.get());
    }
}

// By the address, as far as neighbours go: two rounds of counting tell apart what lies within 256 MiB, and no
// more is needed than that the next one lies near.
void OrderByMemory(TempVector<LayoutHandle*>& handles) {
    constexpr uint32_t kBits = 11, kLine = 6, kWorthCounting = 512;
    if (handles.size() < kWorthCounting) return std::sort(handles.begin(), handles.end(), std::less<>());
    TempVector<LayoutHandle*> sorted;
    sorted.resize(handles.size());
    for (const uint32_t shift : {kLine, kLine + kBits}) {
        std::array<uint32_t, 1u << kBits> places{};
        const auto digit = [shift](const LayoutHandle* handle) {
            return reinterpret_cast<uintptr_t>(handle) >> shift & ((1u << kBits) - 1);
        };
        for (const LayoutHandle* handle : handles)
            ++places[digit(handle)];
        uint32_t before = 0;
        for (uint32_t& place : places)
            before += std::exchange(place, before);
        for (LayoutHandle* handle : handles)
            sorted[places[digit(handle)]++] = handle;
        handles.swap(sorted);
    }
}

// The changed handles in the order of memory, which is mostly that of the page: in the order of their set
// each would lie far from the one before.
void CollectChanged(const LayoutPass& pass, TempVector<LayoutHandle*>& changed) {
    changed.reserve(pass.update.changed.Size());
    pass.update.changed.ForEach([&](LayoutHandle& handle) { changed.push_back(&handle); });
    OrderByMemory(changed);
}

bool TakeContentChange(LayoutNode& node) {
    const bool changed = node.contentChanged;
    node.contentChanged = false;
    return changed && node.flex != nullptr && YGNodeHasMeasureFunc(node.flex);
}

// For layouts that do not ask whether sizes hold.
void MarkChangedContent(LayoutPass& pass) {
    pass.update.changed.ForEach([](LayoutHandle& handle) {
        LayoutNode& node = handle.node();
        if (TakeContentChange(node)) YGNodeMarkDirty(node.flex);
    });
}

// A changed element may still have the size that it had: a counter whose digits are all as wide. When nothing
// else has changed no box of the page moves, and Yoga, which walks the whole page each time, is not asked.
// True then.
bool SyncChangedStyles(LayoutPass& pass, FlexStyleContext& context) {
    const TempMark mark;
    TempVector<LayoutHandle*> changed, contents;
    CollectChanged(pass, changed);
    const uint32_t count = changed.size();
    for (uint32_t i = 0; i < count; ++i) {
        LayoutHandle* handle = changed[i];
        if (i + 2 * kNodesAhead < count) PrefetchNode(*changed[i + 2 * kNodesAhead]);
        if (i + kNodesAhead < count) PrefetchStyle(*changed[i + kNodesAhead]);
        if (SyncStyleToYoga(*handle, context)) ++pass.update.counters.synced;
        dsp::InvalidateParagraphs(*handle);
        if (TakeContentChange(handle->node())) contents.push_back(handle);
    }
    bool keeps = !changed.empty() && contents.size() == changed.size();
    for (LayoutHandle* handle : contents) {
        LayoutNode& node = handle->node();
        if (node.display && node.display->KeepsSize(*handle)) continue;
        YGNodeMarkDirty(node.flex);
        keeps = false;
    }
    return keeps && !YGNodeIsDirty(pass.root->node().flex);
}

void PerformFlexLayout(LayoutPass& pass, const css::LengthContext& lengths) {
    FlexStyleContext context{lengths, pass.disableFlexBasisUnits, pass.root};
    const bool stylesMissing = std::exchange(pass.root->store().flexStylesMissing, false);
    if (EnsureFlexTree(*pass.root) || stylesMissing) pass.everything = true;
    if (pass.everything) {
        SyncAllStyles(pass, context);
        MarkChangedContent(pass);
    } else if (SyncChangedStyles(pass, context)) {
        return;
    }
    YGNodeCalculateLayout(pass.root->node().flex, static_cast<float>(pass.viewWidth),
                          static_cast<float>(pass.viewHeight), YGDirectionLTR);
    pass.update.counters.measured += TakeMeasureCount();
    ReadYogaResults({pass.root, nullptr, {}, pass.everything}, pass);
}

}  // namespace

css::LengthContext MakeLengthContext(const LayoutPass& pass) {
    const float rem = pass.root->node().style->text->computedFontSize;
    return {static_cast<float>(pass.viewWidth) / 100, static_cast<float>(pass.viewHeight) / 100, rem, rem, 0};
}

void PerformLayout(LayoutPass& pass) {
    LogTrace("Performing layout");
    if (pass.root == nullptr) return;
    const css::LengthContext lengths = MakeLengthContext(pass);
    const bool simple = pass.update.bodyDisplay == css::CSSDisplay::Simple;
    using Engine = LayoutStore::Engine;
    if (TakeMetrics(pass, simple ? Engine::Simple : Engine::Flex)) pass.everything = true;
    if (simple) {
        if (std::exchange(pass.root->store().flexStylesMissing, false)) pass.everything = true;
        MarkChangedContent(pass);
        PerformSimpleLayout(pass, lengths, pass.everything);
    } else if (pass.algorithm != FlexAlgorithm::Internal) {
        PerformFlexLayout(pass, lengths);
    } else {
        MarkChangedContent(pass);
        // The styles of this frame were not written; the next run of Yoga has to catch up.
        pass.root->store().engine = Engine::None;
    }
    dsp::RunTransformPass(pass);
}

void UpdateNodeTransforms(LayoutPass& pass) {
    LogTrace("Performing node transforms update");
    if (pass.root == nullptr) return;
    pass.update.changed.ForEach([](LayoutHandle& handle) { RefreshNodeFlags(handle.node()); });
    dsp::RunTransformPass(pass);
}

void UpdateNodeFlags(LayoutPass& pass) {
    pass.update.changed.ForEach([](LayoutHandle& handle) { RefreshNodeFlags(handle.node()); });
}

}  // namespace qorvex::layout
