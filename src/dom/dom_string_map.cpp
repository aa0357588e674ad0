#include "dom/dom_string_map.h"

#include "core/logging/log.h"
#include "dom/ascii.h"

namespace qorvex::dom {

bool DatasetKeyToAttribute(std::string_view key, NodeText& name) {
    name.clear();
    for (size_t i = 0; i < key.size(); ++i) {
        const char c = key[i];
        if (c == '-' && i + 1 < key.size() && IsAsciiLower(key[i + 1])) return false;
        if (IsAsciiSpace(c) || c == '\0' || c == '"' || c == '\'' || c == '>' || c == '/' || c == '=')
            return false;
        if (IsAsciiUpper(c)) name.push_back('-');
        name.push_back(ToAsciiLower(c));
    }
    return true;
}

NodeText AttributeToDatasetKey(std::string_view name) {
    NodeText key;
    for (size_t i = 0; i < name.size(); ++i) {
        if (name[i] == '-' && i + 1 < name.size() && IsAsciiLower(name[i + 1])) {
            key.push_back(ToAsciiUpper(name[++i]));
        } else {
            key.push_back(name[i]);
        }
    }
    return key;
}

size_t DOMStringMap::GetLength() const {
    const Element* element = GetElement();
    return element ? element->GetDataset().size() : 0;
}

NodeText DOMStringMap::GetKey(size_t index) const {
    return index < GetLength() ? AttributeToDatasetKey(GetElement()->GetDataset()[index].name.view())
                               : NodeText();
}

std::optional<Atom> DOMStringMap::Get(std::string_view key) const {
    const Element* element = GetElement();
    NodeText name;
    if (!element || !DatasetKeyToAttribute(key, name)) return std::nullopt;
    for (const AttributePair& entry : element->GetDataset())
        if (entry.name.view() == name.view()) return entry.value;
    return std::nullopt;
}

bool DOMStringMap::Set(std::string_view key, std::string_view value) {
    Element* element = GetElement();
    NodeText name;
    if (!DatasetKeyToAttribute(key, name)) {
        LogWarning("Invalid dataset name: ", key);
        return false;
    }
    if (element) element->SetDataAttribute(name, value);
    return element != nullptr;
}

bool DOMStringMap::Delete(std::string_view key) {
    Element* element = GetElement();
    NodeText name;
    return element && DatasetKeyToAttribute(key, name) && element->RemoveDataAttribute(name);
}

}  // namespace qorvex::dom
