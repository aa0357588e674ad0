#include "css/style/style_sharing.h"

#include "dom/element.h"

namespace qorvex::css {
namespace {

std::array<const void*, 7> Addresses(const LayoutStyleRefs& style) {
    return {style.layout.get(),          style.visual.get(),    style.text.get(),
            style.transform.get(),       style.animation.get(), style.transition.get(),
            style.customProperties.get()};
}

uint64_t Mix(uint64_t hash, const void* pointer) {
    return (hash ^ reinterpret_cast<uintptr_t>(pointer)) * 0x9E3779B97F4A7C15ull + (hash >> 29);
}

bool SameSlots(const MatchState& a, const MatchState& b) {
    if (a.slots().size() != b.slots().size()) return false;
    for (uint32_t i = 0; i < a.slots().size(); ++i) {
        if (a.slots()[i].declaration != b.slots()[i].declaration) return false;
    }
    return true;
}

}  // namespace

StyleSharingTable::Key StyleSharingTable::MakeKey(const dom::Element& element, const LayoutStyleRefs& parent,
                                                  bool onlySiblings) {
    Key key{0, Addresses(element.GetStyle()), onlySiblings ? element.GetParent() : nullptr};
    uint64_t hash = Mix(Mix(1, parent.text.get()), parent.visual.get());
    for (const MatchState::Slot& slot : element.GetMatchState().slots())
        hash = Mix(hash, slot.declaration);
    key.hash = hash ^ (hash >> 32);
    return key;
}

const StyleSharingTable::Entry* StyleSharingTable::Find(const Key& key, const dom::Element& element,
                                                        const LayoutStyleRefs& parent) const {
    const Entry& entry = entries_[key.hash % kEntries];
    if (!entry.element || entry.run != run_ || !(entry.key == key)) return nullptr;
    if (!SameSlots(entry.element->GetMatchState(), element.GetMatchState())) return nullptr;
    const dom::Node* otherParent = entry.element->GetParent();
    return otherParent && otherParent->GetStyle().SameGroups(parent) ? &entry : nullptr;
}

}  // namespace qorvex::css
