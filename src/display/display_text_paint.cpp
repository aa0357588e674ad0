// Recording of text: shadows, then fill and stroke of each run.
#include <fresco/command_buffer.h>

#include <cmath>

#include "core/logging/log.h"
#include "display/display_text.h"
#include "display/paint_context.h"
#include "display/resolved_visuals.h"
#include "display/transforms.h"
#include "layout/layout_handle.h"
#include "layout/layout_store.h"

namespace qorvex::dsp {

namespace {

// One pass over all runs in one colour.
struct TextPass {
    const layout::TextInfo& info;
    fresco::CommandBuffer& buffer;
    fresco::GlyphRunParams params;  // font, x and y are set per run
    bool stroke = false;

    void Draw(const fresco::Glyph* glyphs, uint32_t count) const {
        if (stroke) {
            buffer.StrokeGlyphs(glyphs, count, params);
        } else {
            buffer.DrawGlyphs(glyphs, count, params);
        }
    }

    void Run(float left, float top) {
        params.size = info.usedSize;
        for (const layout::TextLineInfo& line : info.lines) {
            params.y = top + line.baseline;
            for (uint32_t i = 0; i < line.runCount; ++i) {
                const layout::TextRun& run = info.runs[line.firstRun + i];
                params.font = run.font;
                params.x = left + run.x;
                Draw(info.glyphs.data() + run.firstGlyph, run.glyphCount);
            }
            if (line.ellipsis.font != css::kNoTypeface) {
                const fresco::Glyph sign{line.ellipsis.glyph, 0, 0};
                params.font = line.ellipsis.font;
                params.x = left + line.ellipsis.x;
                Draw(&sign, 1);
            }
            top += line.height;
        }
    }
};

}  // namespace

void DisplayText::Paint(PaintContext& context, bool, const layout::LayoutNode& node,
                        fresco::CommandBuffer& buffer) {
    if (layout::IsEmpty(node.visualAabb)) return;
    const layout::Rect box = PaintBox(node, context.snapToPixels);
    if (!layout::IsFinite(box)) {
        AssertFailure("Trying to display text with invalid size.");
        return;
    }
    // The box may have become another one than the last measure was asked about.
    fresco::IFontService* fonts = node.parent != nullptr ? node.parent->store().fonts : nullptr;
    if (!EnsureLayout(node, fonts, node.box.width, node.box.height)) return;

    const css::TextLayoutStyle& style = *node.style.text;
    TextPass pass{info_, buffer, {}};
    if (node.visuals) {
        const auto& shadows = node.style.visual->textShadow.items;
        for (size_t i = node.visuals->textShadows.size(); i-- > 0;) {
            // A shadow with blur is drawn sharp: blurred text surfaces come with the shadow cache of runs.
            const ResolvedShadow& shadow = node.visuals->textShadows[i];
            pass.params.paint.color = ToFresco(shadows[i].color.Resolve(style.color));
            pass.Run(box.x + shadow.x, box.y + shadow.y);
        }
    }
    if (!style.color.IsTransparent()) {
        pass.params.paint.color = ToFresco(style.color);
        pass.Run(box.x, box.y);
    }
    if (style.computedStrokeWidth > 0 && !style.textStrokeColor.IsTransparent()) {
        pass.stroke = true;
        pass.params.paint.color = ToFresco(style.textStrokeColor);
        pass.params.paint.strokeWidth = style.computedStrokeWidth;
        pass.Run(box.x, box.y);
    }
}

}  // namespace qorvex::dsp
