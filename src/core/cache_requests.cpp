#include "core/cache_requests.h"

namespace qorvex {

namespace {

struct Target {
    fresco::SceneCache cache;
    fresco::CacheLimit limit;
};

constexpr Target kTargets[CacheRequests::kSettingCount] = {
    {fresco::SceneCache::ScratchLayers, fresco::CacheLimit::Bytes},
    {fresco::SceneCache::ScratchLayers, fresco::CacheLimit::Count},
    {fresco::SceneCache::ScratchTextures, fresco::CacheLimit::Bytes},
    {fresco::SceneCache::ScratchTextures, fresco::CacheLimit::Count},
    {fresco::SceneCache::Cache4, fresco::CacheLimit::Count},
    {fresco::SceneCache::Cache4, fresco::CacheLimit::Bytes},
};

constexpr CacheType kClearable[] = {CacheType::RenderingLibrary, CacheType::ScratchLayers,
                                    CacheType::ScratchTextures};

}  // namespace

bool CacheRequests::Empty() const {
    return clear_mask_ == 0 && std::none_of(set_.begin(), set_.end(), [](bool set) { return set; });
}

void CacheRequests::Apply(fresco::IScene& scene) const {
    for (uint32_t i = 0; i < kSettingCount; ++i)
        if (set_[i]) scene.SetCacheLimit(kTargets[i].cache, kTargets[i].limit, values_[i]);
    for (CacheType type : kClearable)
        if (clear_mask_ & static_cast<uint32_t>(type)) scene.ClearCaches(static_cast<uint32_t>(type));
}

}  // namespace qorvex
