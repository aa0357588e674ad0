#include "dom/dom_token_list.h"

#include "core/logging/log.h"
#include "dom/ascii.h"

namespace qorvex::dom {

namespace {
bool IsToken(std::string_view token) {
    const bool valid = !token.empty() && std::none_of(token.begin(), token.end(), IsAsciiSpace);
    if (!valid) LogWarning("Invalid class name: ", token);
    return valid;
}
}  // namespace

size_t DOMTokenList::GetLength() const {
    const Element* element = GetElement();
    return element ? element->GetClasses().size() : 0;
}

Atom DOMTokenList::GetItem(size_t index) const {
    return index < GetLength() ? GetElement()->GetClasses()[index] : Atom();
}

Atom DOMTokenList::GetValue() const {
    const Element* element = GetElement();
    return element ? element->GetClassName() : Atom();
}

void DOMTokenList::SetValue(std::string_view text) {
    if (Element* element = GetElement()) element->SetAttribute("class", text);
}

bool DOMTokenList::Contains(std::string_view token) const {
    const Element* element = GetElement();
    return element && element->HasClassNamed(token);
}

void DOMTokenList::Add(std::string_view token) {
    if (Element* element = GetElement(); IsToken(token) && element) element->AddClass(token);
}

void DOMTokenList::Remove(std::string_view token) {
    if (Element* element = GetElement(); IsToken(token) && element) element->RemoveClass(token);
}

// https://dom.spec.whatwg.org/#dom-domtokenlist-toggle
bool DOMTokenList::Toggle(std::string_view token, std::optional<bool> force) {
    Element* element = GetElement();
    if (!IsToken(token) || !element) return false;
    const bool add = force.value_or(!Contains(token));
    add ? element->AddClass(token) : element->RemoveClass(token);
    return add;
}

bool DOMTokenList::Replace(std::string_view old_token, std::string_view new_token) {
    Element* element = GetElement();
    if (!IsToken(old_token) || !IsToken(new_token) || !element) return false;
    return element->ReplaceClass(old_token, new_token);
}

bool DOMTokenList::Supports(std::string_view token) const {
    return IsToken(token);
}

}  // namespace qorvex::dom
