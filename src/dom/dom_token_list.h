// The class list of an element as script edits it. A view: the classes live in the element.
#pragma once

#include "dom/element.h"
#include "script/pooled_memory.h"

namespace qorvex::dom {

class DOMTokenList final : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(DOMTokenList)
  public:
    QORVEX_POOLED(DOMTokenList, 48)

    explicit DOMTokenList(Element& element) : element_(&element) {}

    size_t GetLength() const;
    // The empty atom when out of range.
    Atom GetItem(size_t index) const;
    Atom GetValue() const;
    void SetValue(std::string_view text);
    bool Contains(std::string_view token) const;
    // Each operation rejects an empty token and one with white space with a log line.
    void Add(std::string_view token);
    void Remove(std::string_view token);
    bool Toggle(std::string_view token, std::optional<bool> force = std::nullopt);
    bool Replace(std::string_view old_token, std::string_view new_token);
    // Classes are open: whatever could be one is supported.
    bool Supports(std::string_view token) const;

  private:
    Element* GetElement() const { return static_cast<Element*>(element_.get()); }

    script::WeakHandle<Node> element_;
};

}  // namespace qorvex::dom
