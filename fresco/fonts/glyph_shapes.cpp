// What back ends draw of a glyph: outline, picture, distance field. Each is made once, under the face's lock.
#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_OUTLINE_H
#include <hb-ot.h>

#include <algorithm>

#include "fresco/core/log.h"
#include "fresco/fonts/color_paint.h"
#include "fresco/fonts/glyph_outline.h"
#include "fresco/fonts/scalable_face.h"

namespace fresco {
namespace {

// Pixels per em of the pictures that are made of coloured layers; bitmap emoji come at a size near this.
constexpr FT_UInt kPictureSize = 160;
// A glyph of a sane font stays within a few ems.
constexpr unsigned kMaxPictureSide = 2048;

struct OutlineSink {
    GlyphOutline* outline;
    bool open = false;

    static Point Convert(const FT_Vector* v) { return {float(v->x), -float(v->y)}; }
    static int Move(const FT_Vector* to, void* self) {
        auto* sink = static_cast<OutlineSink*>(self);
        if (sink->open) sink->outline->path.Close();
        sink->open = true;
        sink->outline->path.MoveTo(Convert(to));
        return 0;
    }
    static int Line(const FT_Vector* to, void* self) {
        static_cast<OutlineSink*>(self)->outline->path.LineTo(Convert(to));
        return 0;
    }
    static int Conic(const FT_Vector* control, const FT_Vector* to, void* self) {
        static_cast<OutlineSink*>(self)->outline->path.QuadTo(Convert(control), Convert(to));
        return 0;
    }
    static int Cubic(const FT_Vector* c1, const FT_Vector* c2, const FT_Vector* to, void* self) {
        static_cast<OutlineSink*>(self)->outline->path.CubicTo(Convert(c1), Convert(c2), Convert(to));
        return 0;
    }
};

template <class Map, class Load>
auto& Cached(Map& map, uint32_t glyph, Load&& load) {
    using Value = std::remove_reference_t<decltype(*map[glyph])>;
    auto& slot = map[glyph];
    if (!slot) {
        slot.reset(HeapNew<Value>());
        if (!slot) HeapExhausted(sizeof(Value));
        load(*slot);
    }
    return *slot;
}

}  // namespace

void ReadOutline(FT_FaceRec_* face, uint32_t glyph, GlyphOutline& out) {
    if (!FT_IS_SCALABLE(face)) return;
    if (FT_Load_Glyph(face, glyph, FT_LOAD_NO_SCALE | FT_LOAD_NO_BITMAP)) return;
    if (face->glyph->format != FT_GLYPH_FORMAT_OUTLINE) return;
    const FT_Outline_Funcs functions = {
        OutlineSink::Move, OutlineSink::Line, OutlineSink::Conic, OutlineSink::Cubic, 0, 0};
    OutlineSink outlineSink{&out};
    FT_Outline& outline = face->glyph->outline;
    // Every point of the font ends a line or a curve or bends one; each contour has a start and an end more.
    const auto isBend = [](char tag) { return FT_CURVE_TAG(tag) != FT_CURVE_TAG_ON; };
    const size_t count = size_t(outline.n_points), contours = size_t(outline.n_contours);
    out.path.verbs.reserve(count + 2 * contours);
    out.path.points.reserve(count + size_t(std::count_if(outline.tags, outline.tags + count, isBend)) +
                            contours);
    FT_Outline_Decompose(&outline, &functions, &outlineSink);
    if (outlineSink.open) out.path.Close();
    const Vector<Point>& points = out.path.points;
    if (points.empty()) return;
    out.left = out.right = points[0].x;
    out.top = out.bottom = points[0].y;
    for (const Point& p : points) {
        out.left = std::min(out.left, p.x), out.right = std::max(out.right, p.x);
        out.top = std::min(out.top, p.y), out.bottom = std::max(out.bottom, p.y);
    }
}

const GlyphOutline& ScalableFace::GetOutline(uint32_t glyph) const {
    std::lock_guard lock(mutex_);
    return Cached(outlines_, glyph, [&](GlyphOutline& out) { ReadOutline(face_, glyph, out); });
}

const ColorGlyph* ScalableFace::GetColorGlyph(uint32_t glyph) const {
    if (!hasColor_) return nullptr;
    std::lock_guard lock(mutex_);
    const ColorGlyph& found = Cached(pictures_, glyph, [&](ColorGlyph& out) { LoadPicture(glyph, out); });
    return found.pixels.empty() ? nullptr : &found;
}

const DistanceField* ScalableFace::GetDistanceField(uint32_t glyph) const {
    std::lock_guard lock(mutex_);
    const DistanceField& found =
        Cached(fields_, glyph, [&](DistanceField& out) { LoadDistances(glyph, out); });
    return found.values.empty() ? nullptr : &found;
}

bool ScalableFace::LoadGraph(uint32_t glyph, ColorGlyph& out) const {
    if (graphsRefused_) return false;
    const GraphResult result = PaintColorGraph(graphs_, face_, hbFace_, glyph, kPictureSize, out);
    if (result == GraphResult::TooMuch) {
        // A font that tries once may do so with each of its glyphs.
        graphsRefused_ = true;
        FRESCO_WARN("A colour glyph of the font %s is too much to paint: its glyphs show as outlines",
                    family_.c_str());
    }
    return result == GraphResult::Painted;
}

void ScalableFace::LoadPicture(uint32_t glyph, ColorGlyph& out) const {
    if (graphs_.HasGraphs() && LoadGraph(glyph, out)) return;
    FT_Int32 flags = FT_LOAD_COLOR;
    if (hasLayers_) {
        // FreeType draws the layers one over the other.
        if (hb_ot_color_glyph_get_layers(hbFace_, glyph, 0, nullptr, nullptr) == 0) return;
        if (FT_Set_Pixel_Sizes(face_, 0, kPictureSize)) return;
        flags |= FT_LOAD_RENDER | FT_LOAD_NO_HINTING;
    } else if (face_->num_fixed_sizes == 0 || FT_Select_Size(face_, face_->num_fixed_sizes - 1)) {
        return;
    }
    if (FT_Load_Glyph(face_, glyph, flags) || face_->glyph->format != FT_GLYPH_FORMAT_BITMAP) return;
    const FT_Bitmap& bitmap = face_->glyph->bitmap;
    const float ppem = face_->size ? float(face_->size->metrics.y_ppem) : 0;
    if (bitmap.pixel_mode != FT_PIXEL_MODE_BGRA || !(ppem > 0)) return;
    if (bitmap.width > kMaxPictureSide || bitmap.rows > kMaxPictureSide) return;
    out.width = bitmap.width, out.height = bitmap.rows;
    out.left = float(face_->glyph->bitmap_left) / ppem, out.top = -float(face_->glyph->bitmap_top) / ppem;
    out.emWidth = float(bitmap.width) / ppem, out.emHeight = float(bitmap.rows) / ppem;
    out.pixels.resize(size_t(bitmap.width) * bitmap.rows);
    for (uint32_t y = 0; y < bitmap.rows; ++y) {
        const uint8_t* row = bitmap.buffer + ptrdiff_t(y) * bitmap.pitch;
        for (uint32_t x = 0; x < bitmap.width; ++x, row += 4) {
            out.pixels[size_t(y) * bitmap.width + x] =
                uint32_t(row[2]) | uint32_t(row[1]) << 8 | uint32_t(row[0]) << 16 | uint32_t(row[3]) << 24;
        }
    }
}

void ScalableFace::LoadDistances(uint32_t glyph, DistanceField& out) const {
    if (!FT_IS_SCALABLE(face_) || FT_Set_Pixel_Sizes(face_, 0, DistanceField::kSize)) return;
    if (FT_Load_Glyph(face_, glyph, FT_LOAD_NO_HINTING | FT_LOAD_NO_BITMAP)) return;
    FT_GlyphSlot slot = face_->glyph;
    if (slot->format != FT_GLYPH_FORMAT_OUTLINE || slot->outline.n_points == 0) return;
    FT_BBox box;
    FT_Outline_Get_CBox(&slot->outline, &box);
    constexpr FT_Pos kMost = FT_Pos(kMaxPictureSide) * 64;
    if (box.xMax - box.xMin > kMost || box.yMax - box.yMin > kMost) return;
    if (FT_Render_Glyph(slot, FT_RENDER_MODE_SDF)) return;
    const FT_Bitmap& bitmap = slot->bitmap;
    if (bitmap.width == 0 || bitmap.rows == 0 || bitmap.width > 2 * kMaxPictureSide) return;
    out.left = slot->bitmap_left, out.top = -slot->bitmap_top;
    out.width = int(bitmap.width), out.height = int(bitmap.rows);
    out.values.resize(size_t(bitmap.width) * bitmap.rows);
    for (uint32_t y = 0; y < bitmap.rows; ++y)
        std::copy_n(bitmap.buffer + ptrdiff_t(y) * bitmap.pitch, bitmap.width,
                    out.values.data() + size_t(y) * bitmap.width);
}

void ScalableFace::LoadShape(uint32_t glyph) const {
    if (!GetColorGlyph(glyph)) GetOutline(glyph);
    if (sdf_ == SdfMode::Always) GetDistanceField(glyph);
}

void ScalableFace::PreloadGlyphs(const uint32_t* codePoints, size_t count) const {
    for (size_t i = 0; i < count; ++i) {
        uint32_t glyph = 0;
        GetGlyphIndices(codePoints + i, 1, &glyph);
        if (glyph != 0) LoadShape(glyph);
    }
}

void ScalableFace::PreloadText(const char* utf8, size_t length) const {
    class Loader final : public IShapeSink {
      public:
        explicit Loader(const ScalableFace& face) : face_(face) {}
        void OnGlyphs(const ShapedGlyph* glyphs, size_t count) override {
            for (size_t i = 0; i < count; ++i)
                if (glyphs[i].index != 0) face_.LoadShape(glyphs[i].index);
        }

      private:
        const ScalableFace& face_;
    };
    Vector<uint32_t> codePoints;
    DecodeUtf8(utf8, length, &codePoints);
    ShapeRequest request;
    request.codePoints = codePoints.data(), request.count = codePoints.size();
    // Letters join as they are read: with one that runs from right to left the whole text may.
    hb_unicode_funcs_t* unicode = hb_unicode_funcs_get_default();
    for (const uint32_t code : codePoints)
        if (hb_script_get_horizontal_direction(hb_unicode_script(unicode, code)) == HB_DIRECTION_RTL)
            request.direction = TextDirection::RightToLeft;
    Loader loader(*this);
    Shape(request, loader);
}

}  // namespace fresco
