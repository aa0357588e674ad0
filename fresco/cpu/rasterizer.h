// Exact-area scan conversion.
//
// Every edge adds its signed area to the cells it crosses; the running sum along a row is the winding number
// weighted by area, which the fill rule turns into coverage. Sums are integers (1 / 65536 of a pixel), so the
// coverage of a pixel depends neither on the bounds nor on the order of the edges: a partial repaint gives
// the pixels of a full one, bit for bit. A row only visits cells that an edge touched; between them it emits
// spans. Rows that only upright edges cross are worked out once and emitted as often as they come. What is as
// small as a glyph skips the edges: its lines go straight into a grid of cells.
#pragma once
#include <span>

#include <fresco/path.h>
#include "fresco/cpu/pixels.h"
#include "fresco/paths/matrix.h"

namespace fresco::cpu {

class CoverageSink {
  public:
    // Constant coverage over [x0, x1), 1 to 255.
    virtual void Span(int y, int x0, int x1, uint8_t coverage) = 0;
    // One byte a pixel from x0 on.
    virtual void Mask(int y, int x0, const uint8_t* coverage, int count) = 0;
    // A piece of a row: a span, or a mask whose bytes follow those of the piece before it.
    struct Piece {
        int x, count;
        uint8_t coverage;
        bool masked;
    };
    // The same row several times. To be overridden where that is cheaper than one after the other.
    virtual void Rows(int y, int rows, std::span<const Piece> pieces, const uint8_t* masks);

  protected:
    ~CoverageSink() = default;
};

class Rasterizer {
  public:
    // Only pixels inside of the bounds are emitted.
    void Begin(const IRect& bounds);
    // A closed outline, in device pixels. Coordinates must be finite.
    void AddContour(const Vec2* points, size_t count);
    // Emits rows from top to bottom, spans from left to right.
    void Sweep(FillRule rule, CoverageSink& sink);
    bool HasEdges() const { return !edges_.empty(); }

    // The same for bounds of few pixels, without a sink: SweepInto writes one byte for each, row by row, by
    // the non-zero rule (rasterizer_grid.cpp).
    static bool IsSmall(const IRect& bounds) {
        return int64_t(bounds.Width()) * bounds.Height() <= kSmallArea;
    }
    void BeginSmall(const IRect& bounds);
    void SweepInto(uint8_t* coverage);

  private:
    static constexpr int64_t kSmallArea = 16 << 10;
    struct Edge {
        int64_t x, y;  // upper end, 48.16 as all places here
        double slope;
        int64_t top, bottom;  // inside of the bounds
        int32_t winding;
        int32_t next;
    };

    void AddLine(Vec2 from, Vec2 to);
    void AccumulateRow(const Edge& edge, int row);
    void AddCell(int x, int32_t value) {
        cells_[size_t(x)] += value;
        touched_[size_t(x) >> 6] |= uint64_t(1) << (x & 63);
    }
    void EmitRow(int y, FillRule rule, CoverageSink& sink);
    int CountEqualRows(int y) const;
    void EmitEqualRows(int y, int count, FillRule rule, CoverageSink& sink);

    IRect bounds_;
    int firstRow_ = 0, lastRow_ = -1;
    Vector<Edge> edges_;
    Vector<int32_t> heads_;
    Vector<int32_t> active_;
    Vector<int32_t> cells_;  // zero between rows
    Vector<uint64_t> touched_;
    Vector<uint8_t> mask_;

    // Of a row that repeats.
    class RowRecorder;
    Vector<CoverageSink::Piece> pieces_;
    Vector<uint8_t> pieceMasks_;

    struct GridPoint;
    void AddToGrid(const Vec2* points, size_t count);
    void AddClippedToGrid(const GridPoint& from, const GridPoint& to);
    void AddInsideToGrid(const GridPoint& from, const GridPoint& to);

    bool small_ = false;
    Vector<int32_t> grid_;  // of small bounds: rows with one cell more; zero between shapes
    Vector<uint8_t> gridCoverage_;
};

}  // namespace fresco::cpu
