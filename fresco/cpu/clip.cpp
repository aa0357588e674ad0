#include "fresco/cpu/clip.h"

#include "fresco/cpu/rows.h"

namespace fresco::cpu {
namespace {

// A region of more rectangles than this becomes a mask: spans are tested against each one.
constexpr size_t kMaxRegionRects = 64;
// Spans that pass a mask are handled in pieces of this length.
constexpr int kPiece = 512;
constexpr size_t kMaskAlignment = 64;

// What of `a` lies outside of `b`, as at most four rectangles.
void Subtract(const IRect& a, const IRect& b, Vector<IRect>* out) {
    const IRect common = Intersect(a, b);
    if (common.IsEmpty()) {
        out->push_back(a);
        return;
    }
    if (a.y0 < common.y0) out->push_back({a.x0, a.y0, a.x1, common.y0});
    if (a.x0 < common.x0) out->push_back({a.x0, common.y0, common.x0, common.y1});
    if (common.x1 < a.x1) out->push_back({common.x1, common.y0, a.x1, common.y1});
    if (common.y1 < a.y1) out->push_back({a.x0, common.y1, a.x1, a.y1});
}

}  // namespace

ClipMask::ClipMask(const IRect& area, MaskBudget* counted) : bounds(area), budget(counted) {
    coverage = static_cast<uint8_t*>(HeapAllocate(size(), kMaskAlignment));
    if (coverage) std::memset(coverage, 0, size());
    if (budget) budget->used.fetch_add(size(), std::memory_order_relaxed);
}

ClipMask::~ClipMask() {
    HeapFree(coverage, kMaskAlignment);
    if (budget) budget->used.fetch_sub(size(), std::memory_order_relaxed);
}

ClipMaskPtr MakeClipMask(const IRect& bounds, MaskBudget* budget) {
    if (bounds.IsEmpty()) return nullptr;
    auto mask = std::allocate_shared<ClipMask>(StdAllocator<ClipMask>(), bounds, budget);
    return mask->coverage ? mask : nullptr;
}

void ClipMask::CopyRow(int y, int x0, int x1, uint8_t* out) const {
    const int a = std::clamp(bounds.x0, x0, x1), b = std::clamp(bounds.x1, a, x1);
    if (y < bounds.y0 || y >= bounds.y1 || a == b) {
        std::memset(out, outside, size_t(x1 - x0));
        return;
    }
    std::memset(out, outside, size_t(a - x0));
    std::memcpy(out + (a - x0), Row(y) + a, size_t(b - a));
    std::memset(out + (b - x0), outside, size_t(x1 - b));
}

void ClipMask::MultiplyRow(int y, int x0, int x1, uint8_t* out) const {
    const int a = std::clamp(bounds.x0, x0, x1), b = std::clamp(bounds.x1, a, x1);
    const bool inside = y >= bounds.y0 && y < bounds.y1 && a < b;
    if (inside) Rows().MultiplyMask(out + (a - x0), Row(y) + a, b - a);
    if (outside != 0) return;
    std::memset(out, 0, size_t((inside ? a : x1) - x0));
    if (inside) std::memset(out + (b - x0), 0, size_t(x1 - b));
}

bool ClipMask::IsFull() const {
    // Most masks tell by their corners.
    if (coverage[0] != 255 || coverage[size() - 1] != 255) return false;
    return std::memcmp(coverage, coverage + 1, size() - 1) == 0;
}

void Clip::SetRects(Vector<IRect> rects) {
    bounds_ = {};
    for (const IRect& rect : rects)
        bounds_ = Unite(bounds_, rect);
    if (rects.size() <= 1) {
        rects_ = nullptr;
        return;
    }
    rects_ = std::allocate_shared<Vector<IRect>>(StdAllocator<Vector<IRect>>(), std::move(rects));
    if (rects_->size() > kMaxRegionRects) ToMask(bounds_);
}

// The whole clip as one mask over `bounds`, nothing outside.
void Clip::ToMask(const IRect& bounds) {
    ClipMaskPtr flat = MakeClipMask(bounds);
    if (flat) {
        MaskSink sink(*flat);
        const IRect visible = Intersect(bounds, bounds_);
        for (int y = visible.y0; y < visible.y1; ++y)
            Filter(y, visible.x0, visible.x1, 255, sink);
    }
    bounds_ = flat ? bounds : IRect{};
    rects_ = nullptr;
    mask_ = flat;
}

void Clip::IntersectRect(const IRect& rect) {
    if (!rects_) {
        bounds_ = Intersect(bounds_, rect);
        return;
    }
    Vector<IRect> kept;
    for (const IRect& r : *rects_) {
        const IRect common = Intersect(r, rect);
        if (!common.IsEmpty()) kept.push_back(common);
    }
    SetRects(std::move(kept));
}

void Clip::ExcludeRect(const IRect& rect) {
    if (Intersect(bounds_, rect).IsEmpty()) return;
    Vector<IRect> kept;
    if (rects_) {
        for (const IRect& r : *rects_)
            Subtract(r, rect, &kept);
    } else {
        Subtract(bounds_, rect, &kept);
    }
    SetRects(std::move(kept));
}

void Clip::AddRect(const IRect& rect) {
    if (rect.IsEmpty()) return;
    if (mask_) {
        ClipMaskPtr added = MakeClipMask(rect);
        if (!added) return;
        std::memset(added->coverage, 255, added->size());
        return AddMask(added);
    }
    Vector<IRect> rects, pieces, rest;
    if (rects_)
        rects = *rects_;
    else if (!bounds_.IsEmpty())
        rects.push_back(bounds_);
    pieces.push_back(rect);
    for (const IRect& old : rects) {
        rest.clear();
        for (const IRect& piece : pieces)
            Subtract(piece, old, &rest);
        std::swap(pieces, rest);
    }
    rects.insert(rects.end(), pieces.begin(), pieces.end());
    SetRects(std::move(rects));
}

void Clip::IntersectMask(ClipMaskPtr mask) {
    if (!mask) {
        *this = Clip();
        return;
    }
    if (mask->outside == 0) IntersectRect(mask->bounds);
    if (bounds_.IsEmpty()) return;
    if (mask_) {
        // The product of both, over where at least one of them says something of its own.
        IRect area = bounds_;
        if (mask->outside && mask_->outside) area = Intersect(bounds_, Unite(mask->bounds, mask_->bounds));
        ClipMaskPtr product = MakeClipMask(area, mask->budget);
        if (!product) {
            *this = Clip();
            return;
        }
        product->outside = mask->outside & mask_->outside;
        for (int y = area.y0; y < area.y1; ++y) {
            mask->CopyRow(y, area.x0, area.x1, product->Row(y) + area.x0);
            mask_->MultiplyRow(y, area.x0, area.x1, product->Row(y) + area.x0);
        }
        mask_ = product;
        return;
    }
    mask_ = std::move(mask);
}

void Clip::ExcludeMask(const ClipMaskPtr& mask) {
    if (!mask) return;
    ClipMaskPtr complement = MakeClipMask(mask->bounds, mask->budget);
    if (!complement) return;
    for (size_t i = 0; i < complement->size(); ++i)
        complement->coverage[i] = uint8_t(255 - mask->coverage[i]);
    complement->outside = 255;
    IntersectMask(std::move(complement));
}

void Clip::AddMask(const ClipMaskPtr& mask) {
    if (!mask) return;
    ToMask(Unite(bounds_, mask->bounds));
    if (!mask_) return;
    auto sum = std::const_pointer_cast<ClipMask>(mask_);  // fresh from ToMask: nobody else has it
    for (int y = mask->bounds.y0; y < mask->bounds.y1; ++y) {
        const uint8_t* from = mask->Row(y);
        uint8_t* to = sum->Row(y);
        for (int x = mask->bounds.x0; x < mask->bounds.x1; ++x)
            to[x] = uint8_t(to[x] + MulDiv255(255u - to[x], from[x]));
    }
}

template <class Emit>
void Clip::ForEachSpan(int y, int x0, int x1, Emit emit) const {
    const auto part = [&](const IRect& r) {
        if (y < r.y0 || y >= r.y1) return;
        const int a = std::max(x0, r.x0), b = std::min(x1, r.x1);
        if (a < b) emit(a, b);
    };
    if (!rects_) return part(bounds_);
    for (const IRect& r : *rects_)
        part(r);
}

// [x0, x1) lies in the region. `coverage` is indexed by x; null means `constant`.
void Clip::FilterMasked(int y, int x0, int x1, const uint8_t* coverage, uint8_t constant,
                        CoverageSink& out) const {
    const auto plain = [&](int a, int b) {
        if (a >= b || mask_->outside == 0) return;
        if (coverage)
            out.Mask(y, a, coverage + a, b - a);
        else
            out.Span(y, a, b, constant);
    };
    const IRect& m = mask_->bounds;
    if (y < m.y0 || y >= m.y1) return plain(x0, x1);
    plain(x0, std::min(x1, m.x0));
    const uint8_t* row = mask_->Row(y);
    const int inner = std::max(x0, m.x0), end = std::min(x1, m.x1);
    uint8_t product[kPiece];
    for (int x = inner; x < end;) {
        const int count = std::min(kPiece, end - x);
        if (!coverage && constant == 255) {
            out.Mask(y, x, row + x, count);
        } else {
            Rows().ScaleMask(product, row + x, count, coverage ? 255 : constant);
            if (coverage) Rows().MultiplyMask(product, coverage + x, count);
            out.Mask(y, x, product, count);
        }
        x += count;
    }
    plain(std::max(x0, m.x1), x1);
}

void Clip::Filter(int y, int x0, int x1, uint8_t coverage, CoverageSink& out) const {
    ForEachSpan(y, x0, x1, [&](int a, int b) {
        if (mask_)
            FilterMasked(y, a, b, nullptr, coverage, out);
        else
            out.Span(y, a, b, coverage);
    });
}

void Clip::Filter(int y, int x0, const uint8_t* coverage, int count, CoverageSink& out) const {
    ForEachSpan(y, x0, x0 + count, [&](int a, int b) {
        if (mask_)
            FilterMasked(y, a, b, coverage - x0, 255, out);
        else
            out.Mask(y, a, coverage + (a - x0), b - a);
    });
}

}  // namespace fresco::cpu
