// The engine's own fonts, as TrueType files in memory. tools/make_fallback_font draws them during the build.
#pragma once

namespace qorvex::layout {

// Three glyphs: a box, a space and the replacement mark.
extern const unsigned char kSmallFallbackFont[];
extern const unsigned kSmallFallbackFontSize;
// Printable ASCII, the no-break space and the ellipsis.
extern const unsigned char kLargeFallbackFont[];
extern const unsigned kLargeFallbackFontSize;

}  // namespace qorvex::layout
