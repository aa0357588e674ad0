// What executes streams. A back end is a visitor of records with a target; everything else about it (how it
// keeps images, surfaces, layers) is its own. It runs on the render thread alone.
#pragma once
#include "fresco/commands/dispatch.h"

namespace fresco {

// A stream with what its records refer to by index: a recorded buffer, or one read from a capture.
class StreamSource {
  public:
    virtual const void* GetData() const = 0;
    virtual size_t GetSize() const = 0;
    virtual SurfaceId GetTarget() const = 0;
    virtual const void* GetPixels(uint32_t index, size_t* size) const = 0;

  protected:
    ~StreamSource() = default;
};

class BufferSource final : public StreamSource {
  public:
    explicit BufferSource(const CommandBuffer& buffer) : buffer_(buffer) {}
    const void* GetData() const override { return buffer_.GetStream(); }
    size_t GetSize() const override { return buffer_.GetStreamSize(); }
    SurfaceId GetTarget() const override { return buffer_.GetTargetSurface(); }
    const void* GetPixels(uint32_t index, size_t* size) const override {
        return buffer_.GetPixels(index, size);
    }

  private:
    const CommandBuffer& buffer_;
};

class Backend : public CommandVisitor {
  public:
    virtual ~Backend() = default;
    // Runs the stream on its target; layers that it leaves open are closed. A stream whose target does not
    // exist runs all the same, for its resource records.
    virtual void Execute(const StreamSource& stream) = 0;
};

}  // namespace fresco
