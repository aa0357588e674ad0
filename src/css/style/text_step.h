// What it means to go from one text group to another. A change of an inherited value takes all who say
// nothing about text from the same old group to the same new one, so the last answers are kept: comparing two
// groups costs more than the rest of such an element.
#pragma once

#include "css/style/property_solver.h"
#include "css/values/layout_style_refs.h"
#include "css/values/property_set.h"

namespace qorvex::css {

class TextStep {
  public:
    struct Change {
        uint32_t mask = 0;        // dom::ChangeMask bits
        uint32_t properties = 0;  // how many are different
    };

    // Counted and told for the properties that an element looks at.
    Change OfElement(const StyleHandle<TextLayoutStyle>& from, const StyleHandle<TextLayoutStyle>& to,
                     const PropertySet& dirty);
    // Told for a text, which has no other glyphs or places for another colour.
    uint32_t MaskOfText(const StyleHandle<TextLayoutStyle>& from, const StyleHandle<TextLayoutStyle>& to);
    // May an element that says nothing about text hold this group of its parent as it is?
    bool IsInheritable(const StyleHandle<TextLayoutStyle>& parent);

    // Lets go of the groups. Nothing is known beyond a run.
    void Forget() { *this = TextStep(); }

  private:
    // The handles keep the groups from being freed, and so their addresses from naming others.
    struct Step {
        StyleHandle<TextLayoutStyle> from;
        StyleHandle<TextLayoutStyle> to;

        bool Is(const StyleHandle<TextLayoutStyle>& a, const StyleHandle<TextLayoutStyle>& b) const {
            return from == a && to == b;
        }
    };

    Step element_;
    PropertySet dirty_;
    Change change_;
    Step text_;
    uint32_t textMask_ = 0;
    StyleHandle<TextLayoutStyle> parent_;
    bool inheritable_ = false;
};

}  // namespace qorvex::css
