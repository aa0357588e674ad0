// Surfaces that hold blurred shadows, kept between frames. The key is all that the pixels depend on; the
// position is not part of it, so equal boxes share one surface.
#pragma once

#include "display/frame_record.h"
#include "display/lru_cache.h"

namespace qorvex::dsp {

struct CachedShadow {
    fresco::SurfaceId surface = fresco::kNoId;
    uint32_t width = 0;
    uint32_t height = 0;
};

class ShadowCache {
  public:
    static constexpr uint32_t kDefaultCapacity = 32;

    uint32_t Size() const { return cache_.Size(); }
    uint32_t Capacity() const { return cache_.Capacity(); }
    void SetCapacity(uint32_t capacity) { cache_.SetCapacity(capacity, Collector()); }
    // The surfaces are freed with the next frame.
    void Clear() { cache_.Clear(Collector()); }
    // The surfaces are gone already.
    void Forget();

    const CachedShadow* Find(std::string_view key) { return cache_.Find(key); }
    // Makes an empty surface of the size under the key and the buffer that draws into it; both travel with
    // the frame. Null when the surface would be empty or too large to be worth it.
    fresco::CommandBuffer* Render(std::string_view key, float width, float height, FrameRecord& record,
                                  CachedShadow& out);

    // Gives surfaces that were evicted to the frame.
    void FlushEvicted(FrameRecord& record);

  private:
    struct CollectEvicted {
        Vector<fresco::SurfaceId, MemoryTag::Rendering>& list;
        void operator()(const CachedShadow& shadow) { list.push_back(shadow.surface); }
    };
    CollectEvicted Collector() { return {evicted_}; }

    LruCache<CachedShadow> cache_{kDefaultCapacity};
    Vector<fresco::SurfaceId, MemoryTag::Rendering> evicted_;
};

}  // namespace qorvex::dsp
