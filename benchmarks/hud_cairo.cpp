#include "hud_cairo.h"

#include <cairo-ft.h>
#include <cairo.h>

#include <map>

#include "hud_fresco.h"

namespace qorvex::benchmarks {
namespace {

std::uint32_t SwapRedAndBlue(std::uint32_t p) {
    return (p & 0xFF00FF00) | (p & 255) << 16 | (p >> 16 & 255);
}

cairo_surface_t* MakeSurface(const HudPicture& picture) {
    cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, picture.width, picture.height);
    cairo_surface_flush(surface);
    unsigned char* data = cairo_image_surface_get_data(surface);
    const int stride = cairo_image_surface_get_stride(surface);
    for (int y = 0; y < picture.height; ++y) {
        auto* row = reinterpret_cast<std::uint32_t*>(data + static_cast<std::ptrdiff_t>(y) * stride);
        for (int x = 0; x < picture.width; ++x)
            row[x] = SwapRedAndBlue(picture.pixels[static_cast<std::size_t>(y * picture.width + x)]);
    }
    cairo_surface_mark_dirty(surface);
    return surface;
}

void RoundedRect(cairo_t* cr, const fresco::Rect& rect, double radius) {
    constexpr double kQuarter = 1.57079632679489662;
    const double x = rect.x, y = rect.y, right = x + rect.width, bottom = y + rect.height;
    cairo_new_sub_path(cr);
    cairo_arc(cr, right - radius, y + radius, radius, -kQuarter, 0);
    cairo_arc(cr, right - radius, bottom - radius, radius, 0, kQuarter);
    cairo_arc(cr, x + radius, bottom - radius, radius, kQuarter, 2 * kQuarter);
    cairo_arc(cr, x + radius, y + radius, radius, 2 * kQuarter, 3 * kQuarter);
    cairo_close_path(cr);
}

}  // namespace

struct HudCairo::State {
    cairo_surface_t* target = nullptr;
    cairo_t* cr = nullptr;
    FT_Library freetype = nullptr;
    FT_Face face = nullptr;
    cairo_font_face_t* font = nullptr;
    std::map<float, cairo_scaled_font_t*> sizes;
    std::vector<cairo_surface_t*> pictures, shadows;
    std::vector<cairo_pattern_t*> gradients;
    std::vector<cairo_glyph_t> glyphs;

    ~State() {
        for (cairo_pattern_t* pattern : gradients)
            cairo_pattern_destroy(pattern);
        for (cairo_surface_t* surface : pictures)
            cairo_surface_destroy(surface);
        for (cairo_surface_t* surface : shadows)
            cairo_surface_destroy(surface);
        for (const auto& [size, scaled] : sizes)
            cairo_scaled_font_destroy(scaled);
        cairo_destroy(cr);
        cairo_surface_destroy(target);
        cairo_font_face_destroy(font);
        // The face stays with Cairo's caches until the process ends.
    }

    cairo_scaled_font_t* FontOf(float size) {
        cairo_scaled_font_t*& scaled = sizes[size];
        if (!scaled) {
            cairo_matrix_t matrix, identity;
            cairo_matrix_init_scale(&matrix, size, size);
            cairo_matrix_init_identity(&identity);
            cairo_font_options_t* options = cairo_font_options_create();
            cairo_font_options_set_antialias(options, CAIRO_ANTIALIAS_GRAY);
            cairo_font_options_set_hint_style(options, CAIRO_HINT_STYLE_NONE);
            cairo_font_options_set_hint_metrics(options, CAIRO_HINT_METRICS_OFF);
            scaled = cairo_scaled_font_create(font, &matrix, &identity, options);
            cairo_font_options_destroy(options);
        }
        return scaled;
    }
};

HudCairo::HudCairo(const HudScene& hud) : hud_(hud), state_(std::make_unique<State>()) {
    State& s = *state_;
    s.target = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, HudScene::kWidth, HudScene::kHeight);
    s.cr = cairo_create(s.target);
    FT_Init_FreeType(&s.freetype);
    FT_New_Face(s.freetype, kHudFont, 0, &s.face);
    s.font = cairo_ft_font_face_create_for_ft_face(s.face, FT_LOAD_NO_HINTING);
    for (const HudPicture& picture : hud.pictures)
        s.pictures.push_back(MakeSurface(picture));
    for (const HudPicture& picture : hud.shadowPictures)
        s.shadows.push_back(MakeSurface(picture));
    for (const HudGradient& g : hud.gradients) {
        cairo_pattern_t* pattern =
            g.radial ? cairo_pattern_create_radial(g.start.x, g.start.y, 0, g.start.x, g.start.y, g.end.x)
                     : cairo_pattern_create_linear(g.start.x, g.start.y, g.end.x, g.end.y);
        for (const fresco::GradientStop& stop : g.stops) {
            const fresco::Color& c = stop.color;
            cairo_pattern_add_color_stop_rgba(pattern, stop.offset, c.r / c.a, c.g / c.a, c.b / c.a, c.a);
        }
        s.gradients.push_back(pattern);
    }
}

HudCairo::~HudCairo() = default;

void HudCairo::PaintContent(const std::vector<HudBox>& boxes, const std::vector<HudLabel>& labels) {
    cairo_t* cr = state_->cr;
    for (const HudBox& box : boxes) {
        cairo_set_source_rgba(cr, box.color.r, box.color.g, box.color.b, box.color.a);
        RoundedRect(cr, box.rect, box.radius);
        cairo_fill(cr);
    }
    for (const HudLabel& label : labels) {
        cairo_set_scaled_font(cr, state_->FontOf(label.size));
        cairo_set_source_rgba(cr, label.color.r, label.color.g, label.color.b, label.color.a);
        state_->glyphs.clear();
        for (const fresco::Glyph& glyph : label.glyphs)
            state_->glyphs.push_back({glyph.index, label.x + glyph.x, label.y + glyph.y});
        cairo_show_glyphs(cr, state_->glyphs.data(), static_cast<int>(state_->glyphs.size()));
    }
}

void HudCairo::Paint() {
    cairo_t* cr = state_->cr;
    cairo_save(cr);
    cairo_set_operator(cr, CAIRO_OPERATOR_CLEAR);
    cairo_paint(cr);
    cairo_restore(cr);
    for (const HudShadow& shadow : hud_.shadows) {
        cairo_set_source_surface(cr, state_->shadows[shadow.picture], shadow.rect.x, shadow.rect.y);
        cairo_rectangle(cr, shadow.rect.x, shadow.rect.y, shadow.rect.width, shadow.rect.height);
        cairo_fill(cr);
    }
    for (std::size_t i = 0; i < hud_.gradients.size(); ++i) {
        const fresco::Rect& rect = hud_.gradients[i].rect;
        cairo_set_source(cr, state_->gradients[i]);
        cairo_rectangle(cr, rect.x, rect.y, rect.width, rect.height);
        cairo_fill(cr);
    }
    for (const HudImage& image : hud_.images) {
        const HudPicture& picture = hud_.pictures[image.picture];
        cairo_save(cr);
        cairo_rectangle(cr, image.rect.x, image.rect.y, image.rect.width, image.rect.height);
        cairo_translate(cr, image.rect.x, image.rect.y);
        cairo_scale(cr, image.rect.width / picture.width, image.rect.height / picture.height);
        cairo_set_source_surface(cr, state_->pictures[image.picture], 0, 0);
        cairo_pattern_set_filter(cairo_get_source(cr), CAIRO_FILTER_GOOD);
        cairo_pattern_set_extend(cairo_get_source(cr), CAIRO_EXTEND_PAD);
        cairo_fill(cr);
        cairo_restore(cr);
    }
    PaintContent(hud_.boxes, hud_.labels);
    cairo_save(cr);
    cairo_rectangle(cr, hud_.group.x, hud_.group.y, hud_.group.width, hud_.group.height);
    cairo_clip(cr);
    cairo_push_group(cr);
    PaintContent(hud_.groupBoxes, hud_.groupLabels);
    cairo_pop_group_to_source(cr);
    cairo_paint_with_alpha(cr, HudScene::kGroupOpacity);
    cairo_restore(cr);
    cairo_surface_flush(state_->target);
}

std::uint32_t HudCairo::PixelAt(int x, int y) const {
    const unsigned char* data = cairo_image_surface_get_data(state_->target);
    const int stride = cairo_image_surface_get_stride(state_->target);
    return SwapRedAndBlue(
        reinterpret_cast<const std::uint32_t*>(data + static_cast<std::ptrdiff_t>(y) * stride)[x]);
}

}  // namespace qorvex::benchmarks
