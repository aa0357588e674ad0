// One recorded frame: what the layout side hands to the render thread.
//
// Buffers are owned by the record until Take gives them to the render frame's tasks. Plain data otherwise:
// the render side reads it and never asks back.
#pragma once

#include "core/memory/containers.h"
#include "layout/geometry.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

using BufferList = Vector<fresco::CommandBuffer*, MemoryTag::Rendering>;

struct FrameRecord {
    FrameRecord() = default;
    FrameRecord(FrameRecord&& other) noexcept;
    FrameRecord& operator=(FrameRecord&& other) noexcept;
    FrameRecord(const FrameRecord&) = delete;
    FrameRecord& operator=(const FrameRecord&) = delete;
    ~FrameRecord() { ReleaseBuffers(); }

    // Executed in order, resource buffers first.
    BufferList resourceBuffers;
    BufferList buffers;
    Vector<fresco::SurfaceId, MemoryTag::Rendering> surfacesToFree;
    Vector<fresco::ImageId, MemoryTag::Rendering> imagesToFree;
    Vector<layout::Rect, MemoryTag::Rendering> dirtyRects;
    uint32_t frameNumber = 0;
    bool isPartial = false;

    // Nothing to paint and nothing pending: the frame completes without a paint task.
    bool Empty() const {
        return buffers.empty() && resourceBuffers.empty() && surfacesToFree.empty() && imagesToFree.empty();
    }
    void ReleaseBuffers();
};

}  // namespace qorvex::dsp
