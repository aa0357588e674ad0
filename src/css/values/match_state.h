// The winning declarations of one element, filled by selector matching and read by style solving.
// Declarations are borrowed from rules and from the element's own sets: the owner of a rule re-matches before
// it dies.
#pragma once

#include <array>
#include <cstdint>

#include "css/values/declaration.h"

namespace qorvex::css {

class MatchState {
  public:
    static constexpr uint8_t kNoSlot = 255;

    struct Slot {
        const Declaration* declaration = nullptr;
        uint8_t flags = 0;  // DeclarationFlags of the declaration
        PropertyId property = PropertyId::kUnknown;
    };

    MatchState() { slotOfProperty_.fill(kNoSlot); }

    // Costs one step per slot, not per property.
    void Reset() {
        for (const Slot& slot : slots_)
            slotOfProperty_[IndexOf(slot.property)] = kNoSlot;
        slots_.clear();
        customProperties_.clear();
    }

    const Slot* Find(PropertyId id) const {
        uint8_t slot = slotOfProperty_[IndexOf(id)];
        return slot == kNoSlot ? nullptr : &slots_[slot];
    }
    void Store(const Declaration& declaration) {
        PropertyId id = declaration.property();
        uint8_t& index = slotOfProperty_[IndexOf(id)];
        if (index == kNoSlot) {
            index = static_cast<uint8_t>(slots_.size());
            slots_.emplace_back();
        }
        slots_[index] = {&declaration, declaration.flags(), id};
    }
    const CssSmallVector<Slot, 2>& slots() const { return slots_; }

    CustomPropertyMap& customProperties() { return customProperties_; }
    const CustomPropertyMap& customProperties() const { return customProperties_; }

  private:
    std::array<uint8_t, kLonghandCount> slotOfProperty_;
    CssSmallVector<Slot, 2> slots_;
    CustomPropertyMap customProperties_;
};

}  // namespace qorvex::css
