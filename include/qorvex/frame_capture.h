// A recorded frame in the rendering library's file format, as the capture operations of View hand it out.
#pragma once

#include <cstddef>

namespace qorvex {

// Borrowed: valid during the callback that received it. The bytes can be written to a file as they are and
// replayed with fresco-replay.
class FrameCapture {
  public:
    virtual const void* GetData() const = 0;
    virtual std::size_t GetSize() const = 0;

  protected:
    virtual ~FrameCapture() = default;
};

// Runs on the main thread, inside an Advance that follows the Paint of the captured frame.
using FrameCaptureCallback = void (*)(void* userData, const FrameCapture& capture);

}  // namespace qorvex
