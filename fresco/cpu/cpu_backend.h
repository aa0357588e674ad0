// The CPU back end: executes a stream into RGBA8 pixels.
//
// A draw goes: record -> outline or rectangle -> Rasterizer -> Clip -> PaintSink (colour source, blend mode).
// Its files: cpu_backend.cpp (targets, state), clip_commands.cpp, draw_shapes.cpp, draw_images.cpp,
// draw_text.cpp, layers.cpp.
#pragma once
#include <fresco/paint_helpers.h>
#include <fresco/scene.h>
#include "fresco/backend/backend.h"
#include "fresco/cpu/clip.h"
#include "fresco/cpu/glyph_cache.h"
#include "fresco/cpu/layer_pool.h"
#include "fresco/cpu/paint_sink.h"
#include "fresco/cpu/sources.h"
#include "fresco/fonts/font_service.h"

namespace fresco::cpu {

// What all scenes of a library share. Frames change it on the render thread; while several threads paint
// bands of one, each part takes its own lock.
struct SharedState {
    IPaintHelpers* helpers = nullptr;
    FontService fonts;
    Resources resources;
    GlyphCache glyphs;
    LayerPool layers;
    MaskBudget clipMasks;
};

class CpuBackend final : public Backend {
  public:
    explicit CpuBackend(SharedState& shared) : shared_(shared), owner_(shared.resources.NewOwner()) {}

    void SetRenderTarget(const Bitmap& bitmap) { target_ = bitmap, band_ = bitmap.bounds; }
    // Only this part of the target is painted.
    void SetBand(const IRect& band) { band_ = band; }
    const Bitmap& GetRenderTarget() const { return target_; }
    void SetCustomCompositor(ICustomCompositor* compositor) { compositor_ = compositor; }
    void SetCustomEffectRenderer(ICustomEffectRenderer* renderer) { effectRenderer_ = renderer; }
    bool HasCustomCompositor() const { return compositor_ != nullptr; }
    bool HasCustomEffectRenderer() const { return effectRenderer_ != nullptr; }
    SceneStats& stats() { return stats_; }
    // Of the surfaces that its streams make.
    uint32_t owner() const { return owner_; }

    void Execute(const StreamSource& stream) override;
    FRESCO_OVERRIDE_COMMANDS

  private:
    struct SavedState {
        uint32_t mask;
        Matrix4 transform;
        Clip clip, base;
    };
    struct Layer {
        PixelBuffer pixels;
        IRect bounds, touched, cleared;
        uint32_t filters = 0;    // how many of its filters apply
        bool collapsed = false;  // without pixels of its own: draws go to the parent
        uint32_t flags = 0;
        LayerPaint paint;
        EffectsTail effects;
        Homography transform;  // at the beginning, as the effects see it
        Matrix4 matrix;
        Clip clip, base;  // of the parent
        size_t savedStates = 0;
        const char* compositionId = nullptr;
        Matrix4 worldMatrix;
        Rect aabb;
    };

    // --- state
    void BeginTarget(SurfaceId surface);
    Homography PlaneAt(float z) const { return Homography::FromMatrix(transform_, z); }
    Bitmap CurrentBitmap() const;
    void Touch(const IRect& rect);
    // True when an upright rectangle lies wholly outside of the clip: most draws of a small repaint end here.
    bool IsOutside(const Rect& rect, const Homography& plane) const;

    // --- drawing
    Ink SolidInk(const Paint& paint) const;
    void DrawOutline(const PathView& path, const Homography& plane, FillRule rule, const Ink& ink);
    void DrawStroke(const PathView& path, const Homography& plane, const Paint& paint, const Ink& ink);
    void DrawRect(const Rect& rect, const Ink& ink);
    void Sweep(const IRect& bounds, FillRule rule, const Ink& ink);
    void FillAligned(const IRect& rect, const Ink& ink);
    void DrawGradient(const Rect& rect, const Paint& paint, const StopsTail& stops,
                      const LinearGradient* linear, const RadialGradient* radial);
    void DrawTexture(Texture& texture, const Rect& area, const ImageSource::Placement& placement,
                     const Paint& paint);

    // --- text
    void DrawRun(const GlyphRunParams& run, const Glyph* glyphs, uint32_t count, bool stroke);
    // `field`: from distance fields, where glyphs have them.
    void DrawCachedRun(const FontFace& face, const GlyphRunParams& run, const Glyph* glyphs, uint32_t count,
                       bool field, const Homography& plane, const Ink& ink);
    bool DrawColorGlyph(const FontFace& face, uint32_t glyph, float size, Point at, const Paint& paint);

    // --- clips
    bool AlignedRect(const Rect& rect, const Homography& plane, IRect* aligned) const;
    void ApplyClip(const PathView& path, const Homography& plane, FillRule rule, uint32_t mode);
    void ApplyClipRect(const IRect& rect, uint32_t mode);
    void EndScissors() { scissor_ = false; }

    // --- layers
    void OpenLayer(uint32_t flags, const LayerPaint& paint, const EffectsTail& effects);
    void CloseLayer();
    void ApplyEffects(Layer& layer, uint32_t* blend);
    void FillWithEffect(Layer& layer, uint32_t kind, const uint8_t* data);
    void RunCustomEffect(Layer& layer, const uint8_t* data, uint32_t size);
    bool Compose(const Layer& layer, float opacity);
    void TakeLayerPixels(Layer& layer, const int outset[4]);
    void MergeLayer(Layer& layer, uint32_t blend, float opacity);
    void MaskLayer(Texture* texture, const Rect& area, const ImageSource::Placement& placement);
    // Calls `use` with the colour source that a gradient or pattern effect describes.
    template <class Use>
    void WithEffectSource(uint32_t kind, const uint8_t* data, const Homography& plane, float opacity,
                          Use use);

    SharedState& shared_;
    const uint32_t owner_;
    Bitmap target_;  // the scene's
    IRect band_;
    const StreamSource* stream_ = nullptr;
    Texture* surface_ = nullptr;  // the stream's target when it is a surface
    Bitmap root_;                 // target of the stream, below all layers

    Matrix4 transform_;
    Clip clip_;
    Clip base_;  // what a Set clip starts from
    bool scissor_ = false;
    Vector<SavedState> saved_;
    Vector<Layer> layers_;

    Rasterizer rasterizer_;
    OutlineBuilder builder_;
    PathData path_;  // scratch outline
    GradientTable gradient_;
    Vector<uint32_t> row_;
    Vector<uint32_t> codePoints_, glyphIndices_;
    Vector<float> advances_;
    Vector<Glyph> glyphs_;
    Vector<PlacedGlyph> placed_;

    ICustomCompositor* compositor_ = nullptr;
    ICustomEffectRenderer* effectRenderer_ = nullptr;
    SceneStats stats_;
};

}  // namespace fresco::cpu
