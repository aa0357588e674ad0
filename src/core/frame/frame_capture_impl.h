// A serialised frame while it travels to the client's callback.
#pragma once

#include <qorvex/frame_capture.h>

#include <cstring>

#include "core/memory/containers.h"

namespace qorvex {

class FrameCaptureImpl final : public FrameCapture,
                               public AtomicRefCounted<FrameCaptureImpl, MemoryTag::Rendering> {
  public:
    FrameCaptureImpl(const void* data, size_t size) {
        bytes_.resize(size);
        std::memcpy(bytes_.data(), data, size);
    }
    ~FrameCaptureImpl() override = default;
    const void* GetData() const override { return bytes_.data(); }
    size_t GetSize() const override { return bytes_.size(); }

  private:
    Vector<uint8_t, MemoryTag::Rendering> bytes_;
};

}  // namespace qorvex
