// Cache settings that a client asked for, on their way to the render thread. A flag tells which entries are
// set.
#pragma once

#include <fresco/scene.h>
#include <qorvex/view.h>

#include <array>
#include <cstdint>

namespace qorvex {

class CacheRequests {
  public:
    // In the order in which the render thread applies them.
    enum Setting : uint32_t {
        ScratchLayerBytes,
        ScratchLayerCount,
        ScratchTextureBytes,
        ScratchTextureCount,
        LibraryCacheCount,
        LibraryCacheBytes,
        kSettingCount,
    };

    void Set(Setting setting, uint64_t value) {
        values_[setting] = value;
        set_[setting] = true;
    }
    void Clear(uint32_t mask) { clear_mask_ |= mask; }

    // Clears of caches that the view keeps itself; taken out of the request.
    uint32_t TakeViewSideClears() {
        constexpr uint32_t kViewSide =
            static_cast<uint32_t>(CacheType::Shadows) | static_cast<uint32_t>(CacheType::Paths);
        const uint32_t taken = clear_mask_ & kViewSide;
        clear_mask_ &= ~kViewSide;
        return taken;
    }
    bool Empty() const;
    // Render thread.
    void Apply(fresco::IScene& scene) const;

  private:
    std::array<uint64_t, kSettingCount> values_{};
    std::array<bool, kSettingCount> set_{};
    uint32_t clear_mask_ = 0;
};

}  // namespace qorvex
