// The HTML layer, and the elements that have attributes of their own already.
#include "dom/document.h"
#include "dom/dom_string_map.h"
#include "dom/html_element.h"
#include "dom/html_link_element.h"
#include "dom/html_script_element.h"
#include "script/bindings/bound_classes.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::Element;
using dom::HTMLElement;
using Bind = Binding<HTMLElement>;

constexpr AttributeDescription kAttributes[] = {
    Bind::ReadOnly<&HTMLElement::GetDatasetMap>("dataset"),
    Bind::ReadOnly<&HTMLElement::GetOffsetParent>("offsetParent"),
    Bind::ReadOnly<&HTMLElement::GetOffsetTop>("offsetTop"),
    Bind::ReadOnly<&HTMLElement::GetOffsetLeft>("offsetLeft"),
    Bind::ReadOnly<&HTMLElement::GetOffsetWidth>("offsetWidth"),
    Bind::ReadOnly<&HTMLElement::GetOffsetHeight>("offsetHeight"),
};

// https://html.spec.whatwg.org/#reflecting-content-attributes-in-idl-attributes
template <FixedString kName>
Atom GetReflected(Element& element) {
    return element.GetAttribute(kName.text).value_or(Atom());
}
template <FixedString kName>
void SetReflected(Element& element, std::string_view value) {
    element.SetAttribute(kName.text, value);
}
template <FixedString kName>
bool GetReflectedFlag(Element& element) {
    return element.HasAttribute(kName.text);
}
template <FixedString kName>
void SetReflectedFlag(Element& element, bool value) {
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

constexpr AttributeDescription kLinkAttributes[] = {
    Reflected<dom::HTMLLinkElement, "href">(),
    Reflected<dom::HTMLLinkElement, "rel">(),
    Reflected<dom::HTMLLinkElement, "type">(),
};

constexpr AttributeDescription kScriptAttributes[] = {
    ReflectedFlag<dom::HTMLScriptElement, "async">(),
    ReflectedFlag<dom::HTMLScriptElement, "defer">(),
    Reflected<dom::HTMLScriptElement, "src">(),
    Binding<dom::HTMLScriptElement>::ReadWrite<&dom::Node::GetTextContent, &dom::Node::SetTextContent>(
        "text"),
    Reflected<dom::HTMLScriptElement, "type">(),
};

}  // namespace

const ClassDescription kHTMLElementClass = {.script_class = ScriptClass::HTMLElement,
                                            .attributes = kAttributes};
const ClassDescription kHTMLLinkElementClass = {.script_class = ScriptClass::HTMLLinkElement,
                                                .attributes = kLinkAttributes};
const ClassDescription kHTMLScriptElementClass = {.script_class = ScriptClass::HTMLScriptElement,
                                                  .attributes = kScriptAttributes};

}  // namespace qorvex::script
