// Recording of text: shadows, then fill and stroke of each run.
#include <fresco/command_buffer.h>

#include <cmath>

#include "core/logging/log.h"
#include "display/box_shape.h"
#include "display/display_text.h"
#include "display/paint_context.h"
#include "display/path_cache.h"
#include "display/resolved_visuals.h"
#include "display/shadow_cache.h"
#include "display/transforms.h"
#include "layout/layout_handle.h"
#include "layout/layout_store.h"

namespace qorvex::dsp {

namespace {

uint32_t GlyphFlags(css::QorSdfOption option) {
    switch (option) {
        case css::QorSdfOption::On:
            return fresco::kGlyphsSdf;
        case css::QorSdfOption::Off:
            return fresco::kGlyphsPlain;
        default:
            return 0;
    }
}

// A row of glyphs of one font, from the origin that `params` holds.
struct ShownRun {
    const fresco::Glyph* glyphs;
    uint32_t count;
    float width;
    fresco::GlyphRunParams params;
};

// Calls use(ShownRun) for every run and ellipsis of a text whose box has its corner there.
template <class Use>
void ForEachRun(const layout::TextInfo& info, const layout::LinePlacement* placements, layout::Point corner,
                fresco::GlyphRunParams params, Use&& use) {
    params.size = info.usedSize;
    float top = corner.y;
    for (size_t i = 0; i < info.lines.size(); ++i) {
        const layout::TextLineInfo& line = info.lines[i];
        const float left = corner.x + (placements ? placements[i].x : 0);
        params.y = placements ? corner.y + placements[i].baseline : top + line.baseline;
        for (uint32_t run = line.firstRun; run < line.firstRun + line.runCount; ++run) {
            const layout::TextRun& shown = info.runs[run];
            params.font = shown.font;
            params.x = left + shown.x;
            use(ShownRun{info.glyphs.data() + shown.firstGlyph, shown.glyphCount, shown.width, params});
        }
        if (line.ellipsis.font != css::kNoTypeface) {
            const fresco::Glyph sign{line.ellipsis.glyph, 0, 0};
            params.font = line.ellipsis.font;
            params.x = left + line.ellipsis.x;
            use(ShownRun{&sign, 1, line.ellipsis.advance, params});
        }
        top += line.height;
    }
}

// The surface of a run's blurred shadow holds the glyphs at this distance from its left edge and above the
// baseline: what they may reach beyond their advance, and what the blur adds.
struct ShadowRoom {
    float margin;
    float ascent;
    float height;
    ShadowRoom(float size, float blur)
        : margin(std::ceil(size * 0.5f + blur)),
          ascent(std::ceil(size * 1.25f + blur)),
          height(ascent + std::ceil(size * 0.75f + blur)) {}
};

void DrawBlurredRun(PaintContext& context, const ShownRun& run, float blur, fresco::CommandBuffer& buffer) {
    const ShadowRoom room(run.params.size, blur);
    const float width = std::ceil(run.width) + 2 * room.margin;
    if (width > static_cast<float>(limits::kMaxShadowSurfaceSide)) {
        // Larger than any surface: sharp is better than nothing.
        buffer.DrawGlyphs(run.glyphs, run.count, run.params);
        return;
    }
    const TempMark mark;
    CacheKey key;
    key.Add('t').Add(blur).Add(run.params.font).Add(run.params.size).Add(run.params.flags);
    key.Add(run.params.paint.color).Add(run.width);
    for (uint32_t i = 0; i < run.count; ++i)
        key.Add(run.glyphs[i]);
    CachedShadow surface;
    if (const CachedShadow* found = context.shadows.Find(key.view())) {
        surface = *found;
    } else {
        fresco::CommandBuffer* target =
            context.shadows.Render(key.view(), width, room.height, context.record, surface);
        if (target == nullptr) return;
        fresco::GlyphRunParams inside = run.params;
        inside.x = room.margin;
        inside.y = room.ascent;
        target->DrawGlyphs(run.glyphs, run.count, inside);
        target->ApplyBlur(blur);
    }
    const layout::Rect source{0, 0, 0, width, room.height};
    const layout::Rect destination{run.params.x - room.margin, run.params.y - room.ascent, 0, width,
                                   room.height};
    buffer.DrawSurface(surface.surface, source, destination, fresco::Paint());
}

bool IsMirrored(const layout::Matrix& world) {
    return world.m[0] * world.m[5] - world.m[1] * world.m[4] < 0;
}

}  // namespace

void DisplayText::PaintShadows(PaintContext& context, const layout::LayoutNode& node, layout::Point corner,
                               fresco::CommandBuffer& buffer) const {
    if (!node.visuals || node.visuals->textShadows.empty()) return;
    const css::TextLayoutStyle& style = *node.style->text;
    const auto& items = node.style->visual->textShadow.items;
    bool reported = false;
    for (size_t i = node.visuals->textShadows.size(); i-- > 0;) {
        const ResolvedShadow& shadow = node.visuals->textShadows[i];
        fresco::GlyphRunParams params;
        params.flags = GlyphFlags(style.fontSdf);
        params.paint.color = ToFresco(items[i].color.Resolve(style.color));
        if (params.paint.color.a <= 0) continue;
        const bool blurred = shadow.blur > layout::kLengthTolerance;
        if (blurred && IsMirrored(node.world.Get())) {
            if (!reported) LogWarning("Text shadows on reversed/flipped text is not supported.");
            reported = true;
            continue;
        }
        ForEachRun(lines_->Shown(), lines_->Placements(), {corner.x + shadow.x, corner.y + shadow.y}, params,
                   [&](const ShownRun& run) {
                       if (blurred)
                           DrawBlurredRun(context, run, shadow.blur, buffer);
                       else
                           buffer.DrawGlyphs(run.glyphs, run.count, run.params);
                   });
    }
}

void DisplayText::Paint(PaintContext& context, bool, const layout::LayoutNode& node,
                        fresco::CommandBuffer& buffer) {
    if (layout::IsEmpty(node.visualAabb)) return;
    const layout::Rect box = PaintBox(node, context.snapToPixels);
    if (!layout::IsFinite(box)) {
        AssertFailure("Trying to display text with invalid size.");
        return;
    }
    const css::TextLayoutStyle& style = *node.style->text;
    if (lines_ && !lines_->placed.empty()) {
        if (!lines_->valid) return;
    } else {
        // The box may have become another one than the last measure was asked about.
        if (node.parent == nullptr) return;
        const layout::TextServices& services = node.parent->store().text;
        if (!EnsureLayout(services, {node.style->text, style.computedFontSize, node.box.width,
                                     node.box.height, 0, false, services.complexText}))
            return;
    }

    PaintShadows(context, node, {box.x, box.y}, buffer);
    fresco::GlyphRunParams params;
    params.flags = GlyphFlags(style.fontSdf);
    if (!style.color.IsTransparent()) {
        params.paint.color = ToFresco(style.color);
        ForEachRun(lines_->Shown(), lines_->Placements(), {box.x, box.y}, params,
                   [&](const ShownRun& run) { buffer.DrawGlyphs(run.glyphs, run.count, run.params); });
    }
    if (style.computedStrokeWidth > 0 && !style.textStrokeColor.IsTransparent()) {
        params.paint.color = ToFresco(style.textStrokeColor);
        params.paint.strokeWidth = style.computedStrokeWidth;
        ForEachRun(lines_->Shown(), lines_->Placements(), {box.x, box.y}, params,
                   [&](const ShownRun& run) { buffer.StrokeGlyphs(run.glyphs, run.count, run.params); });
    }
    if (node.style->visual->userSelect != css::UserSelect::None) Publish(context);
}

}  // namespace qorvex::dsp
