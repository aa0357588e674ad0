// The scene through Cairo's image back end, with the means that a careful user of Cairo has: patterns, scaled
// fonts and pictures are made once, shadows are the other painter's own pixels.
#pragma once
#include <cstdint>
#include <memory>

#include "hud_scene.h"

namespace qorvex::benchmarks {

class HudCairo {
  public:
    explicit HudCairo(const HudScene& hud);
    ~HudCairo();
    HudCairo(const HudCairo&) = delete;
    HudCairo& operator=(const HudCairo&) = delete;

    void Paint();
    // RGBA8 premultiplied, for the comparison of the two pictures.
    std::uint32_t PixelAt(int x, int y) const;

  private:
    struct State;
    void PaintContent(const std::vector<HudBox>& boxes, const std::vector<HudLabel>& labels);

    const HudScene& hud_;
    std::unique_ptr<State> state_;
};

}  // namespace qorvex::benchmarks
