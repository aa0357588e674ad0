#include "display/shadow_cache.h"

#include "core/limits.h"

#include <fresco/library.h>

#include <cmath>

namespace qorvex::dsp {

void ShadowCache::Forget() {
    cache_.Clear([](const CachedShadow&) {});
    evicted_.clear();
}

fresco::CommandBuffer* ShadowCache::Render(std::string_view key, float width, float height,
                                           FrameRecord& record, CachedShadow& out) {
    const float limit = static_cast<float>(limits::kMaxShadowSurfaceSide);
    if (!(width > 0 && height > 0) || width > limit || height > limit) return nullptr;
    auto even = [](float size) { return (static_cast<uint32_t>(std::ceil(size)) + 1) & ~1u; };
    out = {fresco::Library::GetSurfaceName(), even(width), even(height)};
    fresco::CommandBuffer* buffer = fresco::Library::CreateBufferForSurface(out.surface, 256, 0);
    if (buffer == nullptr) return nullptr;
    buffer->CreateSurface(out.surface, {out.width, out.height, fresco::PixelFormat::RGBA8}, 0);
    buffer->SetDebugName(out.surface, "CachedShadow");
    buffer->ClearRect({0, 0, 0, static_cast<float>(out.width), static_cast<float>(out.height)}, 1);
    record.resourceBuffers.push_back(buffer);
    cache_.Insert(key, out, Collector());
    FlushEvicted(record);
    return buffer;
}

void ShadowCache::FlushEvicted(FrameRecord& record) {
    record.surfacesToFree.append(evicted_.begin(), evicted_.end());
    evicted_.clear();
}

}  // namespace qorvex::dsp
