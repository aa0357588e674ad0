// What a rule, an element's inline style or its extra style holds: declarations in the order of their first
// assignment, at most one per property, and custom properties.
#pragma once

#include "css/values/declaration.h"

namespace qorvex::css {

struct NamedValue {
    std::string_view name;
    CssString value;
    bool important = false;
};

class StyleDeclarationSet {
  public:
    // True if anything changed: assigning an equal declaration again is no change.
    bool Set(Declaration declaration);
    bool Remove(PropertyId id);
    void SetCustomProperty(Atom name, CustomPropertyPtr record);
    bool RemoveCustomProperty(Atom name);
    void Clear();

    const Declaration* Find(PropertyId id) const;
    bool empty() const { return declarations_.empty() && customProperties_.empty(); }
    const CssVector<Declaration>& declarations() const { return declarations_; }
    const CustomPropertyMap& customProperties() const { return customProperties_; }

    // "name: value !important; " for each declaration, then the custom properties.
    void AppendText(CssString& out) const;
    CssString ToText() const;
    // One entry per declaration.
    CssVector<NamedValue> ToNameValueList() const;

  private:
    CssVector<Declaration> declarations_;
    CustomPropertyMap customProperties_;
};

}  // namespace qorvex::css
