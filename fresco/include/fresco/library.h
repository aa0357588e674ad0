// Process-wide entries. They may be called from any thread, between the start of the first rendering library
// and the end of the last; before that they use malloc and log nowhere.
#pragma once
#include <fresco/allocator.h>
#include <fresco/command_buffer.h>
#include <fresco/image.h>
#include <fresco/logging.h>

namespace fresco {

class Library {
  public:
    // `size`: bytes to reserve; 0 takes a default. Never null but without memory.
    static CommandBuffer* CreateBuffer(size_t size, uint32_t flags);
    static CommandBuffer* CreateBufferForSurface(SurfaceId surface, size_t size, uint32_t flags);
    static ImageId GetImageName();
    static SurfaceId GetSurfaceName();
    // Frame `frameIndex` of a PNG, JPEG, WebP or GIF in memory. `delay` is in hundredths of a second. A hint
    // of 0 is none; with hints a JPEG may come smaller than it is, but not smaller than they say.
    // Frames of an animation are cheap in order, from 0 on, while the file stays where it is; who stops early
    // asks for one past the last, so that nothing is kept for the next one.
    static ImageDecodeResult DecodeImageMemory(const void* data, size_t size, uint32_t frameIndex,
                                               uint32_t widthHint, uint32_t heightHint, bool premultiply,
                                               ImageInfo& info, uint32_t& frameCount, uint32_t& delay,
                                               FrameResult* result, PixelFormat format);
    static void FreeDecodedImage(void* pixels);
    static void EnableDebugNames(bool enable);

    // For implementations of IRenderingLibrary: which allocator and log handler the process-wide entries use.
    // Calls nest; the first one's arguments hold until its Stop.
    static void Start(IAllocator* allocator, Logging::ILogHandler* log, uint32_t severity);
    static void Stop();
};

}  // namespace fresco
