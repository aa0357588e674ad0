// The clip of the CPU back end: a region of whole pixels, and a coverage mask where edges are not pixel
// edges. A clip is a value that is cheap to copy: rectangles and masks are shared and never change once made.
#pragma once
#include <memory>

#include "fresco/cpu/rasterizer.h"

namespace fresco::cpu {

// Coverage over `bounds`; everywhere else it is `outside` (0 or 255).
struct ClipMask {
    IRect bounds;
    uint8_t outside = 0;
    Vector<uint8_t> coverage;

    const uint8_t* Row(int y) const {
        return coverage.data() + size_t(y - bounds.y0) * size_t(bounds.Width()) - bounds.x0;
    }
    uint8_t* Row(int y) {
        return coverage.data() + size_t(y - bounds.y0) * size_t(bounds.Width()) - bounds.x0;
    }
};
using ClipMaskPtr = std::shared_ptr<ClipMask>;

// Zeroed coverage; null when there is nothing inside the bounds.
ClipMaskPtr MakeClipMask(const IRect& bounds);

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
