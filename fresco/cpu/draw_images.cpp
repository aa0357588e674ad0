// Images, surfaces, tiles, video frames, and what masks make of them.
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {

void CpuBackend::DrawTexture(Texture& texture, const Rect& area, const ImageSource::Placement& placement,
                             const Paint& paint) {
    EndScissors();
    const float alpha = std::clamp(paint.color.a * paint.opacity, 0.0f, 1.0f);
    Homography toPlane;
    const Homography plane = PlaneAt(area.z);
    if (!(alpha > 0) || IsOutside(area, plane) || !plane.Invert(&toPlane)) return;
    ImageSource source(shared_.resources, texture, placement, toPlane, alpha);
    Ink ink;
    ink.source = &source;
    ink.blend = paint.blend;
    DrawRect(area, ink);
}

void CpuBackend::DrawImage(const DrawImageRecord& record, const NoneTail&) {
    if (Texture* image = shared_.resources.FindImage(record.image)) {
        DrawTexture(*image, record.dst, {.source = record.src, .target = record.dst}, record.paint);
    }
}

void CpuBackend::DrawImageTiled(const DrawImageTiledRecord& record, const NoneTail&) {
    Texture* image = shared_.resources.FindImage(record.image);
    if (!image || record.tile.tile.width == 0 || record.tile.tile.height == 0) return;
    DrawTexture(
        *image, record.dst,
        {record.tile.source, record.tile.tile, true, true, record.tile.spacingX, record.tile.spacingY},
        record.paint);
}

void CpuBackend::DrawSurface(const DrawSurfaceRecord& record, const NoneTail&) {
    if (Texture* surface = shared_.resources.FindSurface(record.surface)) {
        DrawTexture(*surface, record.dst, {.source = record.src, .target = record.dst}, record.paint);
    }
}

void CpuBackend::DrawYUVImage(const DrawYUVImageRecord& record, const NoneTail&) {
    const Texture* planes[4] = {};
    for (int i = 0; i < 4; ++i) {
        planes[i] =
            record.planes.ids[i] == kNoId ? nullptr : shared_.resources.FindImage(record.planes.ids[i]);
        const bool present = planes[i] && !planes[i]->alpha.empty();
        if (!present && (i < 3 || record.planes.ids[i] != kNoId)) return;
    }
    Homography toPlane;
    if (!PlaneAt(record.dst.z).Invert(&toPlane)) return;
    YuvSource source(planes, record.dst, toPlane,
                     std::clamp(record.paint.color.a * record.paint.opacity, 0.0f, 1.0f));
    Ink ink;
    ink.source = &source;
    ink.blend = record.paint.blend;
    DrawRect(record.dst, ink);
}

template <class Use>
void CpuBackend::WithEffectSource(uint32_t kind, const uint8_t* data, const Homography& plane, float opacity,
                                  Use use) {
    Homography toPlane;
    if (!plane.Invert(&toPlane)) return;
    const auto stops = [](const uint8_t* list, uint32_t* count) {
        std::memcpy(count, list, sizeof(*count));
        return reinterpret_cast<const GradientStop*>(list + sizeof(*count));
    };
    uint32_t count = 0;
    switch (EffectKind(kind)) {
        case EffectKind::LinearGradient: {
            const auto& geometry = *reinterpret_cast<const LinearGradient*>(data);
            const GradientStop* list = stops(data + sizeof(geometry), &count);
            GradientSource source(geometry, toPlane, gradient_);
            source.SetStops(list, count, opacity);
            return use(source);
        }
        case EffectKind::RadialGradient: {
            const auto& geometry = *reinterpret_cast<const RadialGradient*>(data);
            const GradientStop* list = stops(data + sizeof(geometry), &count);
            GradientSource source(geometry, toPlane, gradient_);
            source.SetStops(list, count, opacity);
            return use(source);
        }
        case EffectKind::Pattern: {
            const auto& pattern = *reinterpret_cast<const PatternGeometry*>(data);
            Texture* texture = pattern.source == kPatternSurface ? shared_.resources.FindSurface(pattern.id)
                                                                 : shared_.resources.FindImage(pattern.id);
            if (!texture) return;
            ImageSource::Placement placement;
            placement.target = pattern.tile;
            if (pattern.tile.width == 0) {
                placement.target = {pattern.tile.x, pattern.tile.y, 0, float(texture->width),
                                    float(texture->height)};
            }
            placement.repeatX = pattern.repeat == kRepeatBoth || pattern.repeat == kRepeatX;
            placement.repeatY = pattern.repeat == kRepeatBoth || pattern.repeat == kRepeatY;
            ImageSource source(shared_.resources, *texture, placement, toPlane, opacity);
            // Where a pattern does not repeat there is nothing beside its one row or column.
            WindowSource window(source, toPlane, placement);
            return use(window);
        }
        default:
            return;
    }
}

void CpuBackend::FillRectWithEffect(const FillRectWithEffectRecord& record, const EffectsTail& effects) {
    if (effects.count == 0) return;
    const auto& header = *reinterpret_cast<const EffectHeader*>(effects.data);
    const float opacity = std::clamp(record.paint.color.a * record.paint.opacity, 0.0f, 1.0f);
    WithEffectSource(header.kind, effects.data + sizeof(header), PlaneAt(record.rect.z), opacity,
                     [&](PixelSource& source) {
                         Ink ink;
                         ink.source = &source;
                         ink.blend = record.paint.blend;
                         DrawRect(record.rect, ink);
                     });
}

// The content becomes coverage for the gradient or pattern: what is drawn in white takes its colours.
void CpuBackend::FillWithEffect(Layer& layer, uint32_t kind, const uint8_t* data) {
    const IRect area = layer.touched;
    if (area.IsEmpty()) return;
    const Bitmap bitmap = layer.pixels.View(layer.bounds.x0, layer.bounds.y0);
    row_.resize(std::max<size_t>(row_.size(), size_t(area.Width())));
    WithEffectSource(kind, data, layer.transform, 1, [&](PixelSource& source) {
        for (int y = area.y0; y < area.y1; ++y) {
            const uint32_t* colors = source.Fetch(area.x0, y, area.Width(), row_.data());
            uint32_t* out = bitmap.Row(y) + area.x0;
            if (colors != row_.data()) std::memcpy(row_.data(), colors, size_t(area.Width()) * 4);
            Rows().ScaleByAlpha(row_.data(), out, area.Width());
            std::memcpy(out, row_.data(), size_t(area.Width()) * 4);
        }
    });
}

void CpuBackend::MaskLayer(Texture* texture, const Rect& area, const ImageSource::Placement& placement) {
    EndScissors();
    if (layers_.empty() || layers_.back().collapsed || layers_.back().touched.IsEmpty()) return;
    Layer& layer = layers_.back();
    const IRect touched = layer.touched;
    const Bitmap bitmap = layer.pixels.View(layer.bounds.x0, layer.bounds.y0);
    ClipMaskPtr inside = MakeClipMask(touched);
    if (!inside) return;
    MaskSink sink(*inside);
    const Homography plane = PlaneAt(area.z);
    Homography toPlane;
    const bool visible = texture && plane.Invert(&toPlane);
    if (visible) {
        path_.Clear();
        path_.AddRect(area.x, area.y, area.width, area.height);
        rasterizer_.Begin(touched);
        builder_.AddFill(path_, plane, rasterizer_);
        rasterizer_.Sweep(kFillNonZero, sink);
    }
    row_.resize(std::max<size_t>(row_.size(), size_t(touched.Width())));
    std::fill(row_.begin(), row_.end(), 0);
    const auto apply = [&](PixelSource* source) {
        for (int y = touched.y0; y < touched.y1; ++y) {
            const uint32_t* mask = row_.data();
            if (source) mask = source->Fetch(touched.x0, y, touched.Width(), row_.data());
            const uint8_t* coverage = inside->Row(y) + touched.x0;
            uint32_t* out = bitmap.Row(y) + touched.x0;
            for (int i = 0; i < touched.Width(); ++i)
                out[i] = ScalePixel(out[i], MulDiv255(mask[i] >> 24, coverage[i]));
        }
    };
    if (!visible) return apply(nullptr);
    ImageSource source(shared_.resources, *texture, placement, toPlane, 1);
    apply(&source);
}

void CpuBackend::SetMaskImage(const SetMaskImageRecord& record, const NoneTail&) {
    MaskLayer(shared_.resources.FindImage(record.image), record.dst,
              {.source = record.src, .target = record.dst});
}

void CpuBackend::SetMaskImageTiled(const SetMaskImageTiledRecord& record, const NoneTail&) {
    const ImageTile& tile = record.tile;
    MaskLayer(shared_.resources.FindImage(record.image), record.dst,
              {tile.source, tile.tile, true, true, tile.spacingX, tile.spacingY});
}

}  // namespace fresco::cpu
