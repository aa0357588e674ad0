// The pixels that decoding an image gave, on their way to the render thread. Freed wherever they end: in a
// task that never ran, in a list that is dropped, or after the upload.
#pragma once

#include <fresco/library.h>

#include <span>
#include <utility>

#include "core/memory/containers.h"

namespace qorvex {

class DecodedImage {
  public:
    struct Frame {
        void* pixels = nullptr;
        uint32_t delay = 0;  // hundredths of a second
    };

    DecodedImage() = default;
    DecodedImage(DecodedImage&& other) noexcept
        : frames_(std::move(other.frames_)), description_(other.description_) {
        other.frames_.clear();
    }
    DecodedImage& operator=(DecodedImage&& other) noexcept {
        std::swap(frames_, other.frames_);
        std::swap(description_, other.description_);
        return *this;
    }
    ~DecodedImage() {
        for (const Frame& frame : frames_)
            fresco::Library::FreeDecodedImage(frame.pixels);
    }

    // All frames of an image file, or none when it cannot be decoded. Any thread.
    static DecodedImage Decode(std::span<const uint8_t> file);

    const Vector<Frame, MemoryTag::Rendering>& GetFrames() const { return frames_; }
    // Without pixels; of a frame, with its pixels.
    const fresco::Image& GetDescription() const { return description_; }
    fresco::Image DescribeFrame(uint32_t index) const;

  private:
    Vector<Frame, MemoryTag::Rendering> frames_;
    fresco::Image description_;
};

}  // namespace qorvex
