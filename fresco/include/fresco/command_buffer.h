// The recording interface: an append-only stream of plain records (see command_records.h) that knows no
// pixels and no back end.
//
// - One thread records at a time. After it has been handed to a scene a buffer only reads.
// - Arguments are copied at the call, but for the pixels of CreateImage and UpdateImage, which are read when
//   the buffer executes.
// - A draw with a number that is not finite is dropped, with one Warning a buffer.
// - A layer's commands go into the same stream: BeginLayer and its like return this buffer, and so do the
// ends.
//   Callers use the returned pointer all the same, so that a later buffer may give each layer a stream.
// - A layer begins with the transform and clip that are current, and its end brings both back as they were.
//   The layer's effects (gradient geometry, filter lengths) are measured under the transform at its
//   beginning. Its content is not clipped by its parent's clip but for memory: the clip applies when it
//   merges.
#pragma once
#include <fresco/effects.h>
#include <fresco/geometry.h>
#include <fresco/image.h>
#include <fresco/paint.h>
#include <fresco/path.h>
#include <cstddef>

namespace fresco {

enum ClipMode : uint32_t {
    kClipSet = 0,      // replaces the clip that was added since the surrounding PushState or BeginScissor
    kClipExclude = 1,  // takes the shape out of the clip
    kClipIntersect = 2,
    kClipAdd = 3,  // adds a region to what kClipSet began
};

enum StateMask : uint32_t { kStateClip = 1, kStateTransform = 2, kStateAll = 0xFF };

enum LayerFlags : uint32_t {
    kLayerEffectFill =
        0x80,  // the content is coverage alone; the gradient or pattern effect gives the colour
    kLayerContent = 0x400,
};

enum AnnotationKind : uint32_t {
    kAnnotateBaseTransform = 0,  // 16 floats
    kAnnotateCompositionId = 2,  // text
    kAnnotateWorldMatrix = 3,    // 16 floats
    kAnnotateAABB = 4,           // Rect
    kAnnotateEndComposition = 5,
    kAnnotateScale = 6,  // 2 floats
    kAnnotateReserved = 7,
};

enum QueryKind : uint32_t {
    kQueryLocalMatrix =
        1,  // const Matrix4*: the current transform relative to the innermost layer's beginning
    kQueryParentBuffer = 5,  // CommandBuffer*: this buffer inside a layer, else null
    kQueryRenderScale = 7,   // const float[2]: the last Annotate(kAnnotateScale), 1 and 1 without one
};

struct SurfaceDescription {
    uint32_t width = 0, height = 0;
    PixelFormat format = PixelFormat::RGBA8;
};

class CommandBuffer {
  public:
    // Makes the pixels of the rectangle transparent. Flag 1: the whole surface.
    virtual void ClearRect(const Rect& rect, uint32_t flag) = 0;
    virtual void FillRect(const Rect& rect, const Paint& paint) = 0;
    // Along the edge: half of the stroke width on either side.
    virtual void StrokeRect(const Rect& rect, const Paint& paint) = 0;
    virtual void FillQuad(const Point points[4], const Paint& paint) = 0;
    virtual void FillRoundedRect(const Rect& rect, const CornerRadii& radii, const Paint& paint) = 0;
    virtual void StrokeRoundedRect(const Rect& rect, const CornerRadii& radii, const Paint& paint) = 0;
    virtual void FillCircle(float cx, float cy, float z, float radius, const Paint& paint) = 0;
    virtual void StrokeCircle(float cx, float cy, float z, float radius, const Paint& paint) = 0;
    virtual void FillEllipse(float cx, float cy, float z, float rx, float ry, const Paint& paint) = 0;
    virtual void StrokeEllipse(float cx, float cy, float z, float rx, float ry, const Paint& paint) = 0;
    virtual void BeginScissor() = 0;
    virtual void ClipRect(const Rect& rect, uint32_t mode = kClipSet) = 0;
    virtual void ClipQuad(const Point3 points[4], uint32_t mode) = 0;
    virtual void ClipRoundedRect(const Rect& rect, const CornerRadii& radii, uint32_t mode) = 0;
    virtual void ClipEllipse(float cx, float cy, float rx, float ry, uint32_t mode) = 0;
    // Multiplies what the layer holds so far by the alpha of the image; outside of `dst` that is 0.
    virtual void SetMaskImage(ImageId image, const Rect& dst, const Rect& src, uint32_t mode) = 0;
    virtual void SetMaskImageTiled(ImageId image, const Rect& dst, const ImageTile& tile, uint32_t mode) = 0;
    virtual void FillPath(const Path& path, const Paint& paint) = 0;
    virtual void StrokePath(const Path& path, const Paint& paint, uint32_t flag) = 0;
    virtual void ClipPath(const Path& path, uint32_t mode) = 0;
    virtual void FillAnimatedPath(const AnimatedPath& path, const MorphProgress& progress) = 0;
    virtual void StrokeAnimatedPath(const AnimatedPath& path, const MorphProgress& progress) = 0;
    virtual void SetTransform(const Matrix4& matrix) = 0;
    virtual void Translate(float x, float y, float z = 0) = 0;
    virtual void Scale(float x, float y, float z = 1) = 0;
    virtual void Rotate(float radians) = 0;
    virtual void MultiplyTransform(const Matrix4& matrix) = 0;
    virtual void FlattenTransform() = 0;
    virtual void GetTransform(Matrix4* matrix) const = 0;
    // Flag 1: keep the content when a surface of this id and size exists already. A buffer may create the
    // surface that it draws into, as its first command.
    virtual void CreateSurface(SurfaceId surface, const SurfaceDescription& description, uint32_t flag) = 0;
    // `source` in pixels of the surface; width 0: all of it.
    virtual void DrawSurface(SurfaceId surface, const Rect& source, const Rect& destination,
                             const Paint& paint) = 0;
    virtual void SetDebugName(SurfaceId surface, const char* name) = 0;
    virtual CommandBuffer* BeginLayer(uint32_t flags, const LayerPaint& paint) = 0;
    virtual CommandBuffer* BeginLayerWithEffects(uint32_t flags, const LayerPaint& paint,
                                                 const Effect* const* effects, uint32_t count) = 0;
    virtual CommandBuffer* EndLayer() = 0;
    // `matrix` (may be null) takes the transform that was current inside the layer.
    virtual CommandBuffer* EndLayerTransformed(Matrix4* matrix) = 0;
    virtual void FillLinearGradient(const Rect& rect, const Paint& paint, const GradientStop* stops,
                                    uint32_t count, const LinearGradient& geometry) = 0;
    virtual void FillRadialGradient(const Rect& rect, const Paint& paint, const GradientStop* stops,
                                    uint32_t count, const RadialGradient& geometry) = 0;
    virtual void FillRectWithEffect(const Rect& rect, const Paint& paint, const Effect& effect) = 0;
    // A Gaussian blur of the surface this buffer draws into; the standard deviation is half of `radius`, as
    // for CSS shadows.
    virtual void ApplyBlur(float radius) = 0;
    virtual void PushState(uint32_t mask) = 0;
    virtual void PopState() = 0;
    virtual void CreateImage(ImageId image, const Image& description) = 0;
    // `size` bytes in the image's own format, rows without a gap.
    virtual void UpdateImage(ImageId image, const void* pixels, size_t size, uint32_t flag) = 0;
    virtual void DestroyImage(ImageId image) = 0;
    virtual void SetImageDebugName(ImageId image, const char* name) = 0;
    // `src` in pixels of the image; width 0: all of it.
    virtual void DrawImage(ImageId image, const Rect& dst, const Rect& src, const Paint& paint) = 0;
    virtual void DrawImageTiled(ImageId image, const Rect& dst, const ImageTile& tile,
                                const Paint& paint) = 0;
    // Planes Y, U, V and alpha (kNoId: opaque), BT.601 limited range.
    virtual void DrawYUVImage(const ImageId planes[4], const Rect& dst, const Paint& paint) = 0;
    virtual void FillString(const char* utf8, size_t length, const TextPaint& paint) = 0;
    virtual void DrawGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params) = 0;
    virtual void StrokeGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params) = 0;
    // Gives the buffer back; it may be pooled. No call may follow.
    virtual void Release() = 0;
    // `data` as the kind says; texts end with a zero.
    virtual void Annotate(uint32_t kind, const void* data) = 0;
    // A fact about the buffer, see QueryKind. Valid until the next call on the buffer; null for other kinds.
    virtual const void* Query(uint32_t kind) const = 0;

    // Beyond the recording operations: what executes and serialises a buffer reads.
    virtual const void* GetStream() const = 0;
    virtual size_t GetStreamSize() const = 0;
    // The surface that the buffer draws into, kNoId for the scene's render target.
    virtual SurfaceId GetTargetSurface() const = 0;
    virtual bool IsEmpty() const = 0;
    // Pixels of CreateImage and UpdateImage by the index in their records.
    virtual const void* GetPixels(uint32_t index, size_t* size) const = 0;

  protected:
    ~CommandBuffer() = default;
};

}  // namespace fresco
