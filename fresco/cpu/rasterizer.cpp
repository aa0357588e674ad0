#include "fresco/cpu/rasterizer.h"

#include <bit>

#include "fresco/cpu/edge_area.h"

namespace fresco::cpu {
void CoverageSink::Rows(int y, int rows, std::span<const Piece> pieces, const uint8_t* masks) {
    for (const int end = y + rows; y < end; ++y) {
        const uint8_t* mask = masks;
        for (const Piece& piece : pieces) {
            if (piece.masked) {
                Mask(y, piece.x, mask, piece.count);
                mask += piece.count;
            } else {
                Span(y, piece.x, piece.x + piece.count, piece.coverage);
            }
        }
    }
}

void Rasterizer::Begin(const IRect& bounds) {
    bounds_ = bounds;
    edges_.clear();
    firstRow_ = bounds.y1;
    lastRow_ = bounds.y0 - 1;
    small_ = false;
}

void Rasterizer::AccumulateRow(const Edge& edge, int row) {
    const int64_t rowTop = int64_t(row) << kShift, left = int64_t(bounds_.x0) << kShift;
    const int64_t y0 = std::max(edge.top, rowTop), y1 = std::min(edge.bottom, rowTop + kOne);
    const int64_t above = edge.x + Across(y0 - edge.y, edge.slope);
    const int64_t below = edge.slope == 0 ? above : edge.x + Across(y1 - edge.y, edge.slope);
    Accumulate(above - left, below - left, int32_t(y1 - y0), edge.winding, bounds_.Width(),
               [this](int x, int32_t value) { AddCell(x, value); });
}

void Rasterizer::AddContour(const Vec2* points, size_t count) {
    if (small_) return AddToGrid(points, count);
    for (size_t i = 0, j = count - 1; i < count; j = i++)
        AddLine(points[j], points[i]);
}

void Rasterizer::AddLine(Vec2 from, Vec2 to) {
    int64_t top = ToFixed(from.y), bottom = ToFixed(to.y), x = ToFixed(from.x), lowerX = ToFixed(to.x);
    if (top == bottom) return;
    int32_t winding = 1;
    if (top > bottom) {
        std::swap(top, bottom);
        std::swap(x, lowerX);
        winding = -1;
    }
    const int64_t clipTop = int64_t(bounds_.y0) << kShift, clipBottom = int64_t(bounds_.y1) << kShift;
    if (bottom <= clipTop || top >= clipBottom) return;
    if (std::min(x, lowerX) >= int64_t(bounds_.x1) << kShift) return;
    Edge edge;
    edge.x = x, edge.y = top;
    edge.slope = double(lowerX - x) / double(bottom - top);
    edge.top = std::max(top, clipTop), edge.bottom = std::min(bottom, clipBottom);
    edge.winding = winding, edge.next = -1;
    firstRow_ = std::min(firstRow_, int(edge.top >> kShift));
    lastRow_ = std::max(lastRow_, int((edge.bottom - 1) >> kShift));
    edges_.push_back(edge);
}

void Rasterizer::EmitRow(int y, FillRule rule, CoverageSink& sink) {
    const int width = bounds_.Width();
    const size_t words = size_t(width) / 64 + 1;
    int32_t sum = 0;
    int x = 0;
    size_t word = 0;
    while (word < words) {
        const uint64_t bits = touched_[word];
        if (bits == 0) {
            ++word;
            continue;
        }
        const int first = int(word * 64) + std::countr_zero(bits);
        if (first >= width) break;
        if (first > x) {
            if (const uint8_t coverage = ToCoverage(sum, rule))
                sink.Span(y, bounds_.x0 + x, bounds_.x0 + first, coverage);
        }
        // The run of touched cells from here; it may go on into the next words.
        int end = first;
        while (end < width) {
            const size_t w = size_t(end) >> 6;
            const uint64_t rest = ~touched_[w] >> (end & 63);
            const int run = rest ? std::countr_zero(rest) : 64 - (end & 63);
            end += run;
            if ((end & 63) != 0 || run == 0) break;
        }
        end = std::min(end, width);
        for (int i = first; i < end; ++i) {
            sum += cells_[size_t(i)];
            cells_[size_t(i)] = 0;
            mask_[size_t(i - first)] = ToCoverage(sum, rule);
        }
        sink.Mask(y, bounds_.x0 + first, mask_.data(), end - first);
        x = end;
        // Words up to the run's end are done, but for bits of the last one beyond it.
        for (; word < size_t(end) >> 6; ++word)
            touched_[word] = 0;
        if (word < words) touched_[word] &= (end & 63) ? ~uint64_t(0) << (end & 63) : ~uint64_t(0);
    }
    if (x < width) {
        if (const uint8_t coverage = ToCoverage(sum, rule))
            sink.Span(y, bounds_.x0 + x, bounds_.x1, coverage);
    }
    // The cell right of the bounds only takes what is cut off.
    cells_[size_t(width)] = 0;
    touched_[words - 1] = 0;
}

class Rasterizer::RowRecorder final : public CoverageSink {
  public:
    explicit RowRecorder(Rasterizer& owner) : owner_(owner) {
        owner_.pieces_.clear();
        owner_.pieceMasks_.clear();
    }
    void Span(int, int x0, int x1, uint8_t coverage) override {
        owner_.pieces_.push_back({x0, x1 - x0, coverage, false});
    }
    void Mask(int, int x0, const uint8_t* coverage, int count) override {
        owner_.pieces_.push_back({x0, count, 0, true});
        owner_.pieceMasks_.insert(owner_.pieceMasks_.end(), coverage, coverage + count);
    }

  private:
    Rasterizer& owner_;
};

// How many rows after this one look like it: as long as all edges are upright, cross whole rows, and no other
// edge begins.
int Rasterizer::CountEqualRows(int y) const {
    const int64_t rowTop = int64_t(y) << kShift;
    int64_t last = int64_t(lastRow_);
    for (const int32_t i : active_) {
        const Edge& edge = edges_[size_t(i)];
        if (edge.slope != 0 || edge.top > rowTop) return 0;
        last = std::min(last, (edge.bottom >> kShift) - 1);
    }
    int row = y + 1;
    while (row <= last && heads_[size_t(row - firstRow_)] < 0)
        ++row;
    return std::max(0, row - y - 1);
}

void Rasterizer::EmitEqualRows(int y, int count, FillRule rule, CoverageSink& sink) {
    RowRecorder recorder(*this);
    EmitRow(y, rule, recorder);
    sink.Rows(y, count, {pieces_.data(), pieces_.size()}, pieceMasks_.data());
}

void Rasterizer::Sweep(FillRule rule, CoverageSink& sink) {
    if (edges_.empty() || bounds_.IsEmpty()) return;
    const size_t width = size_t(bounds_.Width());
    if (cells_.size() < width + 2) {
        cells_.assign(width + 2, 0);
        touched_.assign(width / 64 + 2, 0);
        mask_.resize(width + 2);
    }
    heads_.assign(size_t(lastRow_ - firstRow_ + 1), -1);
    for (size_t i = 0; i < edges_.size(); ++i) {
        const size_t row = size_t((edges_[i].top >> kShift) - firstRow_);
        edges_[i].next = heads_[row];
        heads_[row] = int32_t(i);
    }
    active_.clear();
    for (int y = firstRow_; y <= lastRow_; ++y) {
        for (int32_t i = heads_[size_t(y - firstRow_)]; i >= 0; i = edges_[size_t(i)].next)
            active_.push_back(i);
        if (active_.empty()) continue;
        const int equal = CountEqualRows(y);
        const int64_t rowBottom = int64_t(y + equal + 1) << kShift;
        size_t kept = 0;
        for (const int32_t i : active_) {
            AccumulateRow(edges_[size_t(i)], y);
            if (edges_[size_t(i)].bottom > rowBottom) active_[kept++] = i;
        }
        active_.resize(kept);
        if (equal > 0)
            EmitEqualRows(y, equal + 1, rule, sink);
        else
            EmitRow(y, rule, sink);
        y += equal;
    }
}

}  // namespace fresco::cpu
