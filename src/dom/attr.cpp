#include "dom/attr.h"

#include "dom/document.h"
#include "dom/element.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

Attr::Attr(Document& document, std::string_view name, std::string_view value, Element* owner)
    : Node(document, kIsAttr), name_(name), value_(value), owner_(owner) {
    if (const size_t colon = name.find(':'); colon != std::string_view::npos) prefix_ = name.substr(0, colon);
}

Element* Attr::GetOwnerElement() const {
    return static_cast<Element*>(owner_.get());
}

void Attr::SetOwnerElement(Element& element) {
    owner_ = script::WeakHandle<Node>(&element);
}

std::string_view Attr::GetValue() const {
    NodeText room;
    if (const Element* owner = GetOwnerElement())
        if (const auto value = owner->GetAttributeText(name_, room)) value_ = *value;
    return value_;
}

void Attr::SetValue(std::string_view value) {
    value_ = NodeText(value);
    if (Element* owner = GetOwnerElement()) owner->SetAttribute(name_, value_);
}

Atom Attr::GetNodeName() const {
    return GetDocument()->Intern(name_);
}

void Attr::ToDebugString(NodeText& out) const {
    out.append("Attr [");
    out.append(name_);
    out.append("]");
}

RefPtr<Node> Attr::CloneNode(bool) {
    return script::MakeHandle<Attr>(*GetDocument(), name_, GetValue(), nullptr);
}

}  // namespace qorvex::dom
