#include "fresco/fonts/scalable_face.h"

#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_TRUETYPE_TABLES_H
#include <hb-ot.h>
#include <hb.h>

#include <algorithm>
#include <cmath>

namespace fresco {
namespace {

constexpr hb_tag_t kWeightAxis = HB_TAG('w', 'g', 'h', 't');
constexpr hb_tag_t kItalicAxis = HB_TAG('i', 't', 'a', 'l');
constexpr hb_tag_t kSlantAxis = HB_TAG('s', 'l', 'n', 't');

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

constexpr uint32_t kWeightFlags = kFontWeight100 | kFontWeight200 | kFontWeight300 | kFontWeight500 |
                                  kFontWeight600 | kFontWeight700 | kFontWeight800 | kFontWeight900;

// The weight code, 1 to 9, of a flag word.
int WeightCode(uint32_t flags) {
    for (int code = 1; code <= 9; ++code) {
        if (code != 4 && (flags & WeightFlag(code * 100))) return code;
    }
    return 4;
}

}  // namespace

ScalableFace::~ScalableFace() {
    if (colr_) hb_blob_destroy(colr_);
    if (hbFont_) hb_font_destroy(hbFont_);
    if (hbFace_) hb_face_destroy(hbFace_);
    if (face_) FT_Done_Face(face_);
}

bool ScalableFace::Load(FT_LibraryRec_* library, FontDataPtr data, uint32_t faceIndex, SdfMode sdf,
                        FontId id) {
    data_ = std::move(data);
    const std::span<const uint8_t> bytes = data_->bytes();
    if (FT_New_Memory_Face(library, bytes.data(), FT_Long(bytes.size()), FT_Long(faceIndex), &face_)) {
        face_ = nullptr;
        return false;
    }
    if (!FT_IS_SFNT(face_) || (!FT_IS_SCALABLE(face_) && !FT_HAS_COLOR(face_))) return false;
    // Without an outline or a picture of anything there is nothing to show, not even a box.
    if (face_->num_glyphs <= 0) return false;
    faceIndex_ = faceIndex;
    faceCount_ = uint32_t(std::max<FT_Long>(face_->num_faces, 1));
    sdf_ = sdf;
    id_ = id;
    if (!MakeShaper()) return false;
    hasLayers_ = hb_ot_color_has_layers(hbFace_) != 0 && FT_IS_SCALABLE(face_);
    if (FT_IS_SCALABLE(face_)) ReadColorGraphs();
    hasColor_ = (FT_HAS_COLOR(face_) && face_->num_fixed_sizes > 0) || hasLayers_ || graphs_.HasGraphs();
    ReadNames();
    ReadMetrics();
    return true;
}

bool ScalableFace::MakeShaper() {
    // The stream of FreeType is the plain font, also where the file was a packed one (WOFF, WOFF2); it lives
    // as long as the face, so HarfBuzz may read the tables in place.
    const FT_Stream stream = face_->stream;
    if (!stream || !stream->base || stream->size == 0) return false;
    hb_blob_t* blob = hb_blob_create(reinterpret_cast<const char*>(stream->base), unsigned(stream->size),
                                     HB_MEMORY_MODE_READONLY, nullptr, nullptr);
    // Unpacking leaves one face of a packed collection.
    const unsigned index = faceIndex_ & 0xFFFF;
    hbFace_ = hb_face_create(blob, index < hb_face_count(blob) ? index : 0);
    hb_blob_destroy(blob);
    hb_face_set_glyph_count(hbFace_, unsigned(face_->num_glyphs));
    hb_face_make_immutable(hbFace_);
    unitsPerEm_ = float(hb_face_get_upem(hbFace_));
    if (!(unitsPerEm_ > 0)) unitsPerEm_ = 1000;
    hbFont_ = hb_font_create(hbFace_);
    hb_font_set_scale(hbFont_, int(unitsPerEm_), int(unitsPerEm_));
    if (const unsigned instance = faceIndex_ >> 16) hb_font_set_var_named_instance(hbFont_, instance - 1);
    hb_font_make_immutable(hbFont_);

    const size_t count = size_t(std::min<FT_Long>(face_->num_glyphs, 65536));
    advances_ = Vector<std::atomic<uint16_t>>(count);
    return true;
}

void ScalableFace::ReadColorGraphs() {
    colr_ = hb_face_reference_table(hbFace_, HB_TAG('C', 'O', 'L', 'R'));
    unsigned size = 0;
    const char* data = hb_blob_get_data(colr_, &size);
    graphs_ = ColorTable(data, size);
}

void ScalableFace::ReadNames() {
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
    if (faceIndex_ >> 16) flags_ = StyleOfInstance((faceIndex_ >> 16) - 1);
}

void ScalableFace::ReadMetrics() {
    FontMetrics& m = unitMetrics_;
    hb_font_extents_t extents{};
    hb_font_get_h_extents(hbFont_, &extents);
    m.ascent = -float(extents.ascender);
    m.descent = -float(extents.descender);
    m.lineGap = std::max(0.0f, float(extents.line_gap));
    m.underlineThickness =
        face_->underline_thickness > 0 ? float(face_->underline_thickness) : unitsPerEm_ / 14;
    m.underlinePosition = -float(face_->underline_position) - m.underlineThickness / 2;
    m.xHeight = unitsPerEm_ * 0.5f;
    m.capHeight = unitsPerEm_ * 0.7f;
    const auto* os2 = static_cast<const TT_OS2*>(FT_Get_Sfnt_Table(face_, FT_SFNT_OS2));
    if (!os2 || os2->version == 0xFFFF || os2->version < 2) return;
    if (os2->sxHeight > 0) m.xHeight = os2->sxHeight;
    if (os2->sCapHeight > 0) m.capHeight = os2->sCapHeight;
}

uint32_t ScalableFace::GetInstanceCount() const {
    return hb_ot_var_get_named_instance_count(hbFace_);
}

uint32_t ScalableFace::StyleOfInstance(uint32_t instance) const {
    constexpr unsigned kMaxAxes = 16;
    hb_ot_var_axis_info_t axes[kMaxAxes];
    float coords[kMaxAxes] = {};
    unsigned axisCount = kMaxAxes, coordCount = kMaxAxes;
    hb_ot_var_get_axis_infos(hbFace_, 0, &axisCount, axes);
    hb_ot_var_named_instance_get_design_coords(hbFace_, instance, &coordCount, coords);
    uint32_t flags = flags_;
    for (unsigned i = 0; i < std::min(axisCount, coordCount); ++i) {
        const float value = coords[i];
        if (axes[i].tag == kWeightAxis && std::isfinite(value))
            flags = (flags & ~kWeightFlags) | WeightFlag(int(std::clamp(value, 1.0f, 1000.0f)));
        if (axes[i].tag == kItalicAxis)
            flags = (flags & ~uint32_t(kFontItalic)) | (value >= 0.5f ? uint32_t(kFontItalic) : 0);
        if (axes[i].tag == kSlantAxis)
            flags = (flags & ~uint32_t(kFontOblique)) | (value != 0 ? uint32_t(kFontOblique) : 0);
    }
    return flags;
}

uint32_t ScalableFace::FindInstance(uint32_t flags) const {
    const auto distance = [&](uint32_t own) {
        const bool slanted = own & (kFontItalic | kFontOblique);
        const bool wanted = flags & (kFontItalic | kFontOblique);
        // A wrong slant is worse than any weight.
        return std::abs(WeightCode(own) - WeightCode(flags)) + (slanted != wanted ? 16 : 0);
    };
    uint32_t best = 0;
    int least = distance(flags_);
    for (uint32_t i = 0; i < std::min(GetInstanceCount(), 0x7FFFu); ++i) {
        if (const int own = distance(StyleOfInstance(i)); own < least) least = own, best = i + 1;
    }
    return (faceIndex_ & 0xFFFF) | best << 16;
}

void ScalableFace::GetGlyphIndices(const uint32_t* codePoints, size_t count, uint32_t* glyphs) const {
    for (size_t i = 0; i < count; ++i)
        glyphs[i] = glyphs_.Get(hbFont_, codePoints[i]);
}

FontMetrics ScalableFace::GetMetrics(float size) const {
    if (!IsValidFontSize(size)) return {};
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

uint32_t ScalableFace::Advance(uint32_t glyph) const {
    std::atomic<uint16_t>& slot = advances_[glyph];
    const uint16_t known = slot.load(std::memory_order_relaxed);
    if (known != kUnknownAdvance) return known - 1u;
    const hb_position_t advance = hb_font_get_glyph_h_advance(hbFont_, glyph);
    const auto kept = uint32_t(std::clamp<hb_position_t>(advance, 0, kLargestAdvance));
    slot.store(uint16_t(kept + 1), std::memory_order_relaxed);
    return kept;
}

bool ScalableFace::GetAdvances(const uint32_t* glyphs, size_t count, float size, float* advances) const {
    bool valid = IsValidFontSize(size);
    const float scale = size / unitsPerEm_;
    for (size_t i = 0; valid && i < count; ++i) {
        valid = glyphs[i] < advances_.size();
        if (valid) advances[i] = float(Advance(glyphs[i])) * scale;
    }
    if (!valid) std::fill_n(advances, count, 0.0f);
    return valid;
}

bool ScalableFace::Shape(const ShapeRequest& request, IShapeSink& sink) const {
    if (request.count == 0 || request.count > 1u << 24 || request.contextCount > 1u << 24 ||
        !IsValidFontSize(request.size)) {
        return false;
    }
    const ShapedRunPtr run = shapes_.Get(hbFont_, request);
    const size_t count = run->Count();
    if (count == 0) return false;
    constexpr size_t kOnStack = 256;
    ShapedGlyph local[kOnStack];
    Vector<ShapedGlyph> large;
    ShapedGlyph* glyphs = local;
    if (count > kOnStack) {
        large.resize(count);
        glyphs = large.data();
    }
    const float scale = request.size / unitsPerEm_;
    const UnitGlyph* units = run->Glyphs();
    for (size_t i = 0; i < count; ++i) {
        const UnitGlyph& unit = units[i];
        glyphs[i] = {unit.index, unit.cluster, float(unit.advance) * scale, float(unit.x) * scale,
                     float(unit.y) * scale};
    }
    sink.OnGlyphs(glyphs, count);
    return true;
}

}  // namespace fresco
