// Elements whose winning declarations are the same, below parents with the same style, have the same computed
// style. The table finds such an element among those solved in this run, and the new one takes its groups: a
// list of a thousand equal rows costs one cascade and the memory of one style.
//
// Invariants, on which sharing is sound:
// - an entry is good for one run: declarations, parents and pseudo states do not change inside it;
// - one match state means equal values, since evaluating a declaration depends on nothing but the parent's
//   style, the root's style and the custom properties in force, which are compared by handle;
// - the two elements had the same style before, so that they changed in the same way: a change mask is shared
//   too. Handles seen before are compared as bare addresses. None can have been reused: the second element
//   has held the group since before the run.
#pragma once

#include <array>
#include <cstdint>

#include "css/values/css_containers.h"
#include "css/values/layout_style_refs.h"

namespace qorvex::dom {
class Element;
}

namespace qorvex::css {

class StyleSharingTable {
  public:
    // What identifies a style before it is solved.
    struct Key {
        uint64_t hash = 0;
        std::array<const void*, 7> before = {};
        // Set below html and body, whose groups do not tell all that their children may inherit.
        const void* onlyBelow = nullptr;
        friend bool operator==(const Key&, const Key&) = default;
    };
    struct Entry {
        dom::Element* element = nullptr;
        Key key;
        uint32_t changeMask = 0;
        uint32_t run = 0;
    };

    void BeginRun() { ++run_, used_ = 0; }

    static Key MakeKey(const dom::Element& element, const LayoutStyleRefs& parent, bool onlySiblings);
    // An element solved before in this run whose style this one may take; null if there is none.
    const Entry* Find(const Key& key, const dom::Element& element, const LayoutStyleRefs& parent) const;
    void Insert(const Key& key, dom::Element& element, uint32_t changeMask);

  private:
    void Place(const Entry& entry);
    // A style stands in one of the places of its set; the last comer takes the first. Pages have a few
    // hundred distinct styles, and a lost entry costs one more cascade. The table grows with what it is asked
    // for, so that a small page has a small one.
    static constexpr uint32_t kWays = 4, kFirstEntries = 32, kLastEntries = 1024;
    uint32_t FirstOfSet(uint64_t hash) const {
        return static_cast<uint32_t>(hash) & (entries_.size() - 1) & ~(kWays - 1);
    }

    CssVector<Entry> entries_;
    uint32_t used_ = 0;  // entries of this run
    uint32_t run_ = 0;
};

}  // namespace qorvex::css
