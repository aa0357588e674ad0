// Animations, read one frame a call. A frame builds on the ones before it, so what is half read is kept
// between the calls: a bounded number of readers for the whole process, which Library::Stop empties.
#pragma once
#include <memory>

#include "fresco/core/heap.h"
#include "fresco/images/decoders.h"

namespace fresco {

class AnimationReader {
  public:
    AnimationReader(const uint8_t* data, size_t size) : data_(data), size_(size) {}
    AnimationReader(const AnimationReader&) = delete;
    AnimationReader& operator=(const AnimationReader&) = delete;
    virtual ~AnimationReader() = default;

    // Goes to the next frame; with `frame`, gives its pixels and its delay.
    virtual bool ReadNext(DecodedFrame* frame) = 0;

    uint32_t Width() const { return width_; }
    uint32_t Height() const { return height_; }
    uint32_t FrameCount() const { return frames_; }

  protected:
    // `work` is what all frames together make a decoder produce, in pixels; at least the canvas counts for
    // each. Says why, and false, beyond the limits.
    bool SetExtent(uint64_t width, uint64_t height, uint64_t frames, uint64_t work);

    const uint8_t* const data_;
    const size_t size_;

  private:
    friend class AnimationShelf;
    uint32_t width_ = 0, height_ = 0;
    uint32_t frames_ = 0;
    uint32_t next_ = 0;
};

using AnimationPtr = std::unique_ptr<AnimationReader, HeapDeleter<AnimationReader>>;
// Null when the file is none of its kind or beyond the limits.
using OpenAnimation = AnimationPtr (*)(const uint8_t* data, size_t size);

// Frame `index`, with the reader that stands nearest before it, or a new one. Past the end there are no
// pixels, and what was kept of the file goes.
bool ReadAnimationFrame(OpenAnimation open, const uint8_t* data, size_t size, uint32_t index,
                        DecodedFrame* frame);

void CloseAnimations();

}  // namespace fresco
