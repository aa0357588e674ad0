// The CommandBuffer that writes the stream. It follows the transform, since callers may ask for it; it does
// not look at anything else it records.
#pragma once
#include "fresco/commands/stream_bytes.h"
#include "fresco/commands/tails.h"
#include "fresco/core/heap.h"

namespace fresco {

class StreamRecorder final : public CommandBuffer {
  public:
    // Makes a released recorder as new, but for the memory it holds.
    void Begin(SurfaceId target, size_t reserve);

    void ClearRect(const Rect& rect, uint32_t flag) override;
    void FillRect(const Rect& rect, const Paint& paint) override;
    void StrokeRect(const Rect& rect, const Paint& paint) override;
    void FillQuad(const Point points[4], const Paint& paint) override;
    void FillRoundedRect(const Rect& rect, const CornerRadii& radii, const Paint& paint) override;
    void StrokeRoundedRect(const Rect& rect, const CornerRadii& radii, const Paint& paint) override;
    void FillCircle(float cx, float cy, float z, float radius, const Paint& paint) override;
    void StrokeCircle(float cx, float cy, float z, float radius, const Paint& paint) override;
    void FillEllipse(float cx, float cy, float z, float rx, float ry, const Paint& paint) override;
    void StrokeEllipse(float cx, float cy, float z, float rx, float ry, const Paint& paint) override;
    void BeginScissor() override;
    void ClipRect(const Rect& rect, uint32_t mode) override;
    void ClipQuad(const Point3 points[4], uint32_t mode) override;
    void ClipRoundedRect(const Rect& rect, const CornerRadii& radii, uint32_t mode) override;
    void ClipEllipse(float cx, float cy, float rx, float ry, uint32_t mode) override;
    void SetMaskImage(ImageId image, const Rect& dst, const Rect& src, uint32_t mode) override;
    void SetMaskImageTiled(ImageId image, const Rect& dst, const ImageTile& tile, uint32_t mode) override;
    void FillPath(const Path& path, const Paint& paint) override;
    void StrokePath(const Path& path, const Paint& paint, uint32_t flag) override;
    void ClipPath(const Path& path, uint32_t mode) override;
    void FillAnimatedPath(const AnimatedPath& path, const MorphProgress& progress) override;
    void StrokeAnimatedPath(const AnimatedPath& path, const MorphProgress& progress) override;
    void SetTransform(const Matrix4& matrix) override;
    void Translate(float x, float y, float z) override;
    void Scale(float x, float y, float z) override;
    void Rotate(float radians) override;
    void MultiplyTransform(const Matrix4& matrix) override;
    void FlattenTransform() override;
    void GetTransform(Matrix4* matrix) const override;
    void CreateSurface(SurfaceId surface, const SurfaceDescription& description, uint32_t flag) override;
    void DrawSurface(SurfaceId surface, const Rect& source, const Rect& destination,
                     const Paint& paint) override;
    void SetDebugName(SurfaceId surface, const char* name) override;
    CommandBuffer* BeginLayer(uint32_t flags, const LayerPaint& paint) override;
    CommandBuffer* BeginLayerWithEffects(uint32_t flags, const LayerPaint& paint,
                                         const Effect* const* effects, uint32_t count) override;
    CommandBuffer* EndLayer() override;
    CommandBuffer* EndLayerTransformed(Matrix4* matrix) override;
    void FillLinearGradient(const Rect& rect, const Paint& paint, const GradientStop* stops, uint32_t count,
                            const LinearGradient& geometry) override;
    void FillRadialGradient(const Rect& rect, const Paint& paint, const GradientStop* stops, uint32_t count,
                            const RadialGradient& geometry) override;
    void FillRectWithEffect(const Rect& rect, const Paint& paint, const Effect& effect) override;
    void ApplyBlur(float radius) override;
    void PushState(uint32_t mask) override;
    void PopState() override;
    void CreateImage(ImageId image, const Image& description) override;
    void UpdateImage(ImageId image, const void* pixels, size_t size, uint32_t flag) override;
    void DestroyImage(ImageId image) override;
    void SetImageDebugName(ImageId image, const char* name) override;
    void DrawImage(ImageId image, const Rect& dst, const Rect& src, const Paint& paint) override;
    void DrawImageTiled(ImageId image, const Rect& dst, const ImageTile& tile, const Paint& paint) override;
    void DrawYUVImage(const ImageId planes[4], const Rect& dst, const Paint& paint) override;
    void FillString(const char* utf8, size_t length, const TextPaint& paint) override;
    void DrawGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params) override;
    void StrokeGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params) override;
    void Release() override;
    void Annotate(uint32_t kind, const void* data) override;
    const void* Query(uint32_t kind) const override;

    const void* GetStream() const override { return stream_.data(); }
    size_t GetStreamSize() const override { return stream_.size(); }
    SurfaceId GetTargetSurface() const override { return target_; }
    bool IsEmpty() const override { return stream_.empty(); }
    const void* GetPixels(uint32_t index, size_t* size) const override;

  private:
    struct State {
        uint32_t mask;  // StateMask; kLayerState for a layer
        Matrix4 transform;
    };
    struct Pixels {
        const void* data;
        size_t size;
    };
    static constexpr uint32_t kLayerState = 0x80000000u;

    struct Chunk {
        const void* data;
        size_t size;
    };
    template <class Record>
    void Append(const Record& record);
    template <class Record, class... Fields>
    void AppendFields(const Fields&... fields);
    template <class Record>
    void Append(const Record& record, std::initializer_list<Chunk> tail);
    template <class Record>
    void AppendPath(Record record, const Path& path);
    template <class Record>
    void AppendGlyphs(const Glyph* glyphs, uint32_t count, const GlyphRunParams& params);
    template <class Record>
    void AppendGradient(Record record, const GradientStop* stops, uint32_t count);
    void AppendEffects(size_t recordStart, const Effect* const* effects, uint32_t count);
    void Refuse(CommandType type);
    CommandBuffer* BeginLayerState();
    void EndLayerState(Matrix4* matrix);
    uint32_t KeepPixels(const void* data, size_t size);

    StreamBytes stream_;
    Vector<State> states_;
    Vector<Pixels> pixels_;
    Matrix4 transform_;
    float renderScale_[2] = {1, 1};
    SurfaceId target_ = kNoId;
    bool warned_ = false;
    mutable Matrix4 local_;  // what Query hands out
};

}  // namespace fresco
