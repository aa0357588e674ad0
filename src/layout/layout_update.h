// The record of one frame's changes, shared by the tasks of that frame, and the two crossings that use it.
#pragma once

#include "css/values/property_values.h"
#include "layout/handle_set.h"
#include "layout/work_counters.h"

#include <atomic>

namespace qorvex::dsp {
class DirtyRegion;
}

namespace qorvex::layout {

// What the frame's style changes ask of the layout side; smaller non-zero codes do more.
enum class LayoutWork : uint8_t {
    None = 0,
    Layout = 1,
    Transforms = 2,
    VisualStyle = 3,
};

// Created by the frame, filled by LayoutTree::Commit, grown by the layout tasks, read by SyncTrees. Counted,
// since every task of the frame holds it.
class LayoutUpdateData {
  public:
    static qsl::RefPtr<LayoutUpdateData> Create();
    void AddRef() noexcept { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() noexcept;

    // Handles whose style or tree place the commit carried over.
    HandleSet changed;
    // Handles to which layout gave a new box, transform, bounds or stacking place; SyncTrees copies these
    // back.
    HandleSet updated;
    // Display of <body>: selects the layout engine. Block when there is no body.
    css::CSSDisplay body_display = css::CSSDisplay::Block;
    WorkCounters counters;

  private:
    LayoutUpdateData() = default;
    ~LayoutUpdateData() = default;
    template <typename T>
    friend void DeleteUpdateData(T*);

    std::atomic<uint32_t> count_{0};
};

using LayoutUpdatePtr = qsl::RefPtr<LayoutUpdateData>;

// DOM thread, after RecordRendering, before the next commit: copies results of the layout side into the
// halves that scripts read.
void SyncTrees(LayoutUpdateData& update);

}  // namespace qorvex::layout
