// Style records of draws. All are plain data that go into a command buffer as they are.
#pragma once
#include <fresco/geometry.h>

namespace fresco {

using ImageId = uint32_t;
using SurfaceId = uint32_t;
using FontId = uint32_t;
constexpr uint32_t kNoId = 0xFFFFFFFFu;

// Not premultiplied, sRGB-encoded, nominally 0 to 1; only an 8-bit target clamps.
struct Color {
    float r = 0, g = 0, b = 0, a = 1;
};

enum FillKind : uint32_t { kFillSolid = 3 };

// The first 17 in the order of the words of CSS `mix-blend-mode`; the others are the Porter-Duff operators
// that are no CSS blend mode.
enum BlendMode : uint32_t {
    kBlendNormal,
    kBlendMultiply,
    kBlendScreen,
    kBlendOverlay,
    kBlendDarken,
    kBlendLighten,
    kBlendColorDodge,
    kBlendColorBurn,
    kBlendHardLight,
    kBlendSoftLight,
    kBlendDifference,
    kBlendExclusion,
    kBlendHue,
    kBlendSaturation,
    kBlendColor,
    kBlendLuminosity,
    kBlendAdditive,
    kBlendClear,
    kBlendSource,
    kBlendSourceIn,
    kBlendSourceOut,
    kBlendSourceAtop,
    kBlendDestinationOver,
    kBlendDestinationIn,
    kBlendDestinationOut,
    kBlendDestinationAtop,
    kBlendXor,
    kBlendModeCount,
};

enum LineCap : uint32_t { kCapButt, kCapRound, kCapSquare };
enum LineJoin : uint32_t { kJoinMiter, kJoinRound, kJoinBevel };

// The effective alpha of a draw is `color.a * opacity`; images and surfaces are multiplied by it, and ignore
// r, g and b.
struct Paint {
    uint32_t fillKind = kFillSolid;
    float opacity = 1;
    Color color;
    float strokeWidth = 1;
    float miterLimit = 10;
    float textSize = 12;
    uint32_t lineCap = kCapButt;
    uint32_t lineJoin = kJoinMiter;
    uint32_t blend = kBlendNormal;
};

// The same record for a layer, with the layer's opacity in all four colour floats; a back end reads
// `color.a`.
struct LayerPaint : Paint {};

inline LayerPaint MakeLayerPaint(float opacity, uint32_t blend = kBlendNormal) {
    LayerPaint paint;
    paint.color = {opacity, opacity, opacity, opacity};
    paint.blend = blend;
    return paint;
}

// One glyph of a run. The position is relative to the run's origin on the baseline.
struct Glyph {
    uint32_t index = 0;
    float x = 0, y = 0;
};

// Neither flag: as the face was loaded. Both: the field.
enum GlyphRunFlags : uint32_t {
    kGlyphsSdf = 1,    // from a distance field
    kGlyphsPlain = 2,  // from the outline
};

struct GlyphRunParams {
    FontId font = kNoId;
    float size = 12;          // pixels per em
    float x = 0, y = 0;       // origin of the run on the baseline
    float letterSpacing = 0;  // glyph i moves right by i times this; 0 when the positions hold it already
    uint32_t flags = 0;       // GlyphRunFlags
    Paint paint;              // colour, opacity, blend; stroke width and joins for StrokeGlyphs
};

enum TextPaintFlags : uint32_t { kTextStroke = 1 };

// For FillString: one line of text from (x, y) on the baseline, mapped code point by code point.
struct TextPaint {
    FontId font = kNoId;
    float size = 12;
    float x = 0, y = 0;
    uint32_t flags = 0;  // TextPaintFlags
    Paint paint;
};

struct GradientStop {
    float offset = 0;
    Color color;  // premultiplied by its alpha
};

enum GradientSpread : uint32_t { kSpreadPad, kSpreadRepeat, kSpreadReflect };

// In FillLinearGradient and FillRadialGradient the unit is the larger of the rectangle's width and height and
// the origin its top left corner; in effects it is the buffer's own pixels.
struct LinearGradient {
    Point start, end;
    uint32_t spread = kSpreadPad;
};

struct RadialGradient {
    Point center;
    Point radius;  // x and y half axes
    uint32_t spread = kSpreadPad;
};

// How a tiled image repeats: `source` in image pixels (width 0: the whole image) is drawn into `tile`, which
// repeats in both directions with the spacing between two tiles.
struct ImageTile {
    Rect source;
    Rect tile;
    float spacingX = 0, spacingY = 0;
};

// Where an AnimatedPath stands, with the paint of this draw. The points have been moved by the owner of the
// path; `progress` tells a back end that keeps geometry by key frames the factor between the two.
struct MorphProgress {
    float progress = 0;
    Paint paint;
};

}  // namespace fresco
