// The clip of the CPU back end: a region of whole pixels, and a coverage mask where edges are not pixel
// edges. A clip is a value that is cheap to copy: rectangles and masks are shared and never change once made.
#pragma once
#include <atomic>
#include <memory>

#include "fresco/cpu/rasterizer.h"

namespace fresco::cpu {

// What the masks of all clips may hold together: nested states each keep theirs. Any thread that paints.
struct MaskBudget {
    static constexpr size_t kBytes = size_t(256) << 20;
    std::atomic<size_t> used{0};

    bool HasRoom(const IRect& bounds) const {
        return used.load(std::memory_order_relaxed) + size_t(bounds.Width()) * size_t(bounds.Height()) <=
               kBytes;
    }
};

// Coverage over `bounds`; everywhere else it is `outside` (0 or 255).
struct ClipMask {
    IRect bounds;
    uint8_t outside = 0;
    uint8_t* coverage = nullptr;
    MaskBudget* budget = nullptr;

    // Zeroed; without coverage when there is no memory.
    ClipMask(const IRect& area, MaskBudget* counted);
    ~ClipMask();
    ClipMask(const ClipMask&) = delete;
    ClipMask& operator=(const ClipMask&) = delete;
    size_t size() const { return size_t(bounds.Width()) * size_t(bounds.Height()); }

    // What the mask says from x0 to x1, its bounds or not: into a row, and times a row.
    void CopyRow(int y, int x0, int x1, uint8_t* out) const;
    void MultiplyRow(int y, int x0, int x1, uint8_t* out) const;
    // All of it is 255: the bounds say as much.
    bool IsFull() const;

    const uint8_t* Row(int y) const {
        return coverage + size_t(y - bounds.y0) * size_t(bounds.Width()) - bounds.x0;
    }
    uint8_t* Row(int y) { return coverage + size_t(y - bounds.y0) * size_t(bounds.Width()) - bounds.x0; }
};
using ClipMaskPtr = std::shared_ptr<ClipMask>;

// Zeroed coverage; null when there is nothing inside the bounds, or no memory. Counted in the budget when
// there is one.
ClipMaskPtr MakeClipMask(const IRect& bounds, MaskBudget* budget = nullptr);

// Collects coverage into a mask.
class MaskSink final : public CoverageSink {
  public:
    explicit MaskSink(ClipMask& mask) : mask_(mask) {}
    void Span(int y, int x0, int x1, uint8_t coverage) override {
        std::memset(mask_.Row(y) + x0, coverage, size_t(x1 - x0));
    }
    void Mask(int y, int x0, const uint8_t* coverage, int count) override {
        std::memcpy(mask_.Row(y) + x0, coverage, size_t(count));
    }

  private:
    ClipMask& mask_;
};

class Clip {
  public:
    Clip() = default;
    explicit Clip(const IRect& rect) : bounds_(rect) {}

    const IRect& bounds() const { return bounds_; }
    bool IsEmpty() const { return bounds_.IsEmpty(); }
    // Only whole pixels of one rectangle: nothing to test per span.
    bool IsSimple() const { return !rects_ && !mask_; }

    void IntersectRect(const IRect& rect);
    void ExcludeRect(const IRect& rect);
    void AddRect(const IRect& rect);
    void IntersectMask(ClipMaskPtr mask);
    // The complement of the mask.
    void ExcludeMask(const ClipMaskPtr& mask);
    void AddMask(const ClipMaskPtr& mask);

    // Sends the parts of a span or mask that the clip lets through.
    void Filter(int y, int x0, int x1, uint8_t coverage, CoverageSink& out) const;
    void Filter(int y, int x0, const uint8_t* coverage, int count, CoverageSink& out) const;

  private:
    void SetRects(Vector<IRect> rects);
    void ToMask(const IRect& bounds);
    template <class Emit>
    void ForEachSpan(int y, int x0, int x1, Emit emit) const;
    void FilterMasked(int y, int x0, int x1, const uint8_t* coverage, uint8_t constant,
                      CoverageSink& out) const;

    IRect bounds_;
    std::shared_ptr<const Vector<IRect>> rects_;  // disjoint; null: just the bounds
    std::shared_ptr<const ClipMask> mask_;
};

}  // namespace fresco::cpu
