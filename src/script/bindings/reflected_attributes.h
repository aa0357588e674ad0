// Script attributes that stand for content attributes of the same name.
// https://html.spec.whatwg.org/#reflecting-content-attributes-in-idl-attributes
#pragma once

#include "dom/element.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

template <FixedString kName>
Atom GetReflected(dom::Element& element) {
    return element.GetAttribute(kName.text).value_or(Atom());
}
template <FixedString kName>
void SetReflected(dom::Element& element, std::string_view value) {
    element.SetAttribute(kName.text, value);
}
template <FixedString kName>
bool GetReflectedFlag(dom::Element& element) {
    return element.HasAttribute(kName.text);
}
template <FixedString kName>
void SetReflectedFlag(dom::Element& element, bool value) {
    if (value) {
        element.SetAttribute(kName.text, "");
    } else {
        element.RemoveAttribute(kName.text);
    }
}

template <class T, FixedString kName>
constexpr AttributeDescription Reflected() {
    return Binding<T>::template ReadWrite<&GetReflected<kName>, &SetReflected<kName>>(kText<kName>.text);
}
template <class T, FixedString kName>
constexpr AttributeDescription ReflectedFlag() {
    return Binding<T>::template ReadWrite<&GetReflectedFlag<kName>, &SetReflectedFlag<kName>>(
        kText<kName>.text);
}

}  // namespace qorvex::script
