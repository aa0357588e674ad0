// Layers: drawn apart, changed by effects, merged into what is below them.
//
// A layer's pixels cover the clip that was current at its beginning, grown by what its filters spread; its
// content is drawn straight at device resolution. Only what was touched is filtered, merged and cleared
// again.
#include "fresco/core/log.h"
#include "fresco/cpu/cpu_backend.h"
#include "fresco/cpu/filters.h"

namespace fresco::cpu {
namespace {

// Deeper groups are drawn without a layer of their own.
constexpr size_t kMaxLayerDepth = 256;
// A layer's filters may bring in what lies this far outside of its clip; those that need more are left out.
constexpr int kMaxFilterReach = 12000;

template <class Use>
void ForEachEffect(const EffectsTail& effects, Use use) {
    const uint8_t* cursor = effects.data;
    for (uint32_t i = 0; i < effects.count; ++i) {
        const auto& header = *reinterpret_cast<const EffectHeader*>(cursor);
        use(EffectKind(header.kind), cursor + sizeof(header), header.size);
        cursor += sizeof(header) + header.size;
    }
}

const FilterRecord* Filters(const uint8_t* data, uint32_t* count) {
    std::memcpy(count, data, sizeof(*count));
    return reinterpret_cast<const FilterRecord*>(data + sizeof(*count));
}

// How far the filters reach together, and how many of them there is room for.
uint32_t MeasureFilters(const EffectsTail& effects, const Jacobian& space, int outset[4]) {
    uint32_t total = 0;
    bool room = true;
    ForEachEffect(effects, [&](EffectKind kind, const uint8_t* data, uint32_t) {
        if (kind != EffectKind::Filter) return;
        uint32_t count = 0;
        const FilterRecord* filters = Filters(data, &count);
        for (uint32_t i = 0; i < count && room; ++i) {
            int grown[4] = {outset[0], outset[1], outset[2], outset[3]};
            FilterOutset(filters[i], space, grown);
            room = *std::max_element(grown, grown + 4) <= kMaxFilterReach;
            if (!room) break;
            std::copy(grown, grown + 4, outset);
            ++total;
        }
    });
    return total;
}

IRect Grow(const IRect& r, const int outset[4]) {
    return {r.x0 - outset[0], r.y0 - outset[1], r.x1 + outset[2], r.y1 + outset[3]};
}

// What shows in the clip may come from this far outside of it: the outset, mirrored.
IRect GrowBack(const IRect& r, const int outset[4]) {
    return {r.x0 - outset[2], r.y0 - outset[3], r.x1 + outset[0], r.y1 + outset[1]};
}

}  // namespace

// A layer is as large as its clip and what its filters bring in from around it. Without room for that it is
// as large as the clip and goes unfiltered, without room for that either it is no layer.
void CpuBackend::TakeLayerPixels(Layer& layer, const int outset[4]) {
    const IRect clip = layer.bounds;
    layer.bounds = GrowBack(clip, outset);
    if (shared_.layers.Take(layer.bounds.Width(), layer.bounds.Height(), &layer.pixels)) return;
    FRESCO_WARN("No room for a layer of %d x %d pixels, drawing without it", layer.bounds.Width(),
                layer.bounds.Height());
    layer.bounds = clip;
    layer.filters = 0;
    layer.collapsed = !shared_.layers.Take(clip.Width(), clip.Height(), &layer.pixels);
}

void CpuBackend::OpenLayer(uint32_t flags, const LayerPaint& paint, const EffectsTail& effects) {
    EndScissors();
    Layer layer;
    layer.flags = flags;
    layer.paint = paint;
    layer.effects = effects;
    layer.matrix = transform_;
    layer.transform = PlaneAt(0);
    layer.clip = clip_;
    layer.base = base_;
    layer.savedStates = saved_.size();
    layer.worldMatrix = transform_;

    layer.bounds = clip_.bounds();
    if (layers_.size() >= kMaxLayerDepth) {
        layer.collapsed = true;
    } else if (!layer.bounds.IsEmpty()) {
        int outset[4] = {};
        layer.filters = MeasureFilters(effects, layer.transform.At(0, 0), outset);
        TakeLayerPixels(layer, outset);
    }
    if (!layer.collapsed) {
        clip_ = Clip(layer.bounds);
        base_ = clip_;
        ++stats_.layers;
    }
    layers_.push_back(std::move(layer));
}

void CpuBackend::RunCustomEffect(Layer& layer, const uint8_t* data, uint32_t size) {
    if (!effectRenderer_ || layer.touched.IsEmpty() || size < 4 * sizeof(float) + 3 * sizeof(uint32_t))
        return;
    float params[4];
    uint32_t lengths[3];
    std::memcpy(params, data, sizeof(params));
    std::memcpy(lengths, data + sizeof(params), sizeof(lengths));
    const char* name = reinterpret_cast<const char*>(data + sizeof(params) + sizeof(lengths));
    const char* text1 = name + lengths[0] + 1;
    const char* text2 = text1 + lengths[1] + 1;
    const Bitmap bitmap = layer.pixels.View(layer.bounds.x0, layer.bounds.y0);
    effectRenderer_->RenderCustomEffect({name, params, text1, text2, bitmap.data,
                                         uint32_t(layer.bounds.Width()), uint32_t(layer.bounds.Height()),
                                         uint32_t(bitmap.pitch), layer.matrix});
    layer.touched = layer.bounds;  // the client may draw anywhere
}

void CpuBackend::ApplyEffects(Layer& layer, uint32_t* blend) {
    const Jacobian space = layer.transform.At(0, 0);
    uint32_t left = layer.filters;
    ForEachEffect(layer.effects, [&](EffectKind kind, const uint8_t* data, uint32_t size) {
        switch (kind) {
            case EffectKind::Blend:
                std::memcpy(blend, data, sizeof(*blend));
                break;
            case EffectKind::Filter: {
                uint32_t count = 0;
                const FilterRecord* filters = Filters(data, &count);
                for (uint32_t i = 0; i < count && left > 0; ++i, --left) {
                    int outset[4] = {};
                    FilterOutset(filters[i], space, outset);
                    // Only a colour matrix makes something of nothing.
                    const bool fills =
                        filters[i].kind == uint32_t(FilterKind::ColorMatrix) && filters[i].values[19] != 0;
                    layer.touched = fills ? layer.bounds
                                    : layer.touched.IsEmpty()
                                        ? IRect{}
                                        : Intersect(layer.bounds, Grow(layer.touched, outset));
                    if (layer.touched.IsEmpty()) continue;
                    Bitmap part = layer.pixels.View(layer.bounds.x0, layer.bounds.y0);
                    part.data += size_t(layer.touched.y0 - part.bounds.y0) * part.pitch +
                                 size_t(layer.touched.x0 - part.bounds.x0) * 4;
                    part.bounds = layer.touched;
                    ApplyFilter(part, filters[i], space);
                }
                break;
            }
            case EffectKind::Custom:
                RunCustomEffect(layer, data, size);
                break;
            default:
                FillWithEffect(layer, uint32_t(kind), data);
                break;
        }
    });
}

bool CpuBackend::Compose(const Layer& layer, float opacity) {
    if (!layer.compositionId || !compositor_) return false;
    const Bitmap bitmap = layer.pixels.View(layer.bounds.x0, layer.bounds.y0);
    return compositor_->OnLayer({layer.compositionId, bitmap.data, uint32_t(layer.bounds.Width()),
                                 uint32_t(layer.bounds.Height()), uint32_t(bitmap.pitch), layer.bounds.x0,
                                 layer.bounds.y0, opacity, layer.worldMatrix, layer.aabb});
}

void CpuBackend::MergeLayer(Layer& layer, uint32_t blend, float opacity) {
    const uint8_t alpha = uint8_t(std::clamp(opacity, 0.0f, 1.0f) * 255 + 0.5f);
    const IRect area = Intersect(clip_.bounds(), AffectsOutside(blend) ? layer.bounds : layer.touched);
    if (alpha == 0 || area.IsEmpty()) return;
    const Bitmap from = layer.pixels.View(layer.bounds.x0, layer.bounds.y0), to = CurrentBitmap();
    Ink ink;
    ink.bitmap = &from;
    ink.blend = blend;
    PaintSink sink(to, ink, row_);
    for (int y = area.y0; y < area.y1; ++y) {
        if (clip_.IsSimple())
            sink.Span(y, area.x0, area.x1, alpha);
        else
            clip_.Filter(y, area.x0, area.x1, alpha, sink);
        // Blank again while it is in the cache.
        std::memset(from.Row(y) + layer.touched.x0, 0, size_t(layer.touched.Width()) * 4);
    }
    layer.cleared = area;
    Touch(area);
    stats_.paintedPixels += sink.painted();
}

void CpuBackend::CloseLayer() {
    EndScissors();
    Layer layer = std::move(layers_.back());
    layers_.pop_back();
    saved_.resize(std::min(saved_.size(), layer.savedStates));
    transform_ = layer.matrix;
    clip_ = layer.clip;
    base_ = layer.base;
    if (layer.collapsed || layer.bounds.IsEmpty()) return;
    uint32_t blend = layer.paint.blend;
    ApplyEffects(layer, &blend);
    if (blend >= kBlendModeCount) blend = kBlendNormal;
    const float opacity = layer.paint.color.a * layer.paint.opacity;
    if (!Compose(layer, opacity)) MergeLayer(layer, blend, opacity);
    const IRect& t = layer.touched;
    for (int y = t.y0; y < t.y1; ++y) {
        if (y >= layer.cleared.y0 && y < layer.cleared.y1) continue;
        std::memset(layer.pixels.Row(y - layer.bounds.y0) + (t.x0 - layer.bounds.x0), 0,
                    size_t(t.Width()) * 4);
    }
    shared_.layers.GiveBack(std::move(layer.pixels));
}

void CpuBackend::BeginLayer(const BeginLayerRecord& record, const NoneTail&) {
    OpenLayer(record.flags, record.paint, {});
}

void CpuBackend::BeginLayerWithEffects(const BeginLayerWithEffectsRecord& record,
                                       const EffectsTail& effects) {
    OpenLayer(record.flags, record.paint, effects);
}

void CpuBackend::EndLayer(const EndLayerRecord&, const NoneTail&) {
    if (!layers_.empty()) CloseLayer();
}

void CpuBackend::ApplyBlur(const ApplyBlurRecord& record, const NoneTail&) {
    EndScissors();
    if (!(record.radius > 0)) return;
    const Bitmap bitmap = CurrentBitmap();
    Blur(bitmap, record.radius / 2, record.radius / 2);
    Touch(bitmap.bounds);
}

}  // namespace fresco::cpu
