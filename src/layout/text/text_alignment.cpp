#include "layout/text/text_alignment.h"

#include <algorithm>

namespace qorvex::layout {

namespace {

using css::TextAlignType;

void MoveLine(TextInfo& info, TextLineInfo& line, float distance) {
    if (distance == 0) return;
    line.x += distance;
    line.extent += distance;
    for (uint32_t i = 0; i < line.runCount; ++i)
        info.runs[line.firstRun + i].x += distance;
    line.ellipsis.x += distance;
}

}  // namespace

void AlignLines(const TextStyle& style, float availableWidth, TextInfo& info) {
    float widest = 0;
    for (const TextLineInfo& line : info.lines)
        widest = std::max(widest, line.width);
    const bool known = !std::isnan(availableWidth);
    if (style.align == TextAlignType::Justify && known) widest = availableWidth;
    const float shift = known ? std::max(widest - availableWidth, 0.0f) : 0;
    const float inner = widest - shift;
    const float part = style.align == TextAlignType::Center  ? 0.5f
                       : style.align == TextAlignType::Right ? 1.0f
                                                             : 0.0f;
    for (TextLineInfo& line : info.lines) {
        if (part > 0) {
            const float rest = Near(line.width, widest) ? 0 : std::max(inner - line.width, 0.0f);
            MoveLine(info, line, (shift + rest) * part);
        }
        line.width = widest;
    }
    info.width = widest;
}

}  // namespace qorvex::layout
