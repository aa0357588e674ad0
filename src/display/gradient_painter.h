// Fills rectangles with CSS gradients.
#pragma once

#include "core/memory/temp_vector.h"
#include "css/values/image_values.h"
#include "display/paint_context.h"
#include "display/resolved_visuals.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

// A gradient ready to be drawn any number of times. Temporary memory: lives under the caller's TempMark.
class GradientFill {
  public:
    using Stops = TempVector<fresco::GradientStop>;

    GradientFill(const css::Gradient& gradient, const ResolvedImageLayer& layer,
                 const css::LengthContext& lengths);

    // All of it, over a rectangle as large as the layer's tile.
    void Draw(const layout::Rect& rect, fresco::CommandBuffer& buffer) const;
    // `part` of the tile, from its corner, stretched over another rectangle.
    void DrawPart(const layout::Rect& part, const layout::Rect& destination,
                  fresco::CommandBuffer& buffer) const;

  private:
    void ShiftStops(float periods);
    void Fill(const layout::Rect& rect, layout::Point start, layout::Point end,
              fresco::CommandBuffer& buffer) const;

    bool radial_;
    float unit_;
    uint32_t spread_;
    Stops stops_;
    // In units of the tile's larger side: start and end, or centre and half axes.
    layout::Point start_;
    layout::Point end_;
};

// The layer's tile, moved to the border box at `origin`, repeated over `area`.
void PaintGradientLayer(PaintContext& context, const css::Gradient& gradient, const ResolvedImageLayer& layer,
                        layout::Point origin, const layout::Rect& area, fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
