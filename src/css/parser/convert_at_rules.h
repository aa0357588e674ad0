// @font-face and @keyframes to records.
#pragma once

#include <optional>

#include "css/parser/convert_declaration.h"

namespace qorvex::css {

[[nodiscard]] std::optional<FontFace> ConvertFontFace(const FontFaceSyntax& syntax,
                                                      ConversionContext& context);

// `budget` is how many more values the sheet may hold; it is lowered.
[[nodiscard]] KeyframesRule ConvertKeyframes(const KeyframesSyntax& syntax, ConversionContext& context,
                                             size_t& budget);

}  // namespace qorvex::css
