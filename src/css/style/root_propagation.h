// The background and overflow of html and body belong to the canvas and the viewport (CSS
// Backgrounds, 2.11.2; CSS Overflow, 3.3): body's move up to html where html has none of its own.
//
// Invariant: what the cascade gives these elements is kept here, and their style groups hold the result of
// the propagation, so solving either of them again, alone or with the whole tree, ends in the same styles.
#pragma once

#include "css/style/property_solver.h"
#include "css/values/property_set.h"

namespace qorvex::dom {
class Document;
class Element;
}  // namespace qorvex::dom

namespace qorvex::css {

// Properties of html and body that are not stored by the ordinary way.
inline constexpr PropertySet kPropagatedProperties = [] {
    PropertySet set;
    set.Add(PropertyId::BackgroundColor);
    set.Add(PropertyId::OverflowX);
    set.Add(PropertyId::OverflowY);
    return set;
}();

class RootStyles {
  public:
    struct Cascaded {
        Color background = Color::Transparent();
        bool hasBackground = false;  // it came from a declaration
        CSSOverflow overflowX = CSSOverflow::Visible;
        CSSOverflow overflowY = CSSOverflow::Visible;
    };

    // Takes what the cascade gives html or body now.
    void Record(bool isHtml, PropertySolver& solver);
    // For heirs of html or body that ask for one of the propagated properties; null for any other property.
    const void* Find(bool isHtml, PropertyId id) const;
    bool IsPending() const { return pending_; }
    // Stores the results and files the changes.
    void Propagate(dom::Document& document);

  private:
    Cascaded html_;
    Cascaded body_;
    bool pending_ = false;
};

}  // namespace qorvex::css
