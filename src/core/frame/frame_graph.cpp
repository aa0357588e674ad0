#include "core/frame/frame_graph.h"

#include "core/main_thread.h"
#include "display/visual_style.h"

namespace qorvex {

namespace {

// A task of the layout side lets go of the frame before it counts as finished: the last reference then always
// goes on the main thread, where the layout handles that die with it may touch the document's pools.
template <class Body>
TaskPtr MakeFrameTask(const char* name, const FrameDataPtr& frame, Body body) {
    return MakeTask(name, [shared = frame, body](TaskFamilyHandle) mutable {
        const FrameDataPtr held = std::move(shared);
        body(*held);
    });
}

template <class Body>
TaskPtr MakePassTask(const char* name, const FrameDataPtr& frame, Body body) {
    return MakeFrameTask(name, frame, [body](FrameData& data) {
        StageTimer timer(*data.stats, data.frame_id, &FrameStats::Layout);
        layout::LayoutPass pass = data.MakePass();
        body(pass);
    });
}

TaskPtr MakeLayoutTask(const FrameDataPtr& frame, layout::LayoutWork work) {
    if (work == layout::LayoutWork::Layout) return MakePassTask("Layout", frame, layout::PerformLayout);
    if (work == layout::LayoutWork::Transforms) {
        return MakePassTask("UpdateNodeTransforms", frame, layout::UpdateNodeTransforms);
    }
    if (frame->dirty.Empty()) return TaskPtr();
    return MakePassTask("UpdateNodeFlags", frame, layout::UpdateNodeFlags);
}

TaskPtr MakeRecordTask(const FrameDataPtr& frame) {
    return MakeFrameTask("RecordRendering", frame, [](FrameData& data) {
        {
            StageTimer timer(*data.stats, data.frame_id, &FrameStats::Record);
            RecordFrame(data);
        }
        data.stats->Update(data.frame_id, [&](FrameStats& stats) {
            stats.LaidOut += data.update->counters.laidOut;
            stats.Recorded += data.update->counters.recorded;
        });
    });
}

TaskPtr MakeSignalTask(const FrameDataPtr& frame) {
    return MakeFrameTask("SignalFrameCompletion", frame, [](FrameData& data) {
        if (data.on_frame_complete)
            data.on_frame_complete(data.callback_user_data, data.view_id, data.frame_id, 0);
    });
}

TaskPtr MakeSyncTreesTask(const FrameDataPtr& frame) {
    return MakeTask("SyncTrees", [frame](TaskFamilyHandle) { layout::SyncTrees(*frame->update); });
}

TaskPtr MakeUnblockTask(const FrameDataPtr& frame) {
    return MakeTask("UnblockLayout", [frame](TaskFamilyHandle) {
        frame->layout_unblocked->store(1, std::memory_order_release);
    });
}

TaskPtr MakeUnblockSynchronousTask(std::atomic<uint32_t>* done) {
    return MakeTask("UnblockSynchronousDOM", [done](TaskFamilyHandle family) {
        done->store(1, std::memory_order_release);
        // A client thread may have served this view's layout by itself; the main thread then sleeps on the
        // channel and must be told.
        if (!IsMainThread()) family.Push(TaskChannels::Layout, MakeTask("Empty", [](TaskFamilyHandle) {}));
    });
}

}  // namespace

void PushFrameGraph(TaskSystem& tasks, FrameGraphRequest request) {
    const FrameDataPtr& frame = request.frame;
    const TaskFamilyHandle family = frame->family;
    TaskPtr layout = MakeLayoutTask(frame, request.work);
    TaskPtr visual = MakePassTask("RecalculateVisualStyle", frame, dsp::RecalculateVisualStyle);
    TaskPtr record = MakeRecordTask(frame);
    TaskPtr signal = MakeSignalTask(frame);
    TaskPtr sync = MakeSyncTreesTask(frame);
    TaskPtr unblock = MakeUnblockTask(frame);
    TaskPtr unblock_synchronous =
        request.synchronous_done ? MakeUnblockSynchronousTask(request.synchronous_done) : TaskPtr();

    if (request.scheduled) tasks.AddDependent(*request.scheduled, layout ? *layout : *visual);
    // Where layout runs elsewhere it does not wait: a client that serves resource work on the thread that
    // paints would wait for itself, and glyphs that are not there yet are loaded when they are first drawn.
    if (request.preload && layout && request.synchronous_done) tasks.AddDependent(*request.preload, *layout);
    if (layout) tasks.AddDependent(*layout, *visual);
    tasks.AddDependent(*visual, *record);
    tasks.AddDependent(*record, *signal);
    tasks.AddDependent(*signal, *unblock);
    tasks.AddDependent(*record, *sync);
    if (unblock_synchronous) tasks.AddDependent(*signal, *unblock_synchronous);

    // What depends on others goes first, so that nothing can finish before its dependents are known.
    if (unblock_synchronous) family.Push(TaskChannels::Layout, std::move(unblock_synchronous));
    family.Push(TaskChannels::Main, std::move(unblock));
    family.Push(TaskChannels::Main, std::move(sync));
    family.Push(TaskChannels::Layout, std::move(signal));
    family.Push(TaskChannels::Layout, std::move(record));
    family.Push(TaskChannels::Layout, std::move(visual));
    if (layout) family.Push(TaskChannels::Layout, std::move(layout));
    if (request.scheduled) family.Push(TaskChannels::Layout, std::move(request.scheduled));
    if (request.preload) family.Push(TaskChannels::Resources, std::move(request.preload));
}

}  // namespace qorvex
