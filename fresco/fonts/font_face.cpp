#include "fresco/fonts/font_face.h"

#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_OUTLINE_H
#include FT_TRUETYPE_TABLES_H
#include <hb-ot.h>
#include <hb.h>

#include "fresco/core/log.h"

namespace fresco {
namespace {

// Sizes beyond this are no text any more and would only overflow further down.
constexpr float kMaxFontSize = 16384;

bool ValidSize(float size) {
    return size > 0 && size <= kMaxFontSize;
}

uint32_t WeightFlag(int weightClass) {
    const int code = std::clamp((weightClass + 50) / 100, 1, 9);
    constexpr uint32_t kFlags[10] = {0,
                                     kFontWeight100,
                                     kFontWeight200,
                                     kFontWeight300,
                                     0,
                                     kFontWeight500,
                                     kFontWeight600,
                                     kFontWeight700,
                                     kFontWeight800,
                                     kFontWeight900};
    return kFlags[code];
}

void FreeTable(void* table) {
    HeapFree(table, 16);
}

// HarfBuzz reads tables through FreeType, which also unpacks WOFF and WOFF2. Called while the face is loaded
// and, for tables that shaping needs late, under HarfBuzz's own once-only rule; `face` outlives the
// hb_face_t.
struct TableSource {
    FT_Face face;
    std::mutex* mutex;
};

hb_blob_t* LoadTable(hb_face_t*, hb_tag_t tag, void* userData) {
    auto* source = static_cast<TableSource*>(userData);
    std::lock_guard lock(*source->mutex);
    FT_ULong length = 0;
    if (FT_Load_Sfnt_Table(source->face, tag, 0, nullptr, &length) != 0 || length == 0) return nullptr;
    void* table = HeapAllocate(length, 16);
    if (!table) return nullptr;
    if (FT_Load_Sfnt_Table(source->face, tag, 0, static_cast<FT_Byte*>(table), &length) != 0) {
        FreeTable(table);
        return nullptr;
    }
    return hb_blob_create(static_cast<const char*>(table), unsigned(length), HB_MEMORY_MODE_READONLY, table,
                          FreeTable);
}

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

}  // namespace

FontFace::~FontFace() {
    if (hbFont_) hb_font_destroy(hbFont_);
    if (hbFace_) hb_face_destroy(hbFace_);
    if (face_) FT_Done_Face(face_);
}

bool FontFace::Load(FT_LibraryRec_* library, std::shared_ptr<FontData> data, uint32_t faceIndex, SdfMode sdf,
                    FontId id) {
    data_ = std::move(data);
    if (FT_New_Memory_Face(library, data_->bytes.data(), FT_Long(data_->bytes.size()), FT_Long(faceIndex),
                           &face_)) {
        face_ = nullptr;
        return false;
    }
    if (!FT_IS_SFNT(face_) || (!FT_IS_SCALABLE(face_) && !FT_HAS_COLOR(face_))) return false;
    faceIndex_ = faceIndex;
    sdf_ = sdf;
    id_ = id;
    unitsPerEm_ = face_->units_per_EM > 0 ? float(face_->units_per_EM) : 1000;
    hasColor_ = FT_HAS_COLOR(face_) && face_->num_fixed_sizes > 0;
    ReadNames();
    ReadMetrics();
    if (!MakeShaper()) return false;
    ReadAdvances();
    return true;
}

void FontFace::ReadNames() {
    family_ = face_->family_name ? face_->family_name : "";
    const auto* os2 = static_cast<const TT_OS2*>(FT_Get_Sfnt_Table(face_, FT_SFNT_OS2));
    if (os2 && os2->version != 0xFFFF) {
        flags_ = WeightFlag(os2->usWeightClass ? os2->usWeightClass : 400);
        if (os2->fsSelection & 0x1)
            flags_ |= kFontItalic;
        else if (os2->fsSelection & 0x200)
            flags_ |= kFontOblique;
    } else {
        if (face_->style_flags & FT_STYLE_FLAG_BOLD) flags_ |= kFontWeight700;
        if (face_->style_flags & FT_STYLE_FLAG_ITALIC) flags_ |= kFontItalic;
    }
}

void FontFace::ReadMetrics() {
    FontMetrics& m = unitMetrics_;
    m.ascent = -float(face_->ascender);
    m.descent = -float(face_->descender);
    m.lineGap = std::max(0.0f, float(face_->height) - (m.descent - m.ascent));
    m.underlineThickness =
        face_->underline_thickness > 0 ? float(face_->underline_thickness) : unitsPerEm_ / 14;
    m.underlinePosition = -float(face_->underline_position) - m.underlineThickness / 2;
    m.xHeight = unitsPerEm_ * 0.5f;
    m.capHeight = unitsPerEm_ * 0.7f;
    const auto* os2 = static_cast<const TT_OS2*>(FT_Get_Sfnt_Table(face_, FT_SFNT_OS2));
    if (!os2 || os2->version == 0xFFFF) return;
    constexpr int kUseTypoMetrics = 0x80;
    if (os2->fsSelection & kUseTypoMetrics) {
        m.ascent = -float(os2->sTypoAscender);
        m.descent = -float(os2->sTypoDescender);
        m.lineGap = float(os2->sTypoLineGap);
    }
    if (os2->version >= 2) {
        if (os2->sxHeight > 0) m.xHeight = os2->sxHeight;
        if (os2->sCapHeight > 0) m.capHeight = os2->sCapHeight;
    }
}

bool FontFace::MakeShaper() {
    auto* source = HeapNew<TableSource>(TableSource{face_, &mutex_});
    if (!source) return false;
    hbFace_ = hb_face_create_for_tables(LoadTable, source,
                                        [](void* s) { HeapDelete(static_cast<TableSource*>(s)); });
    hb_face_set_upem(hbFace_, unsigned(unitsPerEm_));
    hb_face_set_glyph_count(hbFace_, unsigned(std::max<FT_Long>(0, face_->num_glyphs)));
    hb_face_make_immutable(hbFace_);
    hbFont_ = hb_font_create(hbFace_);
    hb_font_set_scale(hbFont_, int(unitsPerEm_), int(unitsPerEm_));
    if (const unsigned instance = faceIndex_ >> 16) hb_font_set_var_named_instance(hbFont_, instance - 1);
    hb_font_make_immutable(hbFont_);
    return true;
}

void FontFace::ReadAdvances() {
    const size_t count = size_t(std::clamp<FT_Long>(face_->num_glyphs, 0, 65536));
    advances_.resize(count);
    for (size_t i = 0; i < count; ++i) {
        const hb_position_t advance = hb_font_get_glyph_h_advance(hbFont_, hb_codepoint_t(i));
        advances_[i] = uint16_t(std::clamp<hb_position_t>(advance, 0, 0xFFFF));
    }
}

void FontFace::GetGlyphIndices(const uint32_t* codePoints, size_t count, uint32_t* glyphs) const {
    for (size_t i = 0; i < count; ++i) {
        hb_codepoint_t glyph = 0;
        glyphs[i] = hb_font_get_nominal_glyph(hbFont_, codePoints[i], &glyph) ? glyph : 0;
    }
}

FontMetrics FontFace::GetMetrics(float size) const {
    if (!ValidSize(size)) return {};
    const float scale = size / unitsPerEm_;
    const FontMetrics& m = unitMetrics_;
    return {m.ascent * scale,
            m.descent * scale,
            m.lineGap * scale,
            m.underlinePosition * scale,
            m.underlineThickness * scale,
            m.xHeight * scale,
            m.capHeight * scale};
}

bool FontFace::GetAdvances(const uint32_t* glyphs, size_t count, float size, float* advances) const {
    bool valid = ValidSize(size);
    for (size_t i = 0; valid && i < count; ++i)
        valid = glyphs[i] < advances_.size();
    const float scale = size / unitsPerEm_;
    for (size_t i = 0; i < count; ++i)
        advances[i] = valid ? advances_[glyphs[i]] * scale : 0;
    return valid;
}

bool FontFace::Shape(const ShapeRequest& request, IShapeSink& sink) const {
    if (request.count == 0 || request.count > 1u << 24 || !ValidSize(request.size)) return false;
    hb_buffer_t* buffer = hb_buffer_create();
    const bool inContext = request.context && request.contextOffset <= request.contextCount &&
                           request.count <= request.contextCount - request.contextOffset;
    const uint32_t* text = inContext ? request.context : request.codePoints;
    const size_t textLength = inContext ? request.contextCount : request.count;
    const size_t offset = inContext ? request.contextOffset : 0;
    hb_buffer_add_codepoints(buffer, text, int(textLength), unsigned(offset), int(request.count));
    hb_buffer_set_direction(
        buffer, request.direction == TextDirection::RightToLeft ? HB_DIRECTION_RTL : HB_DIRECTION_LTR);
    if (request.script) hb_buffer_set_script(buffer, hb_script_from_iso15924_tag(request.script));
    if (request.language) hb_buffer_set_language(buffer, hb_language_from_string(request.language, -1));
    hb_buffer_guess_segment_properties(buffer);
    hb_shape(hbFont_, buffer, nullptr, 0);

    unsigned count = 0;
    const hb_glyph_info_t* infos = hb_buffer_get_glyph_infos(buffer, &count);
    const hb_glyph_position_t* positions = hb_buffer_get_glyph_positions(buffer, nullptr);
    const float scale = request.size / unitsPerEm_;
    Vector<ShapedGlyph> glyphs(count);
    for (unsigned i = 0; i < count; ++i) {
        glyphs[i] = {infos[i].codepoint, infos[i].cluster - uint32_t(offset), positions[i].x_advance * scale,
                     positions[i].x_offset * scale, -positions[i].y_offset * scale};
    }
    hb_buffer_destroy(buffer);
    if (count) sink.OnGlyphs(glyphs.data(), count);
    return count > 0;
}

void FontFace::PreloadGlyphs(const uint32_t* codePoints, size_t count) const {
    for (size_t i = 0; i < count; ++i) {
        uint32_t glyph = 0;
        GetGlyphIndices(codePoints + i, 1, &glyph);
        if (glyph) GetOutline(glyph);
    }
}

void FontFace::PreloadText(const char* utf8, size_t length) const {
    Vector<uint32_t> codePoints;
    DecodeUtf8(utf8, length, &codePoints);
    PreloadGlyphs(codePoints.data(), codePoints.size());
}

const GlyphOutline& FontFace::GetOutline(uint32_t glyph) const {
    std::lock_guard lock(mutex_);
    auto& slot = outlines_[glyph];
    if (slot) return *slot;
    slot.reset(HeapNew<GlyphOutline>());
    if (!slot) HeapExhausted(sizeof(GlyphOutline));
    if (!FT_IS_SCALABLE(face_)) return *slot;
    if (FT_Load_Glyph(face_, glyph, FT_LOAD_NO_SCALE | FT_LOAD_NO_BITMAP)) return *slot;
    if (face_->glyph->format != FT_GLYPH_FORMAT_OUTLINE) return *slot;
    const FT_Outline_Funcs functions = {
        OutlineSink::Move, OutlineSink::Line, OutlineSink::Conic, OutlineSink::Cubic, 0, 0};
    OutlineSink outlineSink{slot.get()};
    FT_Outline_Decompose(&face_->glyph->outline, &functions, &outlineSink);
    if (outlineSink.open) slot->path.Close();
    const Vector<Point>& points = slot->path.points;
    if (points.empty()) return *slot;
    slot->left = slot->right = points[0].x;
    slot->top = slot->bottom = points[0].y;
    for (const Point& p : points) {
        slot->left = std::min(slot->left, p.x), slot->right = std::max(slot->right, p.x);
        slot->top = std::min(slot->top, p.y), slot->bottom = std::max(slot->bottom, p.y);
    }
    return *slot;
}

const ColorGlyph* FontFace::GetColorGlyph(uint32_t glyph) const {
    if (!hasColor_) return nullptr;
    std::lock_guard lock(mutex_);
    auto& slot = colorGlyphs_[glyph];
    if (!slot) {
        slot.reset(HeapNew<ColorGlyph>());
        if (!slot) HeapExhausted(sizeof(ColorGlyph));
        FT_Select_Size(face_, face_->num_fixed_sizes - 1);
        const bool loaded = FT_Load_Glyph(face_, glyph, FT_LOAD_COLOR) == 0 &&
                            face_->glyph->format == FT_GLYPH_FORMAT_BITMAP &&
                            face_->glyph->bitmap.pixel_mode == FT_PIXEL_MODE_BGRA;
        const float ppem = face_->size ? float(face_->size->metrics.y_ppem) : 0;
        if (loaded && ppem > 0) {
            const FT_Bitmap& bitmap = face_->glyph->bitmap;
            slot->width = bitmap.width, slot->height = bitmap.rows;
            slot->left = face_->glyph->bitmap_left / ppem, slot->top = -face_->glyph->bitmap_top / ppem;
            slot->emWidth = bitmap.width / ppem, slot->emHeight = bitmap.rows / ppem;
            slot->pixels.resize(size_t(bitmap.width) * bitmap.rows);
            for (uint32_t y = 0; y < bitmap.rows; ++y) {
                const uint8_t* row = bitmap.buffer + ptrdiff_t(y) * bitmap.pitch;
                for (uint32_t x = 0; x < bitmap.width; ++x, row += 4) {
                    slot->pixels[size_t(y) * bitmap.width + x] = uint32_t(row[2]) | uint32_t(row[1]) << 8 |
                                                                 uint32_t(row[0]) << 16 |
                                                                 uint32_t(row[3]) << 24;
                }
            }
        }
    }
    return slot->pixels.empty() ? nullptr : slot.get();
}

void DecodeUtf8(const char* text, size_t length, Vector<uint32_t>* out) {
    const auto* p = reinterpret_cast<const uint8_t*>(text);
    const uint8_t* end = p + length;
    while (p < end) {
        const uint32_t lead = *p++;
        if (lead < 0x80) {
            out->push_back(lead);
            continue;
        }
        const int trail = lead >= 0xF0 && lead < 0xF5   ? 3
                          : lead >= 0xE0 && lead < 0xF0 ? 2
                          : lead >= 0xC2 && lead < 0xE0 ? 1
                                                        : 0;
        uint32_t code = lead & (0x3Fu >> trail);
        int read = 0;
        while (read < trail && p + read < end && (p[read] & 0xC0) == 0x80)
            code = code << 6 | (p[read++] & 0x3F);
        constexpr uint32_t kLeast[] = {0, 0x80, 0x800, 0x10000};
        const bool valid = trail > 0 && read == trail && code >= kLeast[trail] && code <= 0x10FFFF &&
                           (code < 0xD800 || code > 0xDFFF);
        if (valid) p += trail;
        out->push_back(valid ? code : 0xFFFD);
    }
}

}  // namespace fresco
