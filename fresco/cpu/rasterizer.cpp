#include "fresco/cpu/rasterizer.h"

#include <bit>

namespace fresco::cpu {
namespace {

constexpr int kShift = 16;
constexpr int32_t kOne = 1 << kShift;
// Beyond this the picture is far off any surface; holding points here keeps 48.16 arithmetic exact.
constexpr double kFarthest = double(1 << 22);

inline int32_t RoundPositive(double value) {
    return int32_t(value + 0.5);
}

inline uint8_t ToCoverage(int32_t area, FillRule rule) {
    int32_t value = area < 0 ? -area : area;
    if (rule == kFillEvenOdd) {
        value &= 2 * kOne - 1;
        if (value > kOne) value = 2 * kOne - value;
    } else if (value > kOne) {
        value = kOne;
    }
    return uint8_t((value * 255 + kOne / 2) >> kShift);
}

}  // namespace

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

void Rasterizer::BeginSmall(const IRect& bounds) {
    Begin(bounds);
    small_ = true;
    const size_t cells = size_t(bounds.Width() + 1) * size_t(bounds.Height());
    if (grid_.size() < cells) grid_.resize(cells);
}

// Where the edge crosses a height, from the left side of the bounds. All positions come from the edge's own
// equation, never from the neighbouring row or cell, so that clipping cannot change them.
inline double Rasterizer::PlaceAt(const Edge& edge, int64_t y) const {
    return std::clamp(edge.x + (double(y) / kOne - edge.y) * edge.slope, edge.minX, edge.maxX) - bounds_.x0;
}

namespace {

// Adds what an edge between two places covers of a row, `height` high, by add(cell, value).
template <class Add>
inline void Accumulate(double left, double right, int32_t height, int32_t winding, int width, Add add) {
    if (left > right) std::swap(left, right);
    if (left >= width) return;
    if (right <= 0) return add(0, winding * height);
    int cell = int(left);
    if (left < cell) --cell;
    if (right <= cell + 1) {
        const int32_t beyond = RoundPositive(height * ((left + right) * 0.5 - cell));
        add(cell, winding * (height - beyond));
        add(cell + 1, winding * beyond);
        return;
    }
    // The edge crosses several cells: the height it has gained at each cell boundary is rounded, and the
    // cell's share is the difference, so that the shares add up to the whole.
    const double perPixel = height / (right - left);
    int32_t gained = 0;
    double from = left;
    if (cell < 0) {
        gained = RoundPositive(-left * perPixel);
        add(0, winding * gained);
        cell = 0;
        from = 0;
    }
    for (; cell < width; ++cell) {
        const bool last = right <= cell + 1;
        const double to = last ? right : cell + 1;
        const int32_t reached = last ? height : std::min(height, RoundPositive((to - left) * perPixel));
        const int32_t share = reached - gained;
        const int32_t beyond = RoundPositive(share * ((from + to) * 0.5 - cell));
        add(cell, winding * (share - beyond));
        add(cell + 1, winding * beyond);
        gained = reached;
        from = to;
        if (last) break;
    }
}

}  // namespace

void Rasterizer::AccumulateRow(const Edge& edge, int row) {
    const int64_t rowTop = int64_t(row) << kShift;
    const int64_t y0 = std::max(edge.top, rowTop), y1 = std::min(edge.bottom, rowTop + kOne);
    const double above = PlaceAt(edge, y0), below = edge.slope == 0 ? above : PlaceAt(edge, y1);
    Accumulate(above, below, int32_t(y1 - y0), edge.winding, bounds_.Width(),
               [this](int x, int32_t value) { AddCell(x, value); });
}

inline void Rasterizer::AccumulateGrid(const Edge& edge) {
    const int width = bounds_.Width();
    int64_t y0 = edge.top;
    int32_t* cells = grid_.data() + ((y0 >> kShift) - bounds_.y0) * (width + 1);
    for (double above = PlaceAt(edge, y0); y0 < edge.bottom; cells += width + 1) {
        const int64_t y1 = std::min(edge.bottom, ((y0 >> kShift) + 1) << kShift);
        const double below = PlaceAt(edge, y1);
        Accumulate(above, below, int32_t(y1 - y0), edge.winding, width,
                   [cells](int x, int32_t value) { cells[x] += value; });
        y0 = y1;
        above = below;
    }
}

void Rasterizer::AddLine(double x0, double y0, double x1, double y1) {
    int32_t winding = 1;
    if (y0 > y1) {
        std::swap(x0, x1);
        std::swap(y0, y1);
        winding = -1;
    }
    x0 = std::clamp(x0, -kFarthest, kFarthest), x1 = std::clamp(x1, -kFarthest, kFarthest);
    y0 = std::clamp(y0, -kFarthest, kFarthest), y1 = std::clamp(y1, -kFarthest, kFarthest);
    const int64_t top = int64_t(std::llrint(y0 * kOne)), bottom = int64_t(std::llrint(y1 * kOne));
    if (top == bottom) return;
    const int64_t clipTop = int64_t(bounds_.y0) << kShift, clipBottom = int64_t(bounds_.y1) << kShift;
    if (bottom <= clipTop || top >= clipBottom) return;
    const double minX = std::min(x0, x1), maxX = std::max(x0, x1);
    if (minX >= bounds_.x1) return;
    Edge edge;
    edge.x = x0;
    edge.y = double(top) / kOne;
    edge.slope = (x1 - x0) / (double(bottom - top) / kOne);
    edge.minX = minX, edge.maxX = maxX;
    edge.top = std::max(top, clipTop), edge.bottom = std::min(bottom, clipBottom);
    edge.winding = winding;
    edge.next = -1;
    if (small_) return AccumulateGrid(edge);
    firstRow_ = std::min(firstRow_, int(edge.top >> kShift));
    lastRow_ = std::max(lastRow_, int((edge.bottom - 1) >> kShift));
    edges_.push_back(edge);
}

void Rasterizer::SweepInto(uint8_t* coverage) {
    const int width = bounds_.Width();
    int32_t* cells = grid_.data();
    for (int y = bounds_.y0; y < bounds_.y1; ++y, cells += width + 1, coverage += width) {
        // Two steps: the second one goes by whole registers.
        int32_t sum = 0;
        for (int x = 0; x < width; ++x)
            cells[x] = sum += cells[x];
        for (int x = 0; x < width; ++x)
            coverage[x] = ToCoverage(cells[x], kFillNonZero);
        std::fill_n(cells, width + 1, 0);
    }
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
