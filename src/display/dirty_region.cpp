#include "display/dirty_region.h"

#include <algorithm>

namespace qorvex::dsp {

using layout::Contains;
using layout::Intersects;
using layout::Rect;
using layout::Union;

namespace {
constexpr float kMinArea = 0.001f;

Rect Inflate(const Rect& rect, float margin) {
    return {rect.x - margin, rect.y - margin, 0, rect.width + 2 * margin, rect.height + 2 * margin};
}
}  // namespace

void DirtyRegion::Insert(const Rect& area) {
    if (!layout::IsFinite(area)) return;
    // No view reaches so far; the bound keeps unions and the growing margins of Reduce finite.
    constexpr float kFar = 1e7f;
    const Rect rect = layout::Intersection(area, {-kFar, -kFar, 0, 2 * kFar, 2 * kFar});
    if (rect.width * rect.height < kMinArea) return;
    if (count_ == 0 || Contains(rect, bounds_)) {
        rects_[0] = rect;
        count_ = 1;
        bounds_ = rect;
        return;
    }
    if (Contains(rects_[count_ - 1], rect)) return;
    bounds_ = Union(bounds_, rect);
    for (uint32_t i = 0; i < count_; ++i) {
        if (!Intersects(rects_[i], rect)) continue;
        const Rect merged = Union(rects_[i], rect);
        std::copy(rects_.begin() + i + 1, rects_.begin() + count_, rects_.begin() + i);
        rects_[count_ - 1] = merged;
        return;
    }
    rects_[count_++] = rect;
    if (count_ > kCapacity) Reduce(kCapacity);
}

void DirtyRegion::Add(const DirtyRegion& other) {
    for (const Rect& rect : other)
        Add(rect);
}

bool DirtyRegion::HasArea() const {
    return count_ > 0 && bounds_.width * bounds_.height > kMinArea;
}

void DirtyRegion::Clear() {
    count_ = 0;
    bounds_ = {};
}

void DirtyRegion::Reduce(uint32_t target) {
    for (float margin = 4; count_ > target; margin *= 2) {
        for (uint32_t i = 0; i < count_ && count_ > target; ++i) {
            const Rect reach = Inflate(rects_[i], margin);
            for (uint32_t k = count_; k-- > 0;) {
                if (k == i || !Intersects(reach, rects_[k])) continue;
                rects_[i] = Union(rects_[i], rects_[k]);
                // The order of the list carries no meaning, so the last one fills the gap.
                const uint32_t last = --count_;
                if (last == i) {
                    rects_[k] = rects_[i];
                    i = k;
                } else {
                    rects_[k] = rects_[last];
                }
            }
        }
    }
}

}  // namespace qorvex::dsp
