// Effect objects: immutable blobs in the form the stream wants.
#include <fresco/effects.h>

#include "fresco/commands/finite.h"
#include "fresco/commands/tails.h"
#include "fresco/core/heap.h"
#include "fresco/core/log.h"

namespace fresco {
namespace {

class EffectImpl final : public Effect {
  public:
    explicit EffectImpl(EffectKind kind) : kind_(kind) {}
    void AddRef() override { references_.fetch_add(1, std::memory_order_relaxed); }
    void Release() override {
        if (references_.fetch_sub(1, std::memory_order_acq_rel) == 1) HeapDelete(this);
    }
    EffectKind GetKind() const override { return kind_; }
    const void* GetData() const override { return data_.data(); }
    uint32_t GetDataSize() const override { return uint32_t(data_.size()); }

    void Append(const void* data, size_t size) {
        const auto* bytes = static_cast<const uint8_t*>(data);
        data_.insert(data_.end(), bytes, bytes + size);
    }
    void Pad() { data_.resize(Padded(uint32_t(data_.size()))); }

  private:
    Vector<uint8_t> data_;
    EffectKind kind_;
    std::atomic<uint32_t> references_{1};
};

// More than any page writes, few enough that a stream cannot grow without bound.
constexpr uint32_t kMaxListLength = 1024;

template <class Geometry, class Item>
Effect* MakeListEffect(EffectKind kind, const Geometry* geometry, const Item* items, uint32_t count) {
    bool valid = count <= kMaxListLength;
    if constexpr (!std::is_same_v<Geometry, uint32_t>) valid = valid && IsFinite(*geometry);
    for (uint32_t i = 0; valid && i < count; ++i)
        valid = IsFinite(items[i]);
    if (!valid) {
        FRESCO_WARN("Refusing an effect with invalid numbers (kind %u)", uint32_t(kind));
        return nullptr;
    }
    auto* effect = HeapNew<EffectImpl>(kind);
    if (!effect) return nullptr;
    if constexpr (!std::is_same_v<Geometry, uint32_t>) effect->Append(geometry, sizeof(Geometry));
    effect->Append(&count, sizeof(count));
    effect->Append(items, count * sizeof(Item));
    return effect;
}

class EffectFactory final : public IEffectFactory {
  public:
    Effect* CreateLinearGradient(const LinearGradient& geometry, const GradientStop* stops,
                                 uint32_t count) override {
        return MakeListEffect(EffectKind::LinearGradient, &geometry, stops, count);
    }
    Effect* CreateRadialGradient(const RadialGradient& geometry, const GradientStop* stops,
                                 uint32_t count) override {
        return MakeListEffect(EffectKind::RadialGradient, &geometry, stops, count);
    }
    Effect* CreatePattern(const PatternGeometry& geometry) override {
        if (!IsFinite(geometry)) return nullptr;
        auto* effect = HeapNew<EffectImpl>(EffectKind::Pattern);
        if (effect) effect->Append(&geometry, sizeof(geometry));
        return effect;
    }
    Effect* CreateFilter(const FilterRecord* filters, uint32_t count) override {
        return MakeListEffect<uint32_t>(EffectKind::Filter, nullptr, filters, count);
    }
    Effect* CreateBlend(uint32_t blend) override {
        auto* effect = HeapNew<EffectImpl>(EffectKind::Blend);
        if (effect) effect->Append(&blend, sizeof(blend));
        return effect;
    }
    Effect* CreateCustom(const char* name, const float params[4], const char* text1,
                         const char* text2) override {
        if (!AllFinite(params, 4)) return nullptr;
        auto* effect = HeapNew<EffectImpl>(EffectKind::Custom);
        if (!effect) return nullptr;
        const std::string_view texts[] = {name ? name : "", text1 ? text1 : "", text2 ? text2 : ""};
        effect->Append(params, 4 * sizeof(float));
        for (std::string_view text : texts) {
            const uint32_t length = uint32_t(std::min<size_t>(text.size(), 4096));
            effect->Append(&length, sizeof(length));
        }
        for (std::string_view text : texts) {
            effect->Append(text.data(), std::min<size_t>(text.size(), 4096));
            effect->Append("", 1);
        }
        effect->Pad();
        return effect;
    }
};

}  // namespace

IEffectFactory* GetEffectFactory() {
    static thread_local EffectFactory factory;
    return &factory;
}

}  // namespace fresco
