// The dataset of an element as script edits it, with camelCase names. A view: the entries live in the
// element.
#pragma once

#include "dom/element.h"

namespace qorvex::dom {

class DOMStringMap final : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(DOMStringMap)
  public:
    explicit DOMStringMap(Element& element) : element_(&element) {}

    size_t GetLength() const;
    // In the order of the element's entries.
    NodeText GetKey(size_t index) const;
    std::optional<Atom> Get(std::string_view key) const;
    // False for a key that no data- attribute can have.
    bool Set(std::string_view key, std::string_view value);
    bool Delete(std::string_view key);

  private:
    Element* GetElement() const { return static_cast<Element*>(element_.get()); }

    script::WeakHandle<Node> element_;
};

// https://html.spec.whatwg.org/#dom-domstringmap: false for a key with "-" before a lower-case letter and for
// one with white space or another character that no attribute name has.
bool DatasetKeyToAttribute(std::string_view key, NodeText& name);
NodeText AttributeToDatasetKey(std::string_view name);

}  // namespace qorvex::dom
