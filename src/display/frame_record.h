// One recorded frame: what the layout side hands to the render thread.
//
// Buffers are owned by the record until Take gives them to the render frame's tasks. Plain data otherwise:
// the render side reads it and never asks back.
#pragma once

#include "core/memory/containers.h"
#include "layout/geometry.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

using BufferList = Vector<fresco::CommandBuffer*, MemoryTag::Display>;

struct FrameRecord {
    FrameRecord() = default;
    FrameRecord(FrameRecord&& other) noexcept;
    FrameRecord& operator=(FrameRecord&& other) noexcept;
    FrameRecord(const FrameRecord&) = delete;
    FrameRecord& operator=(const FrameRecord&) = delete;
    ~FrameRecord() { ReleaseBuffers(); }

    // Executed in order, resource buffers first.
    BufferList resource_buffers;
    BufferList buffers;
    Vector<fresco::SurfaceId, MemoryTag::Display> surfaces_to_free;
    Vector<fresco::ImageId, MemoryTag::Display> images_to_free;
    Vector<layout::Rect, MemoryTag::Display> dirty_rects;
    uint32_t frame_number = 0;
    bool is_partial = false;

    // Nothing to paint and nothing pending: the frame completes without a paint task.
    bool Empty() const {
        return buffers.empty() && resource_buffers.empty() && surfaces_to_free.empty() &&
               images_to_free.empty();
    }
    void ReleaseBuffers();
};

}  // namespace qorvex::dsp
