// What the image cache of a system holds (System::CreateCacheStats).
#pragma once

#include <cstdint>

namespace qorvex {

// One image. The texts live as long as the statistics object.
struct SystemCacheImageStats {
    const char* URL = nullptr;
    std::uint32_t Width = 0;
    std::uint32_t Height = 0;
    std::uint32_t Holders = 0;  // uses by elements; 0 for an orphan
};

struct SystemCacheStatsData {
    std::uint32_t LiveImageCount = 0;
    std::uint32_t OrphanedImageCount = 0;
    std::uint64_t LiveImageBytes = 0;
    std::uint64_t OrphanedImageBytes = 0;
    const SystemCacheImageStats* LiveImages = nullptr;      // LiveImageCount entries
    const SystemCacheImageStats* OrphanedImages = nullptr;  // OrphanedImageCount entries
};

// A snapshot. Owned by the caller, released with Destroy on the main thread. Implemented by the engine.
class SystemCacheStats {
  protected:
    virtual ~SystemCacheStats() = default;

  public:
    virtual void Destroy() = 0;
    virtual const SystemCacheStatsData& GetData() const = 0;
};

}  // namespace qorvex
