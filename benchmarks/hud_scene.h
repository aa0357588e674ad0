// A game's interface at 1920 x 1080, as plain data: what both painters of the benchmark draw.
// 300 rounded rectangles, 50 gradients, 2,000 glyphs, 50 scaled images, 10 blurred shadows, and one group of
// 0.7 opacity that holds a tenth of the rectangles and glyphs.
#pragma once
#include <fresco/command_buffer.h>
#include <fresco/font.h>

#include <cstdint>
#include <vector>

namespace qorvex::benchmarks {

struct HudBox {
    fresco::Rect rect;
    float radius;
    fresco::Color color;
};

struct HudGradient {
    fresco::Rect rect;
    bool radial;
    fresco::Point start, end;  // in pixels; radial: centre, and both radii in end
    std::vector<fresco::GradientStop> stops;
};

struct HudLabel {
    float x, y, size;
    fresco::Color color;
    std::vector<fresco::Glyph> glyphs;
};

struct HudImage {
    fresco::Rect rect;
    std::uint32_t picture;
};

struct HudPicture {
    int width, height;
    std::vector<std::uint32_t> pixels;  // RGBA8 premultiplied
};

struct HudShadow {
    fresco::Rect rect;  // of the blurred surface, whole pixels
    std::uint32_t picture;
};

struct HudScene {
    static constexpr int kWidth = 1920, kHeight = 1080;
    static constexpr float kGroupOpacity = 0.7f;
    fresco::Rect group;
    std::vector<HudBox> boxes, groupBoxes;
    std::vector<HudGradient> gradients;
    std::vector<HudLabel> labels, groupLabels;
    std::vector<HudPicture> pictures, shadowPictures;
    std::vector<HudImage> images;
    std::vector<HudShadow> shadows;
};

// The pictures of the shadows are left empty: the painter that draws first fills them in.
HudScene MakeHudScene(fresco::IFont& font);

}  // namespace qorvex::benchmarks
