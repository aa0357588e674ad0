// The HTML layer, and the elements that have attributes of their own already.
#include "dom/document.h"
#include "dom/dom_string_map.h"
#include "dom/html_element.h"
#include "dom/html_link_element.h"
#include "dom/html_script_element.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/reflected_attributes.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

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
