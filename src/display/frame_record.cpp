#include "display/frame_record.h"

namespace qorvex::dsp {

FrameRecord::FrameRecord(FrameRecord&& other) noexcept {
    *this = std::move(other);
}

FrameRecord& FrameRecord::operator=(FrameRecord&& other) noexcept {
    if (this == &other) return *this;
    ReleaseBuffers();
    resourceBuffers = std::move(other.resourceBuffers);
    buffers = std::move(other.buffers);
    surfacesToFree = std::move(other.surfacesToFree);
    imagesToFree = std::move(other.imagesToFree);
    dirtyRects = std::move(other.dirtyRects);
    frameNumber = other.frameNumber;
    isPartial = other.isPartial;
    return *this;
}

void FrameRecord::ReleaseBuffers() {
    for (fresco::CommandBuffer* buffer : resourceBuffers)
        buffer->Release();
    for (fresco::CommandBuffer* buffer : buffers)
        buffer->Release();
    resourceBuffers.clear();
    buffers.clear();
}

}  // namespace qorvex::dsp
