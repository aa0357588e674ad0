// Images and surfaces by id, for all scenes of a library. Render thread only, but for what says so. Images
// are shared; a surface belongs to the scene whose buffers made it and goes with it at the latest.
#pragma once
#include <fresco/command_records.h>

#include <atomic>
#include <mutex>

#include "fresco/cpu/pixels.h"

namespace fresco::cpu {

// A picture as draws read it. Mip levels are made when a draw first shrinks below one half.
struct Texture {
    PixelBuffer pixels;     // RGBA8 premultiplied; empty for A8
    Vector<uint8_t> alpha;  // A8 content
    uint32_t width = 0, height = 0;
    bool opaque = false;
    uint32_t sourceFormat = 0;  // PixelFormat of updates
    uint32_t flags = 0;         // ImageFlags
    const UserImage* user = nullptr;
    uint32_t owner = 0;          // of a surface
    Vector<PixelBuffer> levels;  // half sizes, from the second level on
    bool levelsValid = false;
    uint64_t readIn = 0;  // the frame in which a user image was read last
};

class Resources {
  public:
    // From here on user images are read anew, each at its first use.
    void BeginFrame() {
        ++frame_;
        DropRetired();
    }
    // Null when absent. Any thread that paints.
    Texture* FindImage(ImageId id);
    Texture* FindSurface(SurfaceId id);
    // The level for a draw that shows `scale` device pixels a texel. Any thread that paints.
    const PixelBuffer& FindLevel(Texture& texture, double scale);
    void CreateImage(const CreateImageRecord& record, const void* pixels, size_t size);
    void UpdateImage(const UpdateImageRecord& record, const void* pixels, size_t size);
    void DestroyImage(ImageId id) { images_.erase(id); }
    void CreateSurface(const CreateSurfaceRecord& record, uint32_t owner = 0);
    void DestroySurface(SurfaceId id) { surfaces_.erase(id); }
    // A number for whoever makes surfaces.
    uint32_t NewOwner() { return nextOwner_.fetch_add(1, std::memory_order_relaxed); }
    void DestroySurfacesOf(uint32_t owner);
    // Any thread: the owner has gone, and its surfaces go with the next DropRetired.
    void RetireOwner(uint32_t owner);
    // The same for images.
    void RetireImages(const ImageId* ids, uint32_t count);
    void DropRetired();
    void Clear();
    // For replays: pixels as a capture stored them.
    bool RestoreImage(ImageId id, uint32_t format, uint32_t width, uint32_t height, const uint8_t* data);
    bool RestoreSurface(SurfaceId id, uint32_t width, uint32_t height, const uint8_t* data);

  private:
    void Load(Texture& texture, const uint8_t* pixels, size_t pitch);

    std::mutex mutex_;  // what painting threads change: user images and levels
    uint64_t frame_ = 1;
    HashMap<ImageId, Texture> images_;
    HashMap<SurfaceId, Texture> surfaces_;
    std::atomic<uint32_t> nextOwner_{1};
    std::atomic<bool> anyRetired_{false};
    std::mutex retiredMutex_;
    Vector<uint32_t> retired_;       // under retiredMutex_
    Vector<ImageId> retiredImages_;  // under retiredMutex_
};

}  // namespace fresco::cpu
