#include "display/gradient_painter.h"

#include "core/limits.h"

#include <algorithm>
#include <cmath>

namespace qorvex::dsp {

using css::Gradient;
using fresco::CommandBuffer;
using layout::Point;
using layout::Rect;

namespace {

using Stops = GradientFill::Stops;

fresco::Color Premultiplied(const css::Color& c) {
    return {c.red * c.alpha, c.green * c.alpha, c.blue * c.alpha, c.alpha};
}

// Places stops along a line of this length (CSS Images 3, section 3.4.3): the first at 0 and the last at 1
// unless they say otherwise, none before its predecessor, the others spread evenly between their neighbours.
void PlaceStops(const Gradient& gradient, float length, const css::LengthContext& lengths, Stops& out) {
    const uint32_t count = gradient.stops.size();
    constexpr float kOpen = -1e30f;
    float farthest = kOpen;
    for (uint32_t i = 0; i < count; ++i) {
        const css::GradientStop& stop = gradient.stops[i];
        float offset = kOpen;
        if (stop.hasPosition) {
            offset = length > 0 ? ResolveLength(stop.position, lengths, length) / length : 0;
        } else if (i == 0) {
            offset = 0;
        } else if (i + 1 == count) {
            offset = 1;
        }
        if (offset != kOpen) farthest = offset = std::max(offset, farthest);
        out.push_back({offset, Premultiplied(stop.color)});
    }
    for (uint32_t i = 1; i < count; ++i) {
        if (out[i].offset != kOpen) continue;
        uint32_t end = i;
        while (out[end].offset == kOpen)
            ++end;
        const float step = (out[end].offset - out[i - 1].offset) / static_cast<float>(end - i + 1);
        for (; i < end; ++i)
            out[i].offset = out[i - 1].offset + step;
    }
}

// A repeating gradient repeats the stretch between its first and last stop: that becomes the unit.
void NormaliseRepeat(Stops& stops, float& from, float& to) {
    from = stops[0].offset;
    to = stops[stops.size() - 1].offset;
    const float span = to - from;
    if (!(span > 1e-6f)) {
        from = 0, to = 1;
        return;
    }
    for (fresco::GradientStop& stop : stops)
        stop.offset = (stop.offset - from) / span;
}

}  // namespace

GradientFill::GradientFill(const Gradient& gradient, const ResolvedImageLayer& layer,
                           const css::LengthContext& lengths)
    : radial_(gradient.IsRadial()), unit_(std::max(layer.tile.width, layer.tile.height)) {
    const float length = radial_
                             ? layer.end.x * unit_
                             : std::hypot(layer.end.x - layer.start.x, layer.end.y - layer.start.y) * unit_;
    PlaceStops(gradient, length, lengths, stops_);
    float from = 0, to = 1;
    if (gradient.IsRepeating()) {
        NormaliseRepeat(stops_, from, to);
    } else if (radial_ && stops_[stops_.size() - 1].offset > 1) {
        // Beyond its shape a radial gradient goes on to its last stop.
        to = stops_[stops_.size() - 1].offset;
        for (fresco::GradientStop& stop : stops_)
            stop.offset /= to;
    }
    spread_ = gradient.IsRepeating() ? fresco::kSpreadRepeat : fresco::kSpreadPad;
    if (radial_) {
        ShiftStops(from / (to - from));
        start_ = layer.start;
        end_ = {layer.end.x * (to - from), layer.end.y * (to - from)};
        return;
    }
    auto at = [&](float t) {
        return Point{layer.start.x + (layer.end.x - layer.start.x) * t,
                     layer.start.y + (layer.end.y - layer.start.y) * t};
    };
    start_ = at(from);
    end_ = at(to);
}

// Circles repeat from the centre: where the first stop lies away from it, the stops carry the distance.
void GradientFill::ShiftStops(float periods) {
    const float phase = periods - std::floor(periods);
    const uint32_t count = stops_.size();
    if (phase < 1e-4f) return;
    for (uint32_t i = 0; i < count; ++i)
        stops_.push_back({stops_[i].offset + phase, stops_[i].color});
    for (uint32_t i = 0; i < count; ++i)
        stops_[i].offset += phase - 1;
}

void GradientFill::Fill(const Rect& rect, Point start, Point end, CommandBuffer& buffer) const {
    const fresco::Paint paint;
    if (radial_) {
        buffer.FillRadialGradient(rect, paint, stops_.data(), stops_.size(), {start, end, spread_});
    } else {
        buffer.FillLinearGradient(rect, paint, stops_.data(), stops_.size(), {start, end, spread_});
    }
}

void GradientFill::Draw(const Rect& rect, CommandBuffer& buffer) const {
    Fill(rect, start_, end_, buffer);
}

void GradientFill::DrawPart(const Rect& part, const Rect& destination, CommandBuffer& buffer) const {
    // In units of the part's larger side, from the part's corner.
    const float unit = std::max(part.width, part.height), scale = unit_ / unit;
    auto within = [&](Point p) { return Point{p.x * scale - part.x / unit, p.y * scale - part.y / unit}; };
    const Point end = radial_ ? Point{end_.x * scale, end_.y * scale} : within(end_);
    const float scaleX = destination.width / part.width, scaleY = destination.height / part.height;
    if (layout::Near(scaleX, 1) && layout::Near(scaleY, 1))
        return Fill(destination, within(start_), end, buffer);
    buffer.PushState(fresco::kStateTransform);
    buffer.Translate(destination.x, destination.y);
    buffer.Scale(scaleX, scaleY);
    Fill({0, 0, 0, part.width, part.height}, within(start_), end, buffer);
    buffer.PopState();
}

void PaintGradientLayer(PaintContext& context, const Gradient& gradient, const ResolvedImageLayer& layer,
                        Point origin, const Rect& area, CommandBuffer& buffer) {
    if (gradient.stops.empty() || layout::IsEmpty(layer.tile)) return;
    const TempMark mark;
    const GradientFill fill(gradient, layer, context.lengths);
    Rect tile = layer.tile;
    tile.x += origin.x;
    tile.y += origin.y;
    auto first = [](bool repeats, float start, float size, float edge) {
        return repeats ? start - std::ceil((start - edge) / size) * size : start;
    };
    const float startX = first(layer.repeatX, tile.x, tile.width, area.x);
    const float startY = first(layer.repeatY, tile.y, tile.height, area.y);
    const float endX = layer.repeatX ? layout::Right(area) : startX + tile.width;
    const float endY = layer.repeatY ? layout::Bottom(area) : startY + tile.height;
    size_t drawn = 0;
    for (float y = startY; y < endY - layout::kLengthTolerance; y += tile.height) {
        for (float x = startX; x < endX - layout::kLengthTolerance; x += tile.width) {
            if (++drawn > limits::kMaxGradientTiles) return;
            fill.Draw({x, y, 0, tile.width, tile.height}, buffer);
        }
    }
}

}  // namespace qorvex::dsp
