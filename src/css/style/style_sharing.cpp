#include "css/style/style_sharing.h"

#include <algorithm>

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

}  // namespace

StyleSharingTable::Key StyleSharingTable::MakeKey(const dom::Element& element, const LayoutStyleRefs& parent,
                                                  bool onlySiblings) {
    Key key{0, Addresses(element.GetStyle()), onlySiblings ? element.GetParent() : nullptr};
    uint64_t hash = Mix(Mix(1, parent.text.get()), parent.visual.get());
    hash = Mix(hash, element.GetMatchState());
    key.hash = hash ^ (hash >> 32);
    return key;
}

const StyleSharingTable::Entry* StyleSharingTable::Find(const Key& key, const dom::Element& element,
                                                        const LayoutStyleRefs& parent) const {
    if (entries_.empty()) return nullptr;
    const uint32_t first = FirstOfSet(key.hash);
    for (uint32_t i = first; i < first + kWays; ++i) {
        const Entry& entry = entries_[i];
        if (entry.run != run_ || !(entry.key == key)) continue;
        if (entry.element->GetMatchState() != element.GetMatchState()) continue;
        const auto* otherParent = static_cast<const dom::Element*>(entry.element->GetParent());
        if (otherParent && otherParent->GetStyle().SameGroups(parent)) return &entry;
    }
    return nullptr;
}

void StyleSharingTable::Insert(const Key& key, dom::Element& element, uint32_t changeMask) {
    if (entries_.empty()) entries_.resize(kFirstEntries);
    if (++used_ * 2 > entries_.size() && entries_.size() < kLastEntries) {
        CssVector<Entry> old = std::move(entries_);
        entries_.resize(old.size() * 2);
        for (const Entry& entry : old) {
            if (entry.run == run_) Place(entry);
        }
    }
    Place({&element, key, changeMask, run_});
}

void StyleSharingTable::Place(const Entry& entry) {
    Entry* set = &entries_[FirstOfSet(entry.key.hash)];
    // The one that has stood there longest goes, one of an earlier run before all others.
    uint32_t place = 0;
    while (place < kWays - 1 && set[place].run == run_)
        ++place;
    std::move_backward(set, set + place, set + place + 1);
    set[0] = entry;
}

}  // namespace qorvex::css
