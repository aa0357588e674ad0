// The command stream: what a CommandBuffer holds, a back end executes and a capture file stores.
//
// A stream is a sequence of records in little-endian order, each aligned to 4 bytes:
//   RecordHeader, then the record's own fields, then its tail.
// FRESCO_COMMANDS below is the one table of records: their structs, the dispatch to back ends, the check of
// loaded files and the finiteness check of the recorder all come from it. Appending a row adds a record;
// changing one raises kStreamVersion.
//
// Units: lengths and positions are pixels under the current transform, y downward; angles are radians;
// colours are not premultiplied but for gradient stops. Ids name images, surfaces and fonts of the rendering
// library.
//
// Tails, each padded with zeros to 4 bytes:
//   None    nothing
//   Path    `path.pointCount` Points, then `path.verbCount` PathVerb bytes
//   Text    `count` bytes of UTF-8 and a zero byte
//   Glyphs  `count` Glyph records
//   Stops   `count` GradientStop records, offsets as given
//   Effects `count` times an EffectHeader and the effect's data:
//             LinearGradient  LinearGradient, uint32 stop count, GradientStops
//             RadialGradient  RadialGradient, uint32 stop count, GradientStops
//             Pattern         PatternGeometry
//             Filter          uint32 filter count, FilterRecords
//             Blend           uint32 blend code
//             Custom          4 floats, 3 uint32 lengths, the three texts each with a zero byte, padded
//   Bytes   `count` bytes, by the record's kind
#pragma once
#include <fresco/command_buffer.h>

namespace fresco {

constexpr uint32_t kStreamVersion = 1;

struct RecordHeader {
    uint32_t type = 0;  // CommandType
    uint32_t size = 0;  // of the whole record in bytes, this header and the padding included
};

struct PathRef {
    uint32_t verbCount = 0, pointCount = 0;
    uint32_t fillRule = 0;
    uint32_t hashLow = 0, hashHigh = 0;  // Path::GetHash: lets a back end keep geometry between frames
};

struct Quad {
    Point points[4];
};

struct Quad3 {
    Point3 points[4];
};

struct Circle {
    float cx = 0, cy = 0, z = 0, rx = 0, ry = 0;
};

struct YuvPlanes {
    ImageId ids[4] = {kNoId, kNoId, kNoId, kNoId};  // Y, U, V, alpha
};

struct EffectHeader {
    uint32_t kind = 0;  // EffectKind
    uint32_t size = 0;  // bytes of data that follow, padding included
};

// Where the pixels of CreateImage and UpdateImage are: an index into the buffer's table of client pointers,
// for a stream holds none. kNoId: no pixels.
struct PixelRef {
    uint32_t index = kNoId;
    uint32_t rowPitch = 0;
};

// X(name, tail, fields), F(type, field)
#define FRESCO_COMMANDS(X, F)                                                                           \
    /* flag 1: the whole surface, whatever the rectangle and the clip */                                \
    X(ClearRect, None, F(Rect, rect) F(uint32_t, flag))                                                 \
    X(FillRect, None, F(Rect, rect) F(Paint, paint))                                                    \
    X(StrokeRect, None, F(Rect, rect) F(Paint, paint))                                                  \
    /* corners in order around the quadrilateral, either way */                                         \
    X(FillQuad, None, F(Quad, quad) F(Paint, paint))                                                    \
    X(FillRoundedRect, None, F(Rect, rect) F(CornerRadii, radii) F(Paint, paint))                       \
    X(StrokeRoundedRect, None, F(Rect, rect) F(CornerRadii, radii) F(Paint, paint))                     \
    /* circles have rx == ry */                                                                         \
    X(FillEllipse, None, F(Circle, circle) F(Paint, paint))                                             \
    X(StrokeEllipse, None, F(Circle, circle) F(Paint, paint))                                           \
    /* the Set and Add clips that follow, up to the first draw, are scissors: rounded out to pixels */  \
    X(BeginScissor, None, F(uint32_t, reserved))                                                        \
    /* mode: ClipMode */                                                                                \
    X(ClipRect, None, F(Rect, rect) F(uint32_t, mode))                                                  \
    X(ClipQuad, None, F(Quad3, quad) F(uint32_t, mode))                                                 \
    X(ClipRoundedRect, None, F(Rect, rect) F(CornerRadii, radii) F(uint32_t, mode))                     \
    X(ClipEllipse, None, F(Circle, circle) F(uint32_t, mode))                                           \
    /* src in pixels of the image, width 0: all; multiplies the layer's content by the image's alpha */ \
    X(SetMaskImage, None, F(ImageId, image) F(Rect, dst) F(Rect, src) F(uint32_t, mode))                \
    X(SetMaskImageTiled, None, F(ImageId, image) F(Rect, dst) F(ImageTile, tile) F(uint32_t, mode))     \
    X(FillPath, Path, F(PathRef, path) F(Paint, paint))                                                 \
    X(StrokePath, Path, F(PathRef, path) F(Paint, paint) F(uint32_t, flag))                             \
    X(ClipPath, Path, F(PathRef, path) F(uint32_t, mode))                                               \
    X(FillAnimatedPath, Path, F(PathRef, path) F(MorphProgress, morph))                                 \
    X(StrokeAnimatedPath, Path, F(PathRef, path) F(MorphProgress, morph))                               \
    X(SetTransform, None, F(Matrix4, matrix))                                                           \
    /* Translate, Scale and Rotate arrive as this too */                                                \
    X(MultiplyTransform, None, F(Matrix4, matrix))                                                      \
    X(FlattenTransform, None, F(uint32_t, reserved))                                                    \
    /* flag 1: keep the content of a surface that is there already with this description */             \
    X(CreateSurface, None, F(SurfaceId, surface) F(SurfaceDescription, description) F(uint32_t, flag))  \
    X(DrawSurface, None, F(SurfaceId, surface) F(Rect, src) F(Rect, dst) F(Paint, paint))               \
    X(SetDebugName, Text, F(SurfaceId, surface) F(uint32_t, count))                                     \
    /* flags: LayerFlags; paint.color.a * paint.opacity is the layer's opacity */                       \
    X(BeginLayer, None, F(uint32_t, flags) F(LayerPaint, paint))                                        \
    X(BeginLayerWithEffects, Effects, F(uint32_t, flags) F(LayerPaint, paint) F(uint32_t, count))       \
    X(EndLayer, None, F(uint32_t, reserved))                                                            \
    /* geometry in units of the larger of the rectangle's sides, from its top left corner */            \
    X(FillLinearGradient, Stops,                                                                        \
      F(Rect, rect) F(Paint, paint) F(LinearGradient, geometry) F(uint32_t, count))                     \
    X(FillRadialGradient, Stops,                                                                        \
      F(Rect, rect) F(Paint, paint) F(RadialGradient, geometry) F(uint32_t, count))                     \
    /* one effect: a gradient or a pattern, its geometry in pixels */                                   \
    X(FillRectWithEffect, Effects, F(Rect, rect) F(Paint, paint) F(uint32_t, count))                    \
    /* CSS shadow radius in pixels of the surface: twice the standard deviation */                      \
    X(ApplyBlur, None, F(float, radius))                                                                \
    /* mask: StateMask */                                                                               \
    X(PushState, None, F(uint32_t, mask))                                                               \
    X(PopState, None, F(uint32_t, reserved))                                                            \
    X(CreateImage, None,                                                                                \
      F(ImageId, image) F(uint32_t, width) F(uint32_t, height) F(uint32_t, format) F(uint32_t, flags)   \
          F(PixelRef, pixels))                                                                          \
    X(UpdateImage, None, F(ImageId, image) F(PixelRef, pixels) F(uint32_t, flag))                       \
    X(DestroyImage, None, F(ImageId, image))                                                            \
    X(SetImageDebugName, Text, F(ImageId, image) F(uint32_t, count))                                    \
    X(DrawImage, None, F(ImageId, image) F(Rect, dst) F(Rect, src) F(Paint, paint))                     \
    X(DrawImageTiled, None, F(ImageId, image) F(Rect, dst) F(ImageTile, tile) F(Paint, paint))          \
    X(DrawYUVImage, None, F(YuvPlanes, planes) F(Rect, dst) F(Paint, paint))                            \
    X(FillString, Text, F(TextPaint, text) F(uint32_t, count))                                          \
    X(DrawGlyphs, Glyphs, F(GlyphRunParams, run) F(uint32_t, count))                                    \
    X(StrokeGlyphs, Glyphs, F(GlyphRunParams, run) F(uint32_t, count))                                  \
    /* kind: AnnotationKind */                                                                          \
    X(Annotate, Bytes, F(uint32_t, kind) F(uint32_t, count))

enum class CommandType : uint32_t {
    Invalid = 0,
#define FRESCO_TYPE(name, tail, fields) name,
#define FRESCO_FIELD(type, field)
    FRESCO_COMMANDS(FRESCO_TYPE, FRESCO_FIELD)
#undef FRESCO_TYPE
#undef FRESCO_FIELD
        Count
};

#define FRESCO_RECORD(name, tail, fields)                       \
    struct name##Record {                                       \
        static constexpr CommandType kType = CommandType::name; \
        fields                                                  \
    };
#define FRESCO_FIELD(type, field) type field{};
FRESCO_COMMANDS(FRESCO_RECORD, FRESCO_FIELD)
#undef FRESCO_RECORD
#undef FRESCO_FIELD

}  // namespace fresco
