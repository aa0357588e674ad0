// The record of one frame's changes, shared by the tasks of that frame, and the two crossings that use it.
#pragma once

#include "css/values/keywords.h"
#include "display/dirty_region.h"
#include "layout/handle_set.h"
#include "layout/work_counters.h"

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
struct LayoutUpdateData : AtomicRefCounted<LayoutUpdateData, MemoryTag::LayoutData> {
    // Handles whose style or tree place the commit carried over.
    HandleSet changed;
    // Handles to which layout gave a new box, transform, bounds or stacking place; SyncTrees copies these
    // back.
    UpdatedList updated;
    // What handles that left the tree covered.
    dsp::DirtyRegion vanished;
    // Display of <body>: selects the layout engine. Block when there is no body.
    css::CSSDisplay bodyDisplay = css::CSSDisplay::Block;
    WorkCounters counters;
};

using LayoutUpdatePtr = qsl::RefPtr<LayoutUpdateData>;

// DOM thread, after RecordRendering, before the next commit: copies results of the layout side into the
// halves that scripts read.
void SyncTrees(LayoutUpdateData& update);

}  // namespace qorvex::layout
