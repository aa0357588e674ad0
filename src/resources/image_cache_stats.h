// What the client may ask of the image cache: a snapshot of it, and the images of one page.
#pragma once

#include <qorvex/cache_stats.h>
#include <qorvex/images_list.h>

#include "core/memory/containers.h"

namespace qorvex {

class SystemCacheStatsImpl final : public SystemCacheStats {
  public:
    void Destroy() override { Delete<MemoryTag::General>(this); }
    const SystemCacheStatsData& GetData() const override { return data_; }

    void AddLive(std::string_view url, uint32_t width, uint32_t height, uint32_t holders);
    void AddOrphan(std::string_view url, uint32_t width, uint32_t height);
    // After the last image.
    void Finish();

  private:
    struct Images {
        Vector<SystemCacheImageStats> entries;
        Vector<String> urls;
        uint64_t bytes = 0;

        void Add(std::string_view url, uint32_t width, uint32_t height, uint32_t holders);
        void Finish();
    };
    Images live_;
    Images orphaned_;
    SystemCacheStatsData data_;
};

class ImagesListImpl final : public ImagesList {
  public:
    const char* GetNext() override { return next_ < urls_.size() ? urls_[next_++].c_str() : nullptr; }
    void Reset() override { next_ = 0; }
    void Destroy() override { Delete<MemoryTag::General>(this); }

    // Each URL once.
    void Add(std::string_view url);

  private:
    HashSet<String> known_;
    Vector<String> urls_;
    uint32_t next_ = 0;
};

}  // namespace qorvex
