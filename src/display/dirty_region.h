// The part of a view that must be painted again: at most 64 rectangles and their bounds.
//
// Written on the layout thread between commit and recording, and on the DOM thread at the commit; moved,
// never shared, between them.
#pragma once

#include "core/memory/containers.h"
#include "layout/geometry.h"

#include <array>

namespace qorvex::dsp {

class DirtyRegion {
  public:
    static constexpr uint32_t kCapacity = 64;
    // What a recording gets as its scissor list.
    static constexpr uint32_t kScissorCount = 8;

    void Add(const layout::Rect& area) {
        // Frames that repaint everything add thousands of rectangles to one that holds them all.
        const bool held = count_ > 0 && layout::Contains(rects_[count_ - 1], area);
        if (!held || layout::Contains(area, bounds_)) Insert(area);
    }
    void Add(const DirtyRegion& other);
    bool Empty() const { return count_ == 0; }
    // Area of the bounds above the tolerance, the frame's test for "something to paint".
    bool HasArea() const;
    const layout::Rect& Bounds() const { return bounds_; }
    uint32_t Count() const { return count_; }
    const layout::Rect* begin() const { return rects_.data(); }
    const layout::Rect* end() const { return rects_.data() + count_; }

    // Reduces the region to at most kScissorCount rectangles, which the caller reads by begin() and end().
    void ReduceForScissors() { Reduce(kScissorCount); }
    void Clear();

  private:
    void Insert(const layout::Rect& area);
    void Reduce(uint32_t target);

    layout::Rect bounds_{};
    std::array<layout::Rect, kCapacity + 1> rects_{};
    uint32_t count_ = 0;
};

}  // namespace qorvex::dsp
