#include "dom/node_list.h"

#include "dom/attr.h"
#include "dom/element.h"

namespace qorvex::dom {

size_t NodeListLive::GetLength() const {
    const Node* parent = parent_.get();
    return parent ? parent->GetChildCount() : 0;
}

Node* NodeListLive::GetItem(size_t index) const {
    const Node* parent = parent_.get();
    return parent && index < parent->GetChildCount() ? parent->GetChildren()[index].get() : nullptr;
}

Element* HTMLCollection::GetElement(size_t index) const {
    return static_cast<Element*>(GetItem(index));
}

Element* HTMLCollection::GetNamedItem(std::string_view name) const {
    if (name.empty()) return nullptr;
    for (size_t i = 0; i < GetLength(); ++i) {
        Element* element = GetElement(i);
        if (element->GetId().view() == name || element->GetAttribute("name").value_or(Atom()).view() == name)
            return element;
    }
    return nullptr;
}

NamedNodeMap::NamedNodeMap() = default;
NamedNodeMap::~NamedNodeMap() = default;

void NamedNodeMap::Add(qsl::RefPtr<Attr> attribute) {
    attributes_.push_back(std::move(attribute));
}

}  // namespace qorvex::dom
