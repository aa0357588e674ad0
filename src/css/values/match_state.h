// The winning declarations of an element, filled by selector matching and read by style solving. Elements
// that the same rules match share one state; it changes no more once it is filled.
//
// Declarations are borrowed from rules and from the element's own sets: the owner of a rule re-matches before
// it dies.
#pragma once

#include <cstdint>
#include <span>

#include "css/values/declaration.h"
#include "css/values/property_set.h"

namespace qorvex::css {

// Counted without atomics: matching and solving have one thread.
class MatchState : public RefCounted<MatchState, MemoryTag::CSS> {
  public:
    // Null when nothing was declared for the property.
    const Declaration* Find(PropertyId id) const {
        return properties_.Contains(id) ? slots_[properties_.CountBelow(id)] : nullptr;
    }
    // Which properties have a declaration, and which of these are computed from what stands around them.
    const PropertySet& properties() const { return properties_; }
    const PropertySet& inheriting() const { return inheriting_; }
    const PropertySet& expressions() const { return expressions_; }
    // Declared by the element's own sets, which may change without any rule changing.
    const PropertySet& own() const { return own_; }
    const CustomPropertyMap& customProperties() const { return customProperties_; }

    // --- Filling
    void Clear();
    void FillCustomProperties(const CustomPropertyMap& map) { customProperties_ = map; }
    // `winners` is indexed by property and read where `properties` has a member.
    void Fill(const PropertySet& properties, const PropertySet& own, const Declaration* const* winners);

    // The properties whose declaration is not the same in both; all when a custom property differs, since any
    // property may depend on it.
    static PropertySet Difference(const MatchState& a, const MatchState& b);

  private:
    PropertySet properties_;
    PropertySet inheriting_;
    PropertySet expressions_;
    PropertySet own_;
    CssVector<const Declaration*> slots_;  // in the order of `properties_`
    CustomPropertyMap customProperties_;
};

using MatchStatePtr = RefPtr<const MatchState>;

}  // namespace qorvex::css
