// The rendering library with a small surface to draw on. It is made anew for each input, and every byte that
// it took has to be back at the end.
#pragma once

#include <fresco/rendering_library.h>

#include <array>
#include <cstdint>
#include <span>

namespace qorvex::fuzz {

class FrescoAllocator final : public fresco::IAllocator {
  public:
    void* Allocate(size_t size, size_t alignment) override;
    void Deallocate(void* block, size_t alignment) override;
    long live = 0;
};

class SilentLog final : public fresco::Logging::ILogHandler {
  public:
    void WriteLog(fresco::Logging::Severity, const char*, size_t) override {}
};

class Scene {
  public:
    Scene();
    ~Scene();
    Scene(const Scene&) = delete;
    Scene& operator=(const Scene&) = delete;

    fresco::IRenderingLibrary& library() { return *library_; }
    /// Runs the buffer on the surface and releases it.
    void Draw(fresco::CommandBuffer* buffer);
    /// Runs a frame's buffers, those of its resources first; they stay the caller's.
    void Draw(std::span<fresco::CommandBuffer* const> resources,
              std::span<fresco::CommandBuffer* const> drawing);

  private:
    static constexpr uint32_t kSide = 64;

    FrescoAllocator allocator_;
    SilentLog log_;
    fresco::IRenderingLibrary* library_;
    fresco::IScene* scene_;
    std::array<uint32_t, kSide * kSide> pixels_{};
    fresco::CpuRenderTarget target_;
};

}  // namespace qorvex::fuzz
