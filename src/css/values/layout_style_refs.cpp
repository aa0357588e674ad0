#include "css/values/layout_style_refs.h"

#include "core/logging/log.h"

namespace qorvex::css {

LayoutStyleRefs::LayoutStyleRefs(const LayoutStyleRefs& other)
    : LaidOutStyle(other),
      animation(other.animation),
      transition(other.transition),
      customProperties(other.customProperties) {}

LayoutStyleRefs& LayoutStyleRefs::operator=(const LayoutStyleRefs& other) {
    if (this == &other) return *this;
    LaidOutStyle::operator=(other);
    animation = other.animation;
    transition = other.transition;
    customProperties = other.customProperties;
    return *this;
}

const void* LayoutStyleRefs::Field(PropertyId id) const {
    switch (id) {
#define QORVEX_ROW(id, ...) \
    case PropertyId::id:    \
        return &Get<PropertyId::id>();
        QORVEX_CSS_LONGHANDS(QORVEX_ROW)
#undef QORVEX_ROW
        default:
            return nullptr;
    }
}

RareStyle& LayoutStyleRefs::EnsureRare() {
    if (!rare) rare = MakeUnique<RareStyle, MemoryTag::CSS>();
    return *rare;
}

bool LayoutStyleRefs::SameGroups(const LayoutStyleRefs& other) const {
    return layout == other.layout && visual == other.visual && text == other.text &&
           transform == other.transform && animation == other.animation && transition == other.transition &&
           customProperties == other.customProperties;
}

const Declaration* RareStyle::FindEvaluated(PropertyId id) const {
    for (const Declaration& declaration : evaluated)
        if (declaration.property() == id) return &declaration;
    return nullptr;
}

Declaration& RareStyle::StoreEvaluated(Declaration declaration) {
    for (Declaration& existing : evaluated)
        if (existing.property() == declaration.property()) return existing = std::move(declaration);
    return evaluated.emplace_back(std::move(declaration));
}

namespace {

// Raw storage, so that no destructor runs after the allocator is gone.
alignas(LayoutStyleRefs) unsigned char g_defaultRoom[sizeof(LayoutStyleRefs)];
LayoutStyleRefs* g_default = nullptr;

}  // namespace

void CreateDefaultStyles() {
    if (g_default) {
        AssertFailure("Default styles are created twice!");
        return;
    }
    g_default = new (g_defaultRoom) LayoutStyleRefs();
    g_default->layout = StyleHandle(MakeRef<LayoutStyle>());
    g_default->visual = StyleHandle(MakeRef<VisualStyle>());
    g_default->text = StyleHandle(MakeRef<TextLayoutStyle>());
    g_default->transform = StyleHandle(MakeRef<TransformStyle>());
    g_default->animation = StyleHandle(MakeRef<AnimationStyle>());
    g_default->transition = StyleHandle(MakeRef<TransitionStyle>());
}

void DestroyDefaultStyles() {
    if (!g_default) return;
    g_default->~LayoutStyleRefs();
    g_default = nullptr;
}

const LayoutStyleRefs& DefaultStyles() {
    return *g_default;
}

}  // namespace qorvex::css
