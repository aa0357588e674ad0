#include "display/record_rendering.h"

#include "css/values/color.h"
#include "css/values/style_groups.h"
#include "display/dirty_region.h"
#include "display/layer_effects.h"
#include "display/page_elements.h"
#include "display/paint_order.h"
#include "display/record_node.h"

#include <fresco/library.h>

#include <array>
#include <cmath>
#include <span>

namespace qorvex::dsp {

using fresco::CommandBuffer;
using layout::LayoutPass;
using layout::Near;
using layout::Rect;

namespace {

constexpr size_t kInitialBufferBytes = 0x3000;

bool IsScaled(const RecordRequest& request) {
    return !Near(request.scaleX, 1) || !Near(request.scaleY, 1);
}

// Edges on whole pixels of the target: a scissor that cuts a pixel would blend it with what was there.
Rect ToDevicePixels(const Rect& rect, const RecordRequest& request) {
    if (!(request.scaleX > 0 && request.scaleY > 0)) return rect;
    const Rect scaled{rect.x * request.scaleX, rect.y * request.scaleY, 0, rect.width * request.scaleX,
                      rect.height * request.scaleY};
    const Rect whole = layout::RoundOut(scaled);
    return {whole.x / request.scaleX, whole.y / request.scaleY, 0, whole.width / request.scaleX,
            whole.height / request.scaleY};
}

void SetScissors(std::span<const Rect> rects, bool scaled, CommandBuffer& buffer) {
    buffer.BeginScissor();
    buffer.PushState(fresco::kStateAll);
    for (size_t i = 0; i < rects.size(); ++i) {
        const Rect& r = rects[i];
        const uint32_t mode = i == 0 ? fresco::kClipSet : fresco::kClipAdd;
        if (!scaled) {
            buffer.ClipRect(r, mode);
            continue;
        }
        const fresco::Point3 quad[4] = {{r.x, r.y, 0},
                                        {layout::Right(r), r.y, 0},
                                        {layout::Right(r), layout::Bottom(r), 0},
                                        {r.x, layout::Bottom(r), 0}};
        buffer.ClipQuad(quad, mode);
    }
}

// Whether the root's background hides what the target shows of the last frame. It begins and ends on whole
// pixels in a view that is not scaled only.
bool HidesLastFrame(const layout::LayoutNode& root, std::span<const Rect> areas, bool scaled) {
    return !scaled && FillsCanvas(root) && !root.Local() && !NeedsLayer(root) &&
           root.style->visual->clipPath.IsNone() && TouchesAny(areas, root.visualAabb) &&
           TouchesAny(areas, root.PaintBounds());
}

// Older lists in other colours, the newest on top.
void DrawHighlights(const DirtyHistory& history, CommandBuffer& buffer) {
    constexpr fresco::Color kColors[] = {
        {0.9f, 0.2f, 0.2f, 1}, {0.9f, 0.6f, 0.1f, 1}, {0.2f, 0.7f, 0.3f, 1}, {0.2f, 0.5f, 0.9f, 1}};
    for (uint32_t i = 0; i < history.Lists().size(); ++i) {
        fresco::Paint outline;
        outline.color = kColors[i % std::size(kColors)];
        fresco::Paint fill = outline;
        fill.color.a = 0.15f;
        for (const Rect& rect : history.Lists()[i]) {
            buffer.FillRect(rect, fill);
            buffer.StrokeRect(rect, outline);
        }
    }
}

class FrameRecorder {
  public:
    FrameRecorder(LayoutPass& pass, RecordRequest& request) : pass_(pass), request_(request) {
        record_.frameNumber = request.frameNumber;
        record_.resourceBuffers = std::move(request.resourceBuffers);
        request.caches.shadows.FlushEvicted(record_);
    }

    FrameRecord Run() {
        if (request_.record && ChooseAreas()) RecordTree();
        pass_.dirty.Clear();
        request_.caches.scratch.FreeAll(record_);
        return std::move(record_);
    }

  private:
    // False when there is nothing to paint.
    bool ChooseAreas() {
        const Rect view{0, 0, 0, static_cast<float>(pass_.viewWidth), static_cast<float>(pass_.viewHeight)};
        DirtyHistory& history = request_.caches.highlighted;
        if (!request_.showPaintRectangles) history.Clear();
        const bool highlights = !history.Empty();
        if (pass_.dirty.Empty() && !highlights) return false;
        if (request_.showPaintRectangles) {
            // Every frame ages the history by one, so that highlights fade when the page stands still.
            history.Age();
            if (!pass_.dirty.Empty())
                history.Push(DirtyHistory::List(pass_.dirty.begin(), pass_.dirty.end()));
        }
        pass_.dirty.ReduceForScissors();
        for (const Rect& dirty : pass_.dirty) {
            const Rect seen = layout::Intersection(ToDevicePixels(dirty, request_), view);
            if (!layout::IsEmpty(seen)) record_.dirtyRects.push_back(seen);
        }
        record_.isPartial = request_.partialRedraw && !request_.showPaintRectangles && !highlights;
        if (!record_.isPartial) {
            record_.dirtyRects.clear();
            if (!layout::IsEmpty(view)) record_.dirtyRects.push_back(view);
        }
        return !record_.dirtyRects.empty();
    }

    void RecordTree() {
        CommandBuffer* buffer = fresco::Library::CreateBuffer(kInitialBufferBytes, 0);
        if (buffer == nullptr) return;
        const bool scaled = IsScaled(request_);
        if (scaled) {
            const float scale[2] = {request_.scaleX, request_.scaleY};
            buffer->Scale(request_.scaleX, request_.scaleY);
            buffer->Annotate(fresco::kAnnotateScale, scale);
        }
        const std::span<const Rect> areas(record_.dirtyRects.data(), record_.dirtyRects.size());
        SetScissors(areas, scaled, *buffer);
        if (pass_.root == nullptr || !HidesLastFrame(pass_.root->node(), areas, scaled)) {
            for (const Rect& area : areas)
                buffer->ClearRect(area, 0);
        }
        if (pass_.root != nullptr) {
            PaintContext context = MakeContext();
            RecordNode(pass_.root->node(), context, areas, buffer);
        }
        DrawHighlights(request_.caches.highlighted, *buffer);
        buffer->PopState();
        record_.buffers.push_back(buffer);
    }

    PaintContext MakeContext() {
        RenderCaches& caches = request_.caches;
        return PaintContext{record_,
                            caches.shadows,
                            caches.paths,
                            caches.scratch,
                            pass_.update.counters,
                            layout::MakeLengthContext(pass_),
                            {static_cast<float>(pass_.viewWidth), static_cast<float>(pass_.viewHeight)},
                            request_.scaleX,
                            request_.scaleY,
                            pass_.snapToPixels,
                            record_.isPartial,
                            request_.showPaintRectangles,
                            request_.family};
    }

    LayoutPass& pass_;
    RecordRequest& request_;
    FrameRecord record_;
};

}  // namespace

FrameRecord RecordRendering(LayoutPass& pass, RecordRequest&& request) {
    return FrameRecorder(pass, request).Run();
}

}  // namespace qorvex::dsp
