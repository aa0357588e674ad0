#include "fresco/cpu/cpu_backend.h"

#include "fresco/core/log.h"

namespace fresco::cpu {

void CpuBackend::BeginTarget(SurfaceId surface) {
    surface_ = nullptr;
    root_ = target_;
    if (surface != kNoId) {
        surface_ = shared_.resources.FindSurface(surface);
        root_ = surface_ ? surface_->pixels.View(0, 0) : Bitmap{};
    }
    transform_ = Matrix4{};
    clip_ = Clip(surface == kNoId ? Intersect(root_.bounds, band_) : root_.bounds);
    base_ = clip_;
    scissor_ = false;
    saved_.clear();
    layers_.clear();
}

void CpuBackend::Execute(const StreamSource& stream) {
    stream_ = &stream;
    BeginTarget(stream.GetTarget());
    DispatchStream(stream.GetData(), stream.GetSize(), *this);
    while (!layers_.empty())
        CloseLayer();
    if (surface_) surface_->levelsValid = false;
    stream_ = nullptr;
    surface_ = nullptr;
}

Bitmap CpuBackend::CurrentBitmap() const {
    for (size_t i = layers_.size(); i-- > 0;) {
        const Layer& layer = layers_[i];
        if (!layer.collapsed) return layer.pixels.View(layer.bounds.x0, layer.bounds.y0);
    }
    return root_;
}

void CpuBackend::Touch(const IRect& rect) {
    for (size_t i = layers_.size(); i-- > 0;) {
        Layer& layer = layers_[i];
        if (layer.collapsed) continue;
        layer.touched = Unite(layer.touched, rect);
        return;
    }
}

bool CpuBackend::IsOutside(const Rect& rect, const Homography& plane) const {
    const IRect& c = clip_.bounds();
    if (c.IsEmpty()) return true;
    if (!plane.IsScaleTranslate()) return false;
    const Vec2 a = plane.Apply(rect.x, rect.y);
    const Vec2 b = plane.Apply(double(rect.x) + rect.width, double(rect.y) + rect.height);
    // A pixel more than needed: what lies on an edge may be rounded onto it.
    return std::max(a.x, b.x) < c.x0 - 1 || std::min(a.x, b.x) > c.x1 + 1 || std::max(a.y, b.y) < c.y0 - 1 ||
           std::min(a.y, b.y) > c.y1 + 1;
}

Ink CpuBackend::SolidInk(const Paint& paint) const {
    Ink ink;
    const float alpha = std::clamp(paint.color.a * paint.opacity, 0.0f, 1.0f);
    const auto premultiply = [alpha](float c) { return std::clamp(c, 0.0f, 1.0f) * alpha; };
    ink.color =
        PackPixel(premultiply(paint.color.r), premultiply(paint.color.g), premultiply(paint.color.b), alpha);
    ink.blend = paint.blend < kBlendModeCount ? paint.blend : uint32_t(kBlendNormal);
    return ink;
}

void CpuBackend::Sweep(const IRect& bounds, FillRule rule, const Ink& ink) {
    if (!rasterizer_.HasEdges()) return;
    const Bitmap bitmap = CurrentBitmap();
    PaintSink sink(bitmap, ink, row_);
    if (clip_.IsSimple()) {
        rasterizer_.Sweep(rule, sink);
    } else {
        ClipSink clipped(clip_, sink);
        rasterizer_.Sweep(rule, clipped);
    }
    Touch(bounds);
    ++stats_.draws;
    stats_.paintedPixels += sink.painted();
}

void CpuBackend::FillAligned(const IRect& rect, const Ink& ink) {
    const IRect visible = Intersect(rect, clip_.bounds());
    if (visible.IsEmpty()) return;
    const Bitmap bitmap = CurrentBitmap();
    PaintSink sink(bitmap, ink, row_);
    for (int y = visible.y0; y < visible.y1; ++y) {
        if (clip_.IsSimple())
            sink.Span(y, visible.x0, visible.x1, 255);
        else
            clip_.Filter(y, visible.x0, visible.x1, 255, sink);
    }
    Touch(visible);
    ++stats_.draws;
    stats_.paintedPixels += sink.painted();
}

void CpuBackend::DrawOutline(const PathView& path, const Homography& plane, FillRule rule, const Ink& ink) {
    EndScissors();
    if (ink.DrawsNothing()) return;
    const IRect bounds = Intersect(OutlineBuilder::DeviceBounds(path, plane), clip_.bounds());
    if (bounds.IsEmpty()) return;
    rasterizer_.Begin(bounds);
    builder_.AddFill(path, plane, rasterizer_);
    Sweep(bounds, rule, ink);
}

void CpuBackend::DrawStroke(const PathView& path, const Homography& plane, const Paint& paint,
                            const Ink& ink) {
    EndScissors();
    if (ink.DrawsNothing() || !(paint.strokeWidth > 0)) return;
    const StrokeStyle style{paint.strokeWidth, std::max(1.0f, paint.miterLimit), paint.lineCap,
                            paint.lineJoin};
    // Miters reach as far as their limit says, square caps by the diagonal.
    const double reach = style.join == kJoinMiter ? std::max(1.5, style.miterLimit) : 1.5;
    const IRect bounds =
        Intersect(OutlineBuilder::DeviceBounds(path, plane, style.width / 2 * reach), clip_.bounds());
    if (bounds.IsEmpty()) return;
    rasterizer_.Begin(bounds);
    builder_.AddStroke(path, style, plane, rasterizer_);
    Sweep(bounds, kFillNonZero, ink);
}

void CpuBackend::SetTransform(const SetTransformRecord& record, const NoneTail&) {
    transform_ = record.matrix;
}

void CpuBackend::MultiplyTransform(const MultiplyTransformRecord& record, const NoneTail&) {
    transform_ = transform_ * record.matrix;
    // A stream from a file may multiply beyond what floats hold.
    for (float& value : transform_.m) {
        if (!std::isfinite(value)) value = 0;
    }
}

void CpuBackend::FlattenTransform(const FlattenTransformRecord&, const NoneTail&) {
    transform_ = Flattened(transform_);
}

void CpuBackend::PushState(const PushStateRecord& record, const NoneTail&) {
    saved_.push_back({record.mask, transform_, clip_, base_});
    if (record.mask & kStateClip) base_ = clip_;
}

void CpuBackend::PopState(const PopStateRecord&, const NoneTail&) {
    EndScissors();
    const size_t floor = layers_.empty() ? 0 : layers_.back().savedStates;
    if (saved_.size() <= floor) return;
    SavedState& state = saved_.back();
    if (state.mask & kStateTransform) transform_ = state.transform;
    if (state.mask & kStateClip) {
        clip_ = std::move(state.clip);
        base_ = std::move(state.base);
    }
    saved_.pop_back();
}

void CpuBackend::CreateSurface(const CreateSurfaceRecord& record, const NoneTail&) {
    if (record.surface != stream_->GetTarget()) return shared_.resources.CreateSurface(record, owner_);
    // A buffer may make the surface that it draws into: from here on it starts afresh on the new one. Inside
    // of a layer the target must not move.
    if (!layers_.empty()) return;
    shared_.resources.CreateSurface(record, owner_);
    BeginTarget(record.surface);
}

void CpuBackend::CreateImage(const CreateImageRecord& record, const NoneTail&) {
    size_t size = 0;
    const void* pixels = stream_->GetPixels(record.pixels.index, &size);
    shared_.resources.CreateImage(record, pixels, size);
}

void CpuBackend::UpdateImage(const UpdateImageRecord& record, const NoneTail&) {
    size_t size = 0;
    const void* pixels = stream_->GetPixels(record.pixels.index, &size);
    shared_.resources.UpdateImage(record, pixels, size);
}

void CpuBackend::DestroyImage(const DestroyImageRecord& record, const NoneTail&) {
    shared_.resources.DestroyImage(record.image);
}

// Names are for debuggers of other back ends.
void CpuBackend::SetDebugName(const SetDebugNameRecord&, const TextTail&) {}
void CpuBackend::SetImageDebugName(const SetImageDebugNameRecord&, const TextTail&) {}

void CpuBackend::Annotate(const AnnotateRecord& record, const BytesTail& data) {
    if (layers_.empty()) return;
    Layer& layer = layers_.back();
    if (record.kind == kAnnotateCompositionId && data.size > 1) {
        layer.compositionId = reinterpret_cast<const char*>(data.data);
    } else if (record.kind == kAnnotateWorldMatrix && data.size == sizeof(Matrix4)) {
        std::memcpy(&layer.worldMatrix, data.data, sizeof(Matrix4));
    } else if (record.kind == kAnnotateAABB && data.size == sizeof(Rect)) {
        std::memcpy(&layer.aabb, data.data, sizeof(Rect));
    }
}

}  // namespace fresco::cpu
