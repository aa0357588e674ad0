// The last step of a draw: coverage to pixels.
#pragma once
#include <fresco/paint.h>
#include "fresco/cpu/blend.h"
#include "fresco/cpu/clip.h"
#include "fresco/cpu/rows.h"
#include "fresco/cpu/sources.h"

namespace fresco::cpu {

// What a draw puts down: one colour, or a source, or another bitmap's pixels at the same place.
struct Ink {
    uint32_t color = 0;  // premultiplied, opacity included
    PixelSource* source = nullptr;
    const Bitmap* bitmap = nullptr;
    uint32_t blend = kBlendNormal;

    bool DrawsNothing() const { return !source && !bitmap && color == 0 && blend == kBlendNormal; }
};

class PaintSink final : public CoverageSink {
  public:
    PaintSink(const Bitmap& target, const Ink& ink, Vector<uint32_t>& row)
        : target_(target), ink_(ink), row_(row) {
        row_.resize(std::max<size_t>(row_.size(), size_t(target.bounds.Width())));
        solid_ = !ink.source && !ink.bitmap;
        if (solid_ && ink.blend != kBlendNormal) std::fill(row_.begin(), row_.end(), ink.color);
    }
    void Span(int y, int x0, int x1, uint8_t coverage) override {
        uint32_t* dst = target_.Row(y) + x0;
        painted_ += uint64_t(x1 - x0);
        uint32_t color = ink_.color;
        if (ink_.blend == kBlendNormal && (solid_ || HasRowColor(y, &color)))
            return BlendSolid(dst, x1 - x0, color, coverage);
        BlendRowMode(ink_.blend, dst, Source(y, x0, x1 - x0), x1 - x0, nullptr, coverage);
    }
    void Mask(int y, int x0, const uint8_t* coverage, int count) override {
        uint32_t* dst = target_.Row(y) + x0;
        painted_ += uint64_t(count);
        uint32_t color = ink_.color;
        if (ink_.blend == kBlendNormal && (solid_ || HasRowColor(y, &color)))
            return BlendSolidMask(dst, count, color, coverage);
        BlendRowMode(ink_.blend, dst, Source(y, x0, count), count, coverage, 255);
    }
    // Upright edges of borders and boxes are columns of one or two pixels.
    void Rows(int y, int rows, std::span<const Piece> pieces, const uint8_t* masks) override {
        if (!solid_ || ink_.blend != kBlendNormal) return CoverageSink::Rows(y, rows, pieces, masks);
        for (const Piece& piece : pieces) {
            painted_ += uint64_t(piece.count) * uint64_t(rows);
            if (!piece.masked) {
                for (int i = 0; i < rows; ++i)
                    BlendSolid(target_.Row(y + i) + piece.x, piece.count, ink_.color, piece.coverage);
                continue;
            }
            for (int i = 0; i < piece.count; ++i)
                row_[size_t(i)] = ScalePixel(ink_.color, *masks++);
            if (piece.count <= kColumn) {
                for (int i = 0; i < piece.count; ++i)
                    BlendColumn(y, rows, piece.x + i, row_[size_t(i)]);
                continue;
            }
            for (int i = 0; i < rows; ++i)
                BlendRow(target_.Row(y + i) + piece.x, row_.data(), piece.count, nullptr, 255);
        }
    }
    // Coverage of all pixels of a box, `pitch` bytes a row.
    void Box(const IRect& box, const uint8_t* coverage, int pitch) {
        if (solid_ && ink_.blend == kBlendNormal) {
            painted_ += uint64_t(box.Width()) * uint64_t(box.Height());
            return cpu::Rows().BlendSolidMasks(target_.Row(box.y0) + box.x0, target_.pitch / sizeof(uint32_t),
                                               box.Width(), box.Height(), ink_.color, coverage,
                                               size_t(pitch));
        }
        for (int y = box.y0; y < box.y1; ++y, coverage += pitch)
            Mask(y, box.x0, coverage, box.Width());
    }
    uint64_t painted() const { return painted_; }

  private:
    static constexpr int kColumn = 4;
    void BlendColumn(int y, int rows, int x, uint32_t color) {
        const uint32_t rest = 255 - (color >> 24);
        const size_t pitch = target_.pitch / sizeof(uint32_t);
        uint32_t* at = target_.Row(y) + x;
        for (uint32_t* const end = at + size_t(rows) * pitch; at != end; at += pitch)
            *at = color + ScalePixel(*at, rest);
    }
    bool HasRowColor(int y, uint32_t* color) { return ink_.source && ink_.source->RowColor(y, color); }
    const uint32_t* Source(int y, int x0, int count) {
        if (ink_.bitmap) return ink_.bitmap->Row(y) + x0;
        return ink_.source ? ink_.source->Fetch(x0, y, count, row_.data()) : row_.data();
    }

    const Bitmap& target_;
    const Ink& ink_;
    Vector<uint32_t>& row_;
    bool solid_ = true;
    uint64_t painted_ = 0;
};

// Sends coverage through a clip that is more than a rectangle.
class ClipSink final : public CoverageSink {
  public:
    ClipSink(const Clip& clip, CoverageSink& out) : clip_(clip), out_(out) {}
    void Span(int y, int x0, int x1, uint8_t coverage) override { clip_.Filter(y, x0, x1, coverage, out_); }
    void Mask(int y, int x0, const uint8_t* coverage, int count) override {
        clip_.Filter(y, x0, coverage, count, out_);
    }

  private:
    const Clip& clip_;
    CoverageSink& out_;
};

}  // namespace fresco::cpu
