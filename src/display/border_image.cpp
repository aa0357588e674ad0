#include "display/border_image.h"

#include "core/limits.h"
#include "css/values/style_groups.h"
#include "display/background_geometry.h"
#include "display/gradient_painter.h"

#include <algorithm>
#include <array>

namespace qorvex::dsp {

using css::BorderImageRepeatMode;
using css::LengthContext;
using css::NumberOrLengthKind;
using css::ResolveLength;
using fresco::CommandBuffer;
using layout::Edges;
using layout::LayoutNode;
using layout::Rect;
using layout::Size;

namespace {

// The records of the style run top, right, bottom, left.
enum StyleSide : size_t { kStyleTop, kStyleRight, kStyleBottom, kStyleLeft };

float ResolveSide(const css::NumberOrLength& side, float border, float automatic, float base,
                  const LengthContext& lengths) {
    switch (side.kind) {
        case NumberOrLengthKind::Number:
            return std::max(side.length.value * border, 0.0f);
        case NumberOrLengthKind::Length:
            return std::max(ResolveLength(side.length, lengths, base), 0.0f);
        default:
            return automatic;
    }
}

template <typename Sides>
Edges ResolveSides(const Sides& sides, const Edges& border, const Edges& automatic, Size base,
                   const LengthContext& lengths) {
    return {ResolveSide(sides[kStyleLeft], border.left, automatic.left, base.width, lengths),
            ResolveSide(sides[kStyleRight], border.right, automatic.right, base.width, lengths),
            ResolveSide(sides[kStyleTop], border.top, automatic.top, base.height, lengths),
            ResolveSide(sides[kStyleBottom], border.bottom, automatic.bottom, base.height, lengths)};
}

Edges ResolveSlices(const css::BorderImageSliceType& slice, Size source) {
    auto pixels = [](const css::BorderImageSliceType::Side& side, float length) {
        return std::clamp(side.isPercent ? side.value / 100 * length : side.value, 0.0f, length);
    };
    return {pixels(slice.sides[kStyleLeft], source.width), pixels(slice.sides[kStyleRight], source.width),
            pixels(slice.sides[kStyleTop], source.height), pixels(slice.sides[kStyleBottom], source.height)};
}

// Opposite sides that meet shrink with all the others, which keeps their proportions.
void FitWidths(Edges& widths, Size area) {
    const float horizontal = widths.left + widths.right, vertical = widths.top + widths.bottom;
    float factor = 1;
    if (horizontal > area.width) factor = std::min(factor, area.width / horizontal);
    if (vertical > area.height) factor = std::min(factor, area.height / vertical);
    for (float* width : {&widths.left, &widths.right, &widths.top, &widths.bottom})
        *width *= factor;
}

// One axis of one of the nine parts: where it lies, what of the source it shows, and how long the copies are
// that fill it.
struct Span {
    float start, end;
    float sourceStart, sourceEnd;
    float tileStart, tile;

    float Length() const { return end - start; }
    float SourceLength() const { return sourceEnd - sourceStart; }
};

// Copies of the part of the source, each `tile` long before it is made to fit.
void Repeat(Span& span, float tile, BorderImageRepeatMode mode) {
    if (mode == BorderImageRepeatMode::Stretch || !(tile > 0) || !std::isfinite(tile)) return;
    if (mode == BorderImageRepeatMode::Round) {
        span.tile = span.Length() / std::max(std::round(span.Length() / tile), 1.0f);
        return;
    }
    // One copy lies in the middle.
    const float first = span.start + (span.Length() - tile) / 2;
    span.tile = tile;
    span.tileStart = first - std::ceil(std::max(first - span.start, 0.0f) / tile) * tile;
}

// The image as a whole: where its parts begin and end in the source and on the box.
class NineParts {
  public:
    // `snap`: parts begin on whole pixels, so that none shines through between two.
    NineParts(const Rect& area, const ResolvedVisuals& visuals, Size source, bool snap) {
        const Edges& w = visuals.borderImageWidth;
        const Edges& s = visuals.borderImageSlice;
        auto grid = [snap](float value) { return snap ? std::round(value) : value; };
        x_ = {grid(area.x), grid(area.x + w.left), grid(layout::Right(area) - w.right),
              grid(layout::Right(area))};
        y_ = {grid(area.y), grid(area.y + w.top), grid(layout::Bottom(area) - w.bottom),
              grid(layout::Bottom(area))};
        sourceX_ = {0, s.left, source.width - s.right, source.width};
        sourceY_ = {0, s.top, source.height - s.bottom, source.height};
        // Slices that overlap leave no part between them; the corners still show theirs.
        cornerX_ = source.width - s.right;
        cornerY_ = source.height - s.bottom;
        if (sourceX_[2] < sourceX_[1]) sourceX_[2] = sourceX_[1];
        if (sourceY_[2] < sourceY_[1]) sourceY_[2] = sourceY_[1];
    }

    // What an edge is scaled by to become as thick as its part of the box; the middle follows the first edge
    // that says.
    float ScaleX(int row) const { return row == 1 ? Middle(Scale(Row(0)), Scale(Row(2))) : Scale(Row(row)); }
    float ScaleY(int column) const {
        return column == 1 ? Middle(Scale(Column(0)), Scale(Column(2))) : Scale(Column(column));
    }
    Span Column(int column) const { return MakeSpan(x_, sourceX_, cornerX_, column); }
    Span Row(int row) const { return MakeSpan(y_, sourceY_, cornerY_, row); }

  private:
    using Lines = std::array<float, 4>;

    static float Scale(const Span& edge) { return edge.Length() / edge.SourceLength(); }
    static float Middle(float first, float second) {
        auto says = [](float scale) { return scale > 0 && std::isfinite(scale); };
        return says(first) ? first : says(second) ? second : 1;
    }
    static Span MakeSpan(const Lines& box, const Lines& source, float corner, int part) {
        const float sourceStart = part == 2 ? corner : source[part];
        return {box[part],        box[part + 1], sourceStart,
                source[part + 1], box[part],     box[part + 1] - box[part]};
    }

    Lines x_, y_, sourceX_, sourceY_;
    float cornerX_, cornerY_;
};

class ImagePartPainter {
  public:
    ImagePartPainter(const ImageSlot& slot, CommandBuffer& buffer)
        : image_(static_cast<fresco::ImageId>(slot.resource)),
          left_(slot.source.x),
          top_(slot.source.y),
          buffer_(buffer) {}
    void Draw(const Span& x, const Span& y) {
        const Rect area{x.start, y.start, 0, x.Length(), y.Length()};
        const Rect source{left_ + x.sourceStart, top_ + y.sourceStart, 0, x.SourceLength(), y.SourceLength()};
        const Rect tile{x.tileStart, y.tileStart, 0, x.tile, y.tile};
        if (layout::Near(area, tile)) {
            buffer_.DrawImage(image_, area, source, fresco::Paint());
        } else {
            buffer_.DrawImageTiled(image_, area, {source, tile, 0, 0}, fresco::Paint());
        }
    }

  private:
    fresco::ImageId image_;
    float left_, top_;  // of the image in its resource
    CommandBuffer& buffer_;
};

// A gradient has no image: every copy is a fill of its own.
class GradientPartPainter {
  public:
    GradientPartPainter(PaintContext& context, const css::Gradient& gradient, const ResolvedImageLayer& layer,
                        CommandBuffer& buffer)
        : fill_(gradient, layer, context.lengths), snap_(context.snapToPixels), buffer_(buffer) {}
    void Draw(const Span& x, const Span& y) {
        for (int row = 0; Start(y, row) < y.end; ++row) {
            for (int column = 0; Start(x, column) < x.end; ++column) {
                if (++drawn_ > limits::kMaxGradientTiles) return;
                DrawCopy(x, column, y, row);
            }
        }
    }

  private:
    float Start(const Span& span, int copy) const {
        const float start = span.tileStart + span.tile * static_cast<float>(copy);
        return snap_ ? std::round(start) : start;
    }
    // The piece of a copy that lies inside the part.
    struct Piece {
        float start, length, sourceStart, sourceLength;
    };
    Piece Cut(const Span& span, int copy) const {
        const float start = Start(span, copy), end = Start(span, copy + 1);
        const float from = std::max(start, span.start), to = std::min(end, span.end);
        const float scale = span.SourceLength() / (end - start);
        return {from, to - from, span.sourceStart + (from - start) * scale, (to - from) * scale};
    }
    void DrawCopy(const Span& x, int column, const Span& y, int row) {
        const Piece h = Cut(x, column), v = Cut(y, row);
        if (!(h.length > 0 && v.length > 0)) return;
        fill_.DrawPart({h.sourceStart, v.sourceStart, 0, h.sourceLength, v.sourceLength},
                       {h.start, v.start, 0, h.length, v.length}, buffer_);
    }

    GradientFill fill_;
    bool snap_;
    size_t drawn_ = 0;
    CommandBuffer& buffer_;
};

template <typename PartPainter>
void DrawParts(const NineParts& parts, const css::VisualStyle& style, PartPainter& painter) {
    for (int row = 0; row < 3; ++row) {
        for (int column = 0; column < 3; ++column) {
            if (row == 1 && column == 1 && !style.borderImageSlice.fill) continue;
            Span x = parts.Column(column), y = parts.Row(row);
            if (!(x.Length() > 0 && y.Length() > 0 && x.SourceLength() > 0 && y.SourceLength() > 0)) continue;
            if (column == 1) Repeat(x, x.SourceLength() * parts.ScaleX(row), style.borderImageRepeat.x);
            if (row == 1) Repeat(y, y.SourceLength() * parts.ScaleY(column), style.borderImageRepeat.y);
            painter.Draw(x, y);
        }
    }
}

}  // namespace

void ResolveBorderImage(const LayoutNode& node, const Rect& box, const LengthContext& lengths,
                        ResolvedVisuals& out) {
    const css::VisualStyle& style = *node.style->visual;
    if (style.borderImageSource.kind <= css::ImageKind::Initial) return;
    out.borderImageOutset =
        ResolveSides(style.borderImageOutset.sides, node.border(), {}, {box.width, box.height}, lengths);
    const Edges& outset = out.borderImageOutset;
    const Size area{box.width + outset.left + outset.right, box.height + outset.top + outset.bottom};
    const css::Gradient* gradient = style.borderImageSource.gradient.get();
    const ImageSlots* slots = node.display && node.display->Has(IDisplayElement::kPaintsBox)
                                  ? static_cast<Box*>(node.display.get())->BorderSlots()
                                  : nullptr;
    const Size own = slots && !slots->empty() ? slots->front().intrinsic : Size{};
    const Size source = gradient ? area : own;
    out.borderImageSlice = ResolveSlices(style.borderImageSlice, source);
    // The automatic width is that of the slice, where the image has a size of its own.
    const Edges& automatic =
        gradient || !(own.width > 0 && own.height > 0) ? node.border() : out.borderImageSlice;
    out.borderImageWidth =
        ResolveSides(style.borderImageWidth.sides, node.border(), automatic, area, lengths);
    FitWidths(out.borderImageWidth, area);
    ResolvedImageLayer layer;
    layer.tile = {-outset.left, -outset.top, 0, source.width, source.height};
    if (gradient) ResolveGradient(*gradient, source, lengths, layer);
    out.borderImages.push_back(layer);
}

bool PaintBorderImage(PaintContext& context, const LayoutNode& node, const BoxShape& shape,
                      const ImageSlots* slots, CommandBuffer& buffer) {
    const css::VisualStyle& style = *node.style->visual;
    if (style.borderImageSource.kind <= css::ImageKind::Initial || !node.visuals ||
        node.visuals->borderImages.empty())
        return false;
    const css::Gradient* gradient = style.borderImageSource.gradient.get();
    const bool hasImage = slots && !slots->empty() && slots->front().resource >= 0;
    if (!gradient && !hasImage) return false;
    const Edges& outset = node.visuals->borderImageOutset;
    const Rect area = layout::Inset(shape.box, {-outset.left, -outset.right, -outset.top, -outset.bottom});
    const ResolvedImageLayer& layer = node.visuals->borderImages[0];
    const NineParts parts(area, *node.visuals, {layer.tile.width, layer.tile.height}, context.snapToPixels);
    if (gradient) {
        if (gradient->stops.empty() || layout::IsEmpty(layer.tile)) return true;
        const TempMark mark;
        GradientPartPainter painter(context, *gradient, layer, buffer);
        DrawParts(parts, style, painter);
    } else {
        ImagePartPainter painter(slots->front(), buffer);
        DrawParts(parts, style, painter);
    }
    return true;
}

}  // namespace qorvex::dsp
