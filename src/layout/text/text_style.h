// What one text layout depends on, in pixels. Built from a TextLayoutStyle for each measure and compared with
// that of the last one: equal styles mean equal lines.
#pragma once

#include "css/values/style_groups.h"
#include "layout/geometry.h"

namespace qorvex::layout {

// Below zero: the fonts decide.
inline constexpr float kNormalLineHeight = -1;

// What punctuation, digits and the order of runs go by. A text alone has that of its first letter.
enum class BaseDirection : uint8_t { OfText, LeftToRight, RightToLeft };

struct TextStyle {
    css::CssSmallVector<uint32_t, 4>
        typefaces;  // font ids in priority order; css::kNoTypeface while one loads
    float fontSize = 16;
    float usedSize = 16;  // differs from fontSize under font-fit-mode
    float letterSpacing = 0;
    float lineHeight = kNormalLineHeight;
    css::TextAlignType align = css::TextAlignType::Left;
    css::FontFitModeType fit = css::FontFitModeType::None;
    css::OverflowWrapMode overflowWrap = css::OverflowWrapMode::Normal;
    css::WhiteSpaceMode whiteSpace = css::WhiteSpaceMode::Normal;
    css::TextOverflowMode overflow = css::TextOverflowMode::Clip;
    bool complexText = true;  // shaping and directions, where the text needs them
};

[[nodiscard]] TextStyle MakeTextStyle(const css::TextLayoutStyle& style);
// Everything but usedSize, which follows from the rest.
[[nodiscard]] bool SameTextStyle(const TextStyle& a, const TextStyle& b);

// Runs of spaces and line feeds become one space.
[[nodiscard]] inline bool CollapsesSpaces(css::WhiteSpaceMode mode) {
    return mode == css::WhiteSpaceMode::Normal || mode == css::WhiteSpaceMode::NoWrap;
}
[[nodiscard]] inline bool WrapsLines(css::WhiteSpaceMode mode) {
    return mode == css::WhiteSpaceMode::Normal || mode == css::WhiteSpaceMode::PreWrap;
}

}  // namespace qorvex::layout
