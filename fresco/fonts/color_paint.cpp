#include "fresco/fonts/color_paint.h"

#include <ft2build.h>
#include FT_FREETYPE_H
#include <hb-ot.h>

#include <algorithm>
#include <cmath>

#include <fresco/paint.h>
#include "fresco/cpu/blend_modes.h"
#include "fresco/cpu/outline.h"
#include "fresco/fonts/color_gradient.h"
#include "fresco/fonts/color_table.h"
#include "fresco/fonts/glyph_outline.h"

namespace fresco {
namespace {

using cpu::Intersect;
using cpu::IRect;
using cpu::Unite;

// A graph may share its nodes and lead back into itself, so depth and work are bounded, not the count of
// nodes.
constexpr int kMaxDepth = 32;
// Composites that are open at once; each holds two pictures.
constexpr int kMaxComposites = 8;
// In pixels that are written. Emoji of a hundred layers stay below a tenth of it.
constexpr int64_t kMaxWork = int64_t(1) << 25;
constexpr int64_t kWorkOfPaint = 256;
constexpr int64_t kWorkOfPoint = 16;
constexpr int64_t kWorkOfGradientPixel = 8;
constexpr uint32_t kMaxStops = 1024;
// No picture reaches further from its origin than this many ems, and no transform further than that.
constexpr int kReach = 2;
constexpr double kMaxScale = 1e6;
constexpr double kPi = 3.14159265358979323846;

constexpr uint32_t kTextColor = 0xFFFF;
constexpr uint32_t kKeepsBackdrop = 0xFFFFFFFF;
// By the number of the composite mode.
constexpr uint32_t kModes[] = {
    kBlendClear,           kBlendSource,        kKeepsBackdrop,   kBlendNormal,         kBlendDestinationOver,
    kBlendSourceIn,        kBlendDestinationIn, kBlendSourceOut,  kBlendDestinationOut, kBlendSourceAtop,
    kBlendDestinationAtop, kBlendXor,           kBlendAdditive,   kBlendScreen,         kBlendOverlay,
    kBlendDarken,          kBlendLighten,       kBlendColorDodge, kBlendColorBurn,      kBlendHardLight,
    kBlendSoftLight,       kBlendDifference,    kBlendExclusion,  kBlendMultiply,       kBlendHue,
    kBlendSaturation,      kBlendColor,         kBlendLuminosity,
};

Homography Affine(double xx, double xy, double yx, double yy, double dx = 0, double dy = 0) {
    Homography m;
    m.xx = xx, m.xy = xy, m.x0 = dx;
    m.yx = yx, m.yy = yy, m.y0 = dy;
    return m;
}

// The transform with its center elsewhere.
Homography Around(Vec2 c, const Homography& m) {
    return Affine(1, 0, 0, 1, c.x, c.y) * m * Affine(1, 0, 0, 1, -c.x, -c.y);
}

// How much of each pixel of the canvas is inside of a clip; nothing outside of the box.
class ClipMask final : public cpu::CoverageSink {
  public:
    explicit ClipMask(const IRect& box)
        : box_(box), bytes_(size_t(box.Width()) * size_t(box.Height()), uint8_t(0)) {}

    const IRect& Box() const { return box_; }
    const uint8_t* Row(int y) const { return bytes_.data() + Index(box_.x0, y); }
    void Span(int y, int x0, int x1, uint8_t coverage) override {
        std::memset(bytes_.data() + Index(x0, y), coverage, size_t(x1 - x0));
    }
    void Mask(int y, int x0, const uint8_t* coverage, int count) override {
        std::memcpy(bytes_.data() + Index(x0, y), coverage, size_t(count));
    }
    // `outer` covers the box of this one.
    void Intersect(const ClipMask& outer) {
        for (int y = box_.y0; y < box_.y1; ++y) {
            uint8_t* row = bytes_.data() + Index(box_.x0, y);
            const uint8_t* other = outer.bytes_.data() + outer.Index(box_.x0, y);
            for (int i = 0; i < box_.Width(); ++i)
                row[i] = uint8_t(cpu::MulDiv255(row[i], other[i]));
        }
    }

  private:
    size_t Index(int x, int y) const {
        return size_t(y - box_.y0) * size_t(box_.Width()) + size_t(x - box_.x0);
    }

    IRect box_;
    Vector<uint8_t> bytes_;
};

// What holds where a paint of the graph is drawn.
struct State {
    Homography toCanvas;             // from font units, y upward
    const ClipMask* clip = nullptr;  // null: the whole canvas
    int depth = 0;

    State Under(const Homography& m) const { return {toCanvas * m, clip, depth}; }
};

// Paints one glyph: first asked for its bounds, then for its pixels. Paints are places in the table.
class GraphPainter {
  public:
    GraphPainter(const ColorTable& table, FT_Face face, hb_face_t* colors, double pixelsPerUnit)
        : table_(table), face_(face), pixelsPerUnit_(pixelsPerUnit) {
        unsigned count = hb_ot_color_palette_get_colors(colors, 0, 0, nullptr, nullptr);
        palette_.resize(count);
        hb_ot_color_palette_get_colors(colors, 0, 0, &count, palette_.data());
    }

    IRect Measure(uint32_t glyph, const IRect& most) {
        measuring_ = true;
        DrawGlyph(glyph, Start());
        measuring_ = false;
        return Intersect(measured_, most);
    }
    void Draw(uint32_t glyph, const IRect& bounds, Vector<uint32_t>& pixels) {
        bounds_ = bounds;
        pixels.assign(Area(bounds), 0);
        target_ = pixels.data();
        DrawGlyph(glyph, Start());
    }
    bool IsExhausted() const { return work_ > kMaxWork; }

  private:
    State Start() const { return {Affine(pixelsPerUnit_, 0, 0, -pixelsPerUnit_)}; }
    static size_t Area(const IRect& box) { return size_t(box.Width()) * size_t(box.Height()); }
    IRect BoxOf(const ClipMask* clip) const { return clip ? clip->Box() : bounds_; }
    uint32_t* Row(uint32_t* pixels, int x, int y) const {
        return pixels + size_t(y - bounds_.y0) * size_t(bounds_.Width()) + size_t(x - bounds_.x0);
    }
    // False when there is nothing left to spend.
    bool Spend(int64_t work) {
        work_ += work;
        return !IsExhausted();
    }

    // A glyph with a graph of its own, inside of its box where it has one.
    void DrawGlyph(uint32_t glyph, const State& state) {
        const uint32_t root = table_.FindGlyph(glyph);
        std::array<double, 4> box;
        if (!table_.FindClipBox(glyph, &box)) return Visit(root, state);
        PathData path;
        path.AddRect(float(box[0]), float(box[1]), float(box[2] - box[0]), float(box[3] - box[1]));
        Clip(path, state, [&](const State& inside) { Visit(root, inside); });
    }

    PaintFormat FormatAt(uint32_t paint) const {
        const uint32_t format = table_.Byte(paint);
        const bool varies = format > 1 && format % 2 != 0 && format != uint32_t(PaintFormat::ColrGlyph);
        return PaintFormat(varies ? format - 1 : format);
    }
    bool VariesAt(uint32_t paint) const { return uint32_t(FormatAt(paint)) != table_.Byte(paint); }
    Vec2 PointAt(uint32_t at) const { return {table_.Signed(at), table_.Signed(at + 2)}; }

    void Visit(uint32_t paint, State state) {
        if (paint == 0 || ++state.depth > kMaxDepth || !Spend(kWorkOfPaint)) return;
        if (!(state.toCanvas.MaxScale() < kMaxScale)) return;
        switch (FormatAt(paint)) {
            case PaintFormat::ColrLayers: {
                const uint32_t count = table_.Byte(paint + 1), first = table_.Long(paint + 2);
                for (uint32_t i = 0; i < count && !IsExhausted(); ++i)
                    Visit(table_.FindLayer(first + i), state);
                return;
            }
            case PaintFormat::Glyph: {
                GlyphOutline outline;
                ReadOutline(face_, table_.Word(paint + 4), outline);
                // Outlines are kept with y downward.
                for (Point& point : outline.path.points)
                    point.y = -point.y;
                const uint32_t inner = table_.Follow(paint, paint + 1);
                return Clip(outline.path, state, [&](const State& inside) { Visit(inner, inside); });
            }
            case PaintFormat::ColrGlyph:
                return DrawGlyph(table_.Word(paint + 1), state);
            case PaintFormat::Composite:
                return Composite(paint, state);
            case PaintFormat::Solid:
                return FillSolid(paint, state);
            case PaintFormat::LinearGradient:
            case PaintFormat::RadialGradient:
            case PaintFormat::SweepGradient:
                return FillGradient(paint, state);
            default:
                return Visit(table_.Follow(paint, paint + 1), state.Under(TransformOf(paint)));
        }
    }

    // What stands behind the format and the way to the paint below.
    Homography TransformOf(uint32_t paint) const {
        const uint32_t at = paint + 4;
        // Angles are parts of half a turn.
        const auto angle = [this](uint32_t place) { return table_.F2Dot14(place) * kPi; };
        const auto rotation = [](double turn) {
            const double c = std::cos(turn), s = std::sin(turn);
            return Affine(c, -s, s, c);
        };
        const auto skew = [](double x, double y) { return Affine(1, -std::tan(x), std::tan(y), 1); };
        const auto scale = [](double x, double y) { return Affine(x, 0, 0, y); };
        switch (FormatAt(paint)) {
            case PaintFormat::Transform: {
                const uint32_t m = table_.Follow(paint, at);
                const auto entry = [&](uint32_t i) { return table_.Fixed(m + i * 4); };
                return m == 0 ? Homography()
                              : Affine(entry(0), entry(2), entry(1), entry(3), entry(4), entry(5));
            }
            case PaintFormat::Translate:
                return Affine(1, 0, 0, 1, table_.Signed(at), table_.Signed(at + 2));
            case PaintFormat::Scale:
                return scale(table_.F2Dot14(at), table_.F2Dot14(at + 2));
            case PaintFormat::ScaleAround:
                return Around(PointAt(at + 4), scale(table_.F2Dot14(at), table_.F2Dot14(at + 2)));
            case PaintFormat::ScaleUniform:
                return scale(table_.F2Dot14(at), table_.F2Dot14(at));
            case PaintFormat::ScaleUniformAround:
                return Around(PointAt(at + 2), scale(table_.F2Dot14(at), table_.F2Dot14(at)));
            case PaintFormat::Rotate:
                return rotation(angle(at));
            case PaintFormat::RotateAround:
                return Around(PointAt(at + 2), rotation(angle(at)));
            case PaintFormat::Skew:
                return skew(angle(at), angle(at + 2));
            case PaintFormat::SkewAround:
                return Around(PointAt(at + 4), skew(angle(at), angle(at + 2)));
            default:
                // A format that is not known: nothing of it is visible.
                return scale(0, 0);
        }
    }

    // Draws inside of a path of font units.
    template <class Inside>
    void Clip(const PathData& path, const State& state, Inside&& inside) {
        if (path.points.empty() || !Spend(int64_t(path.points.size()) * kWorkOfPoint)) return;
        const IRect whole = cpu::OutlineBuilder::DeviceBounds(path, state.toCanvas);
        if (measuring_) {
            // Whatever is drawn inside stays inside.
            measured_ = Unite(measured_, whole);
            return;
        }
        const IRect box = Intersect(whole, BoxOf(state.clip));
        if (box.IsEmpty() || !Spend(int64_t(Area(box)))) return;
        ClipMask mask(box);
        rasterizer_.Begin(box);
        builder_.AddFill(path, state.toCanvas, rasterizer_);
        rasterizer_.Sweep(kFillNonZero, mask);
        if (state.clip) mask.Intersect(*state.clip);
        inside(State{state.toCanvas, &mask, state.depth});
    }

    // Both sides come whole, so that an edge of the clip counts once.
    void Composite(uint32_t paint, const State& state) {
        const uint32_t front = table_.Follow(paint, paint + 1), back = table_.Follow(paint, paint + 5);
        const uint32_t number = table_.Byte(paint + 4);
        if (measuring_) {
            Visit(back, state);
            Visit(front, state);
            return;
        }
        if (number >= std::size(kModes) || composites_ == kMaxComposites) return;
        if (!Spend(int64_t(Area(bounds_)) * 2)) return;
        ++composites_;
        Vector<uint32_t> backdrop(Area(bounds_), 0), source(Area(bounds_), 0);
        uint32_t* const before = target_;
        const State whole{state.toCanvas, nullptr, state.depth};
        target_ = backdrop.data();
        Visit(back, whole);
        target_ = source.data();
        Visit(front, whole);
        target_ = before;
        --composites_;
        if (kModes[number] != kKeepsBackdrop)
            cpu::BlendModeRow(kModes[number], backdrop.data(), source.data(), int(Area(bounds_)), nullptr,
                              255);
        FillRows(state.clip, 1, [&](int x, int y, int) { return Row(backdrop.data(), x, y); });
    }

    // `fetch` gives the premultiplied pixels of a row.
    template <class Fetch>
    void FillRows(const ClipMask* clip, int64_t workOfPixel, Fetch&& fetch) {
        const IRect box = BoxOf(clip);
        if (measuring_ || box.IsEmpty() || !Spend(int64_t(Area(box)) * workOfPixel)) return;
        for (int y = box.y0; y < box.y1; ++y) {
            const uint32_t* pixels = fetch(box.x0, y, box.Width());
            cpu::BlendModeRow(kBlendNormal, Row(target_, box.x0, y), pixels, box.Width(),
                              clip ? clip->Row(y) : nullptr, 255);
        }
    }

    // An index into the palette and an alpha.
    GlyphColorStop ColorAt(uint32_t at) const {
        hb_color_t color =
            HB_COLOR(0, 0, 0, 255);  // a picture does not know the text's colour and takes black
        const uint32_t index = table_.Word(at);
        if (index != kTextColor) {
            if (index >= palette_.size()) return {};
            color = palette_[index];
        }
        const float alpha =
            std::clamp(float(table_.F2Dot14(at + 2)), 0.0f, 1.0f) * float(hb_color_get_alpha(color)) / 255;
        const auto channel = [alpha](uint8_t value) { return float(value) / 255 * alpha; };
        return {0, channel(hb_color_get_red(color)), channel(hb_color_get_green(color)),
                channel(hb_color_get_blue(color)), alpha};
    }

    void FillSolid(uint32_t paint, const State& state) {
        const GlyphColorStop c = ColorAt(paint + 1);
        row_.assign(size_t(BoxOf(state.clip).Width()), cpu::PackPixel(c.r, c.g, c.b, c.a));
        FillRows(state.clip, 1, [&](int, int, int) { return row_.data(); });
    }

    GradientGeometry GeometryOf(uint32_t paint) const {
        const uint32_t at = paint + 4;
        switch (FormatAt(paint)) {
            case PaintFormat::LinearGradient:
                return GradientGeometry::Linear(PointAt(at), PointAt(at + 4), PointAt(at + 8));
            case PaintFormat::RadialGradient:
                return GradientGeometry::Radial(PointAt(at), table_.Word(at + 4), PointAt(at + 6),
                                                table_.Word(at + 10));
            default:
                // Angles are stored less half a turn.
                return GradientGeometry::Sweep(PointAt(at), (table_.F2Dot14(at + 4) + 1) * kPi,
                                               (table_.F2Dot14(at + 6) + 1) * kPi);
        }
    }

    ColorLine ColorsOf(uint32_t paint) const {
        const uint32_t line = table_.Follow(paint, paint + 1);
        const uint32_t count = line == 0 ? 0 : std::min(table_.Word(line + 1), kMaxStops);
        const uint32_t size = VariesAt(paint) ? 10 : 6;
        Vector<GlyphColorStop> stops;
        for (uint32_t i = 0; i < count; ++i) {
            const uint32_t stop = line + 3 + i * size;
            stops.push_back(ColorAt(stop + 2));
            stops.back().offset = float(table_.F2Dot14(stop));
        }
        constexpr GradientExtend kExtends[] = {GradientExtend::Pad, GradientExtend::Repeat,
                                               GradientExtend::Reflect};
        const uint32_t extend = table_.Byte(line);
        return ColorLine(std::move(stops), extend < std::size(kExtends) ? kExtends[extend] : kExtends[0]);
    }

    void FillGradient(uint32_t paint, const State& state) {
        Homography toFont;
        if (measuring_ || !state.toCanvas.Invert(&toFont)) return;
        const ColorLine colors = ColorsOf(paint);
        const GradientGeometry geometry = GeometryOf(paint);
        row_.resize(size_t(BoxOf(state.clip).Width()));
        FillRows(state.clip, kWorkOfGradientPixel, [&](int x, int y, int count) {
            for (int i = 0; i < count; ++i)
                row_[size_t(i)] = colors.At(geometry.At(toFont.Apply(x + i + 0.5, y + 0.5)));
            return row_.data();
        });
    }

    const ColorTable& table_;
    FT_Face face_;
    const double pixelsPerUnit_;
    Vector<hb_color_t> palette_;
    bool measuring_ = false;
    IRect measured_, bounds_;
    uint32_t* target_ = nullptr;  // pixels of bounds_
    int composites_ = 0;
    int64_t work_ = 0;
    Vector<uint32_t> row_;
    cpu::Rasterizer rasterizer_;
    cpu::OutlineBuilder builder_;
};

}  // namespace

GraphResult PaintColorGraph(const ColorTable& table, FT_FaceRec_* face, hb_face_t* colors, uint32_t glyph,
                            uint32_t pixelsPerEm, ColorGlyph& out) {
    if (face->units_per_EM == 0 || table.FindGlyph(glyph) == 0) return GraphResult::Nothing;
    const double size = pixelsPerEm;
    GraphPainter painter(table, face, colors, size / face->units_per_EM);
    const int reach = int(pixelsPerEm) * kReach;
    const IRect bounds = painter.Measure(glyph, {-reach, -reach, reach, reach});
    if (bounds.IsEmpty()) return painter.IsExhausted() ? GraphResult::TooMuch : GraphResult::Nothing;
    Vector<uint32_t> pixels;
    painter.Draw(glyph, bounds, pixels);
    if (painter.IsExhausted()) return GraphResult::TooMuch;
    out.pixels = std::move(pixels);
    out.width = uint32_t(bounds.Width()), out.height = uint32_t(bounds.Height());
    out.left = float(bounds.x0 / size), out.top = float(bounds.y0 / size);
    out.emWidth = float(bounds.Width() / size), out.emHeight = float(bounds.Height() / size);
    return GraphResult::Painted;
}

}  // namespace fresco
