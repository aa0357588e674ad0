#include "display/layer_effects.h"

#include "core/logging/log.h"
#include "core/memory/temp_vector.h"
#include "css/values/style_groups.h"
#include "display/display_element.h"

#include <fresco/effects.h>

#include <algorithm>

namespace qorvex::dsp {

using css::VisualStyle;
using fresco::CommandBuffer;
using fresco::Effect;
using fresco::FilterRecord;
using layout::LayoutNode;

namespace {

void SetValues(FilterRecord& record, fresco::FilterKind kind, std::initializer_list<float> values) {
    record.kind = static_cast<uint32_t>(kind);
    std::copy(values.begin(), values.end(), record.values);
}

// The library counts its filters differently.
fresco::FilterKind AmountKind(css::FilterKind kind) {
    switch (kind) {
        case css::FilterKind::Brightness:
            return fresco::FilterKind::Brightness;
        case css::FilterKind::Contrast:
            return fresco::FilterKind::Contrast;
        case css::FilterKind::Grayscale:
            return fresco::FilterKind::Grayscale;
        case css::FilterKind::HueRotate:
            return fresco::FilterKind::HueRotate;
        case css::FilterKind::Invert:
            return fresco::FilterKind::Invert;
        case css::FilterKind::Opacity:
            return fresco::FilterKind::Opacity;
        case css::FilterKind::Saturate:
            return fresco::FilterKind::Saturate;
        default:
            return fresco::FilterKind::Sepia;
    }
}

FilterRecord ToRecord(const css::FilterFunction& filter, const LayoutNode& node,
                      const css::LengthContext& lengths) {
    FilterRecord record;
    auto pixels = [&](const css::Length& length) { return std::max(ResolveLength(length, lengths), 0.0f); };
    switch (filter.kind) {
        case css::FilterKind::Blur:
            SetValues(record, fresco::FilterKind::Blur, {pixels(filter.radiusX)});
            break;
        case css::FilterKind::AxisBlur:
            SetValues(record, fresco::FilterKind::AxisBlur, {pixels(filter.radiusX), pixels(filter.radiusY)});
            break;
        case css::FilterKind::DropShadow: {
            const css::ShadowItem& shadow = filter.shadow;
            const css::Color color = shadow.color.Resolve(node.style->text->color);
            SetValues(record, fresco::FilterKind::DropShadow,
                      {ResolveLength(shadow.offsetX, lengths), ResolveLength(shadow.offsetY, lengths),
                       pixels(shadow.blur), color.red, color.green, color.blue, color.alpha});
            break;
        }
        case css::FilterKind::ColorMatrix:
            record.kind = static_cast<uint32_t>(fresco::FilterKind::ColorMatrix);
            std::copy(filter.matrix.begin(), filter.matrix.end(), record.values);
            break;
        default:
            SetValues(record, AmountKind(filter.kind), {filter.Amount()});
            break;
    }
    return record;
}

// Effects in the order in which they apply: filter, custom, blend. Each is released once the layer has taken
// it.
struct EffectList {
    const Effect* effects[3];
    uint32_t count = 0;

    void Add(Effect* effect) {
        if (effect != nullptr) effects[count++] = effect;
    }
    ~EffectList() {
        for (uint32_t i = 0; i < count; ++i)
            const_cast<Effect*>(effects[i])->Release();
    }
};

void CollectEffects(const LayoutNode& node, PaintContext& context, EffectList& list) {
    const VisualStyle& style = *node.style->visual;
    fresco::IEffectFactory& factory = *fresco::GetEffectFactory();
    if (!style.filter.empty()) {
        const TempMark mark;
        TempVector<FilterRecord> records;
        for (const css::FilterFunction& filter : style.filter)
            records.push_back(ToRecord(filter, node, context.lengths));
        list.Add(factory.CreateFilter(records.data(), records.size()));
    }
    if (!style.customEffectName.empty()) {
        const float params[4] = {style.customEffectFloatParam1.value, style.customEffectFloatParam2.value,
                                 style.customEffectFloatParam3.value, style.customEffectFloatParam4.value};
        list.Add(factory.CreateCustom(style.customEffectName.value.c_str(), params,
                                      style.customEffectStringParam1.value.c_str(),
                                      style.customEffectStringParam2.value.c_str()));
    }
    if (style.mixBlendMode != css::BlendModeType::Normal) {
        // The words of the property are in the library's order.
        list.Add(factory.CreateBlend(static_cast<uint32_t>(style.mixBlendMode)));
    }
}

void AnnotateLayer(const LayoutNode& node, PaintContext& context, CommandBuffer& buffer) {
    const VisualStyle& style = *node.style->visual;
    buffer.Annotate(fresco::kAnnotateBaseTransform, node.world.Get().m);
    if (!style.compositionId.empty()) {
        buffer.Annotate(fresco::kAnnotateCompositionId, style.compositionId.value.c_str());
        buffer.Annotate(fresco::kAnnotateWorldMatrix, node.world.Get().m);
        buffer.Annotate(fresco::kAnnotateAABB, &node.AsBox().aabb);
    }
    if (layout::Near(context.scaleX, 1) && layout::Near(context.scaleY, 1)) return;
    if (layout::Near(context.scaleX, 0) || layout::Near(context.scaleY, 0)) {
        AssertFailure("Rendering resolution cannot be near-zero!");
        return;
    }
    // The layer begins under the scaled transform already; the client only learns the scale.
    const float scale[2] = {context.scaleX, context.scaleY};
    buffer.Annotate(fresco::kAnnotateScale, scale);
}

}  // namespace

bool NeedsLayer(const LayoutNode& node) {
    const VisualStyle& style = *node.style->visual;
    return style.opacity.value < 1 || !style.filter.empty() ||
           // A mask erases what it is applied to, so it must never meet the parent's pixels.
           style.maskImage.kind > css::ImageKind::Initial ||
           style.mixBlendMode != css::BlendModeType::Normal ||
           style.isolation == css::IsolationType::Isolate || !style.compositionId.empty() ||
           !style.customEffectName.empty();
}

CommandBuffer* OpenLayer(const LayoutNode& node, PaintContext& context, CommandBuffer* buffer) {
    const fresco::LayerPaint paint = fresco::MakeLayerPaint(node.style->visual->opacity.value);
    EffectList effects;
    CollectEffects(node, context, effects);
    CommandBuffer* layer = effects.count == 0 ? buffer->BeginLayer(fresco::kLayerContent, paint)
                                              : buffer->BeginLayerWithEffects(fresco::kLayerContent, paint,
                                                                              effects.effects, effects.count);
    AnnotateLayer(node, context, *layer);
    return layer;
}

CommandBuffer* CloseLayer(const LayoutNode& node, CommandBuffer* buffer) {
    if (!node.style->visual->compositionId.empty())
        buffer->Annotate(fresco::kAnnotateEndComposition, nullptr);
    return buffer->EndLayerTransformed(nullptr);
}

}  // namespace qorvex::dsp
