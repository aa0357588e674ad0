// Cache sizes and statistics of a view. Setters only note a request; the frame carries it to the side that
// owns the cache.
#include "core/api_call.h"
#include "core/logging/log.h"
#include "core/view_impl.h"

namespace qorvex {

namespace {

// No scratch memory below this is of any use to the rendering library.
constexpr unsigned kMinScratchBytes = 4u << 20;

struct CacheRow {
    CacheType type;
    const char* zero_count_error;  // null: a count of 0 is taken
    const char* bytes_error;       // null: any size is taken
    int count_setting;             // of CacheRequests; -1 for caches of the view
    int bytes_setting;
};

constexpr CacheRow kCacheRows[] = {
    {CacheType::Shadows,
     "Unable to set the count size of the shadows cache to 0, because this is not a supported cache size!",
     "Unable to set the bytes size of a cache, which doesn't support this statistic!", -1, -1},
    {CacheType::Paths,
     "Unable to set the count size of the paths cache to 0, because this is not a supported cache size!",
     "Unable to set the bytes size of a cache, which doesn't support this statistic!", -1, -1},
    {CacheType::RenderingLibrary, nullptr, nullptr, CacheRequests::LibraryCacheCount,
     CacheRequests::LibraryCacheBytes},
    {CacheType::ScratchLayers,
     "Unable to set the count size of the scratch layers cache to 0, because this is not a supported cache "
     "size!",
     "Scratch layer capacity cannot be set to less than 4MB", CacheRequests::ScratchLayerCount,
     CacheRequests::ScratchLayerBytes},
    {CacheType::ScratchTextures,
     "Unable to set the count size of the scratch textures cache to 0, because this is not a supported cache "
     "size!",
     "Scratch texture capacity cannot be set to less than 4MB", CacheRequests::ScratchTextureCount,
     CacheRequests::ScratchTextureBytes},
};

const CacheRow* FindRow(CacheType type) {
    for (const CacheRow& row : kCacheRows)
        if (row.type == type) return &row;
    return nullptr;
}

bool IsViewSide(const CacheRow& row) {
    return row.count_setting < 0;
}

}  // namespace

void ViewImpl::SetCacheCountSize(CacheType type, unsigned count) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    const CacheRow* row = FindRow(type);
    if (!row) {
        LogError("Trying to set the count size of unknown type of cache!");
        return;
    }
    if (count == 0 && row->zero_count_error) {
        LogError(row->zero_count_error);
        return;
    }
    if (type == CacheType::Shadows)
        shadow_capacity_request_ = count;
    else if (type == CacheType::Paths)
        path_capacity_request_ = count;
    else
        cache_requests_.Set(static_cast<CacheRequests::Setting>(row->count_setting), count);
    cache_counts_[static_cast<size_t>(row - kCacheRows)] = count;
}

void ViewImpl::SetCacheBytesSize(CacheType type, unsigned bytes) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    const CacheRow* row = FindRow(type);
    if (!row) {
        LogError("Trying to set the bytes size of unknown type of cache!");
        return;
    }
    if (row->bytes_error && (IsViewSide(*row) || bytes < kMinScratchBytes)) {
        LogError(row->bytes_error);
        return;
    }
    cache_requests_.Set(static_cast<CacheRequests::Setting>(row->bytes_setting), bytes);
    cache_bytes_[static_cast<size_t>(row - kCacheRows)] = bytes;
}

void ViewImpl::GetCacheCountStats(CacheType type, unsigned* current, unsigned* capacity) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    const CacheRow* row = FindRow(type);
    if (!row) {
        LogError("Trying to get cache count stats for unknown type of cache!");
        return;
    }
    NoteCacheUse();
    // The rendering library reports no use of its caches.
    if (current) *current = IsViewSide(*row) ? cache_use_[static_cast<size_t>(row - kCacheRows)] : 0;
    if (capacity) *capacity = cache_counts_[static_cast<size_t>(row - kCacheRows)];
}

void ViewImpl::GetCacheBytesStats(CacheType type, size_t* current, size_t* capacity) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    const CacheRow* row = FindRow(type);
    if (!row || IsViewSide(*row)) {
        LogError("The specified cache doesn't have the bytes statistic!");
        return;
    }
    // The rendering library reports no use of its caches; only what was asked for is known.
    if (current) *current = 0;
    if (capacity) *capacity = cache_bytes_[static_cast<size_t>(row - kCacheRows)];
}

// The caches of the view belong to the layout side while a frame is there: the last known use is then the
// answer.
void ViewImpl::NoteCacheUse() {
    if (layout_unblocked_.load(std::memory_order_acquire) == 0) return;
    cache_use_[0] = static_cast<unsigned>(render_caches_.shadows.Size());
    cache_use_[1] = static_cast<unsigned>(render_caches_.paths.Size());
}

// Main thread, with the layout side idle.
void ViewImpl::ApplyViewSideCacheRequests() {
    if (shadow_capacity_request_ != 0) render_caches_.shadows.SetCapacity(shadow_capacity_request_);
    if (path_capacity_request_ != 0) render_caches_.paths.SetCapacity(path_capacity_request_);
    shadow_capacity_request_ = path_capacity_request_ = 0;
    const uint32_t clears = cache_requests_.TakeViewSideClears();
    if (clears & static_cast<uint32_t>(CacheType::Shadows)) render_caches_.shadows.Clear();
    if (clears & static_cast<uint32_t>(CacheType::Paths)) render_caches_.paths.Clear();
}

void ViewImpl::ClearCaches(uint32_t mask) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    cache_requests_.Clear(mask);
}

}  // namespace qorvex
