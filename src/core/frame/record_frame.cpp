// From the laid-out tree to the render thread: the tasks that go into a frame on the layout side.
#include "core/frame/frame_capture_impl.h"
#include "core/frame/frame_data.h"
#include "core/logging/log.h"

namespace qorvex {

namespace {

// Recorded commands on their way through the render thread. Whatever happens to the task that holds it, the
// buffers go back to the rendering library with it.
using SharedRecord = RefPtr<struct HeldRecord>;
struct HeldRecord : AtomicRefCounted<HeldRecord, MemoryTag::Rendering> {
    HeldRecord(dsp::FrameRecord&& taken, RenderLink& owner) : record(std::move(taken)), link(owner) {}
    ~HeldRecord() {
        if (!record.surfacesToFree.empty()) link.LeaveSurfaces(record.surfacesToFree);
    }
    void FreeSurfaces(fresco::IScene& scene) {
        for (const auto& list : {std::exchange(record.surfacesToFree, {}), link.TakeLeftSurfaces()})
            scene.FreeSurfaces(list.data(), static_cast<uint32_t>(list.size()));
    }

    dsp::FrameRecord record;
    RenderLink& link;  // what runs or drops a frame holds it
};

double PaintedArea(const dsp::FrameRecord& record) {
    double area = 0;
    for (const layout::Rect& rect : record.dirtyRects)
        area += static_cast<double>(rect.width) * static_cast<double>(rect.height);
    return area;
}

void ExecutePaint(HeldRecord& held, CachedImagesManager& images, fresco::IScene& scene,
                  FrameStatsRecorder& stats, uint32_t frame_id) {
    StageTimer timer(stats, frame_id, &FrameStats::Paint);
    dsp::FrameRecord& record = held.record;
    if (record.Empty()) {
        AssertFailure("Missing command buffer for paint!");
        return;
    }
    LogTrace("Execute Process FE Commands");
    if (!record.resourceBuffers.empty())
        scene.ExecuteFrontEnd(record.resourceBuffers.data(),
                              static_cast<uint32_t>(record.resourceBuffers.size()));
    images.ProcessUploads(scene);
    LogTrace("Execute Paint");
    if (!record.buffers.empty())
        scene.ExecuteBackEnd(record.buffers.data(), static_cast<uint32_t>(record.buffers.size()));
    held.FreeSurfaces(scene);
    scene.FreeImages(record.imagesToFree.data(), static_cast<uint32_t>(record.imagesToFree.size()));
    const auto pixels = static_cast<uint64_t>(PaintedArea(record));
    stats.Update(frame_id, [&](FrameStats& frame) { frame.PaintedPixels += pixels; });
}

TaskPtr MakeCaptureTask(const FrameData& frame, const SharedRecord& held) {
    return MakeTask(
        "CaptureFrame", [held, images = frame.images, scene = frame.scene, callback = frame.capture_callback,
                         user_data = frame.capture_user_data](TaskFamilyHandle family) {
            // The record's own resource buffers come first, so that the capture starts from what the frame
            // starts from.
            Vector<fresco::CommandBuffer*, MemoryTag::Rendering> buffers;
            for (auto* buffer : held->record.resourceBuffers)
                buffers.push_back(buffer);
            for (auto* buffer : held->record.buffers)
                buffers.push_back(buffer);
            // A capture holds the images that its frame draws.
            images->ProcessUploads(*scene);
            const fresco::CaptureData data =
                scene->SerializeBuffers(buffers.data(), static_cast<uint32_t>(buffers.size()));
            if (!data.data) return;
            auto capture = MakeRef<FrameCaptureImpl>(data.data, data.size);
            scene->FreeCapture(data);
            family.Push(TaskChannels::Main,
                        MakeTask("CaptureFrameCallback", [capture, callback, user_data](TaskFamilyHandle) {
                            callback(user_data, *capture);
                        }));
        });
}

}  // namespace

layout::LayoutPass FrameData::MakePass() {
    return layout::LayoutPass{
        *update, root.get(), width, height, dirty, flex_algorithm, disable_flex_basis_units, snap_to_pixels};
}

void RecordFrame(FrameData& frame) {
    layout::LayoutPass pass = frame.MakePass();
    dsp::RecordRequest request{.caches = *frame.caches,
                               .scaleX = frame.scale_x,
                               .scaleY = frame.scale_y,
                               .partialRedraw = !frame.paint_option,
                               .showPaintRectangles = frame.show_paint_rectangles,
                               .record = frame.should_record,
                               .frameNumber = frame.frame_id,
                               .resourceBuffers = {},
                               .family = &frame.family};
    dsp::FrameRecord record = dsp::RecordRendering(pass, std::move(request));
    RenderFrame& target = *frame.render_frame;
    if (record.Empty()) return target.PushClose();
    SharedRecord held = MakeRef<HeldRecord>(std::move(record), *frame.link);
    if (frame.capture_callback) target.Push(MakeCaptureTask(frame, held));
    target.PushClose(MakeTask(
        "Paint", [held, images = frame.images, scene = frame.scene, stats = frame.stats, id = frame.frame_id](
                     TaskFamilyHandle) { ExecutePaint(*held, *images, *scene, *stats, id); }));
}

}  // namespace qorvex
