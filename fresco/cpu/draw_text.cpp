// Glyph runs. Upright text of ordinary size comes from the glyph cache; large, turned or stroked glyphs are
// outlines like any path; picture glyphs are images.
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {

namespace {

// A source whose colours are multiplied by one colour.
class TintSource final : public PixelSource {
  public:
    TintSource(PixelSource& inner, const Color& color) : inner_(inner) {
        const float channels[] = {color.r, color.g, color.b};
        for (int i = 0; i < 3; ++i)
            factors_[i] = uint32_t(std::clamp(channels[i], 0.0f, 1.0f) * 256 + 0.5f);
    }
    const uint32_t* Fetch(int x, int y, int count, uint32_t* room) override {
        const uint32_t* pixels = inner_.Fetch(x, y, count, room);
        for (int i = 0; i < count; ++i) {
            uint32_t pixel = pixels[i] & 0xFF000000;
            for (int channel = 0; channel < 3; ++channel) {
                const int shift = channel * 8;
                pixel |= ((pixels[i] >> shift & 0xFF) * factors_[channel] >> 8) << shift;
            }
            room[i] = pixel;
        }
        return room;
    }

  private:
    PixelSource& inner_;
    uint32_t factors_[3];
};

}  // namespace

void CpuBackend::DrawCachedRun(const FontFace& face, const GlyphRunParams& run, const Glyph* glyphs,
                               uint32_t count, bool field, const Homography& plane, const Ink& ink) {
    constexpr double kFar = 1 << 22;
    const IRect& clip = clip_.bounds();
    const float size = float(run.size * plane.xx);
    const double reach = size * GlyphCache::kReach + 2;
    placed_.clear();
    {
        GlyphCache::Reader cache(shared_.glyphs);
        for (uint32_t i = 0; i < count; ++i) {
            const Vec2 at =
                plane.Apply(run.x + glyphs[i].x + run.letterSpacing * float(i), run.y + glyphs[i].y);
            if (at.y + reach < clip.y0 || at.y - reach > clip.y1 || at.x + reach < clip.x0 ||
                at.x - reach > clip.x1 || !(std::abs(at.x) < kFar) || !(std::abs(at.y) < kFar))
                continue;
            const int64_t quarter = std::llrint(at.x * GlyphCache::kSubpixels);
            const int subpixel = int(quarter & (GlyphCache::kSubpixels - 1));
            const int x = int((quarter - subpixel) / GlyphCache::kSubpixels), y = int(std::lrint(at.y));
            const GlyphBitmap& bitmap = cache.Get(face, glyphs[i].index, size, subpixel, field);
            const IRect box{x + bitmap.left, y + bitmap.top, x + bitmap.left + bitmap.width,
                            y + bitmap.top + bitmap.height};
            const IRect visible = Intersect(box, clip);
            if (visible.IsEmpty()) continue;
            const ptrdiff_t skipped = ptrdiff_t(visible.y0 - box.y0) * bitmap.width + (visible.x0 - box.x0);
            placed_.push_back({bitmap.coverage + skipped, bitmap.width, visible});
        }
    }
    const Bitmap target = CurrentBitmap();
    PaintSink sink(target, ink, row_);
    for (const PlacedGlyph& glyph : placed_) {
        const uint8_t* line = glyph.coverage;
        if (clip_.IsSimple()) {
            sink.Box(glyph.box, line, glyph.pitch);
        } else {
            for (int y = glyph.box.y0; y < glyph.box.y1; ++y, line += glyph.pitch)
                clip_.Filter(y, glyph.box.x0, line, glyph.box.Width(), sink);
        }
        Touch(glyph.box);
    }
    stats_.paintedPixels += sink.painted();
}

bool CpuBackend::DrawColorGlyph(const FontFace& face, uint32_t glyph, float size, Point at,
                                const Paint& paint) {
    const ColorGlyph* picture = face.GetColorGlyph(glyph);
    if (!picture) return false;
    Texture* texture = GlyphCache::Reader(shared_.glyphs).GetPicture(face, glyph, *picture);
    if (!texture) return true;
    const Rect target{at.x + picture->left * size, at.y + picture->top * size, 0, picture->emWidth * size,
                      picture->emHeight * size};
    const ImageSource::Placement placement{.source = {}, .target = target};
    if (!picture->tinted) {
        DrawTexture(*texture, target, placement, paint);
        return true;
    }
    Homography toPlane;
    if (!PlaneAt(0).Invert(&toPlane)) return true;
    ImageSource source(shared_.resources, *texture, placement, toPlane,
                       std::clamp(paint.color.a * paint.opacity, 0.0f, 1.0f));
    TintSource tinted(source, paint.color);
    Ink ink;
    ink.source = &tinted;
    ink.blend = paint.blend;
    DrawRect(target, ink);
    return true;
}

void CpuBackend::DrawRun(const GlyphRunParams& run, const Glyph* glyphs, uint32_t count, bool stroke) {
    EndScissors();
    const FontFace* face = shared_.fonts.GetFace(run.font);
    if (!face || !(run.size > 0) || clip_.IsEmpty()) return;
    const Ink ink = SolidInk(run.paint);
    if (ink.DrawsNothing()) return;
    ++stats_.draws;
    const Homography plane = PlaneAt(0);
    const double scale = plane.xx;
    const bool upright = plane.IsScaleTranslate() && scale > 0 && std::abs(plane.yy - scale) < 1e-3 * scale;
    const bool cached =
        upright && !stroke && run.size * scale <= GlyphCache::kMaxSize && run.size * scale >= 0.5;
    const bool field =
        (run.flags & kGlyphsSdf) || (face->GetSdfMode() == SdfMode::Always && !(run.flags & kGlyphsPlain));
    const bool pictures = face->HasColorGlyphs() && !stroke;
    if (cached && !pictures) return DrawCachedRun(*face, run, glyphs, count, field, plane, ink);
    const float unit = run.size / face->GetUnitsPerEm();
    for (uint32_t i = 0; i < count; ++i) {
        const Point at{run.x + glyphs[i].x + run.letterSpacing * float(i), run.y + glyphs[i].y};
        if (pictures && DrawColorGlyph(*face, glyphs[i].index, run.size, at, run.paint)) continue;
        if (cached) {
            GlyphRunParams one = run;
            one.x = at.x, one.y = at.y;
            const Glyph glyph{glyphs[i].index, 0, 0};
            DrawCachedRun(*face, one, &glyph, 1, field, plane, ink);
            continue;
        }
        const GlyphOutline& outline = face->GetOutline(glyphs[i].index);
        if (outline.path.points.empty()) continue;
        Homography place;
        place.xx = place.yy = unit, place.x0 = at.x, place.y0 = at.y;
        if (!stroke) {
            DrawOutline(outline.path, plane * place, kFillNonZero, ink);
            continue;
        }
        Paint paint = run.paint;
        paint.strokeWidth /= unit;
        DrawStroke(outline.path, plane * place, paint, ink);
    }
}

void CpuBackend::DrawGlyphs(const DrawGlyphsRecord& record, const GlyphsTail& tail) {
    DrawRun(record.run, tail.glyphs, tail.count, false);
}

void CpuBackend::StrokeGlyphs(const StrokeGlyphsRecord& record, const GlyphsTail& tail) {
    DrawRun(record.run, tail.glyphs, tail.count, true);
}

void CpuBackend::FillString(const FillStringRecord& record, const TextTail& tail) {
    const FontFace* face = shared_.fonts.GetFace(record.text.font);
    if (!face) return;
    codePoints_.clear();
    DecodeUtf8(tail.text, tail.length, &codePoints_);
    const size_t count = codePoints_.size();
    glyphIndices_.resize(count);
    advances_.resize(count);
    glyphs_.resize(count);
    face->GetGlyphIndices(codePoints_.data(), count, glyphIndices_.data());
    face->GetAdvances(glyphIndices_.data(), count, record.text.size, advances_.data());
    float x = 0;
    for (size_t i = 0; i < count; ++i) {
        glyphs_[i] = {glyphIndices_[i], x, 0};
        x += advances_[i];
    }
    GlyphRunParams run;
    run.font = record.text.font, run.size = record.text.size;
    run.x = record.text.x, run.y = record.text.y;
    run.paint = record.text.paint;
    DrawRun(run, glyphs_.data(), uint32_t(count), record.text.flags & kTextStroke);
}

}  // namespace fresco::cpu
