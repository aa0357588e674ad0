// The values that running animations and transitions give an element now. Written by the animation side, read
// by style solving, which prefers them to the cascade. One slot for each property that can be animated,
// derived from the property table.
//
// Invariant: `totalActive` is the sum of `activeCount`; a slot counts only while its property's count is not
// 0.
#pragma once

#include <array>
#include <atomic>
#include <cstdint>

#include "core/memory/containers.h"
#include "css/values/property_set.h"
#include "css/values/property_values.h"
#include "qsl/ref_ptr.h"

namespace qorvex::css {

// A value per animatable property, in a field named like the style group's.
struct AnimatedValues {
#define QORVEX_SLOT_ANIMATED(type, field) type field{};
#define QORVEX_SLOT_STEPPED(type, field)
#define QORVEX_ROW(id, name, type, parser, field, inheritance, animation, ...) \
    QORVEX_SLOT_##animation(type, field)
    QORVEX_CSS_LONGHANDS(QORVEX_ROW)
#undef QORVEX_ROW
#undef QORVEX_SLOT_STEPPED
#undef QORVEX_SLOT_ANIMATED
};

class AnimatedProperties {
  public:
    AnimatedProperties() = default;
    virtual ~AnimatedProperties() = default;
    AnimatedProperties(const AnimatedProperties&) = delete;
    AnimatedProperties& operator=(const AnimatedProperties&) = delete;

    void AddRef() const { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() const {
        if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1)
            Delete<MemoryTag::CSS>(const_cast<AnimatedProperties*>(this));
    }

    bool IsActive(PropertyId id) const { return activeCount[IndexOf(id)] != 0; }

    AnimatedValues present;
    std::array<uint8_t, kLonghandCount> activeCount = {};
    uint32_t totalActive = 0;
    PropertySet dirty;  // slots written since style solving last took them

  private:
    mutable std::atomic<uint32_t> count_{1};
};

// Of an element with transitions: also where each of them ends. A target that differs from the cascade's
// value is how style solving tells the transition side to start anew.
class TransitionProperties final : public AnimatedProperties {
  public:
    AnimatedValues targets;
    PropertySet changed;  // targets that changed since the last retarget
};

}  // namespace qorvex::css
