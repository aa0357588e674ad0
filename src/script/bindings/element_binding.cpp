#include "dom/element.h"

#include "dom/attr.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/dom_rect.h"
#include "dom/dom_token_list.h"
#include "dom/node_list.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/event_handler_attribute.h"
#include "script/bindings/style_declaration.h"
#include "script/bindings/unavailable.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::Element;
using dom::Node;
using qsl::RefPtr;
using Bind = Binding<Element>;

// --- Names. Elements of the HTML path have no namespace.

std::optional<std::string_view> GetNothing(Element&) {
    return std::nullopt;
}

dom::NodeText GetLocalName(Element& element) {
    dom::NodeText name(element.GetMarkupName().view());
    for (size_t i = 0; i < name.size(); ++i) {
        char& c = name.data()[i];
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c + ('a' - 'A'));
    }
    return name;
}

// --- Attributes that mirror an attribute of the page

void SetId(Element& element, std::string_view value) {
    element.SetAttribute("id", value);
}
void SetClassName(Element& element, std::string_view value) {
    element.SetAttribute("class", value);
}
Atom GetSlot(Element& element) {
    return element.GetAttribute("slot").value_or(Atom());
}
void SetSlot(Element& element, std::string_view value) {
    element.SetAttribute("slot", value);
}

// Reading is not possible: the engine has no serialiser.
std::string_view GetInnerHTML(Element&) {
    return "";
}

JSValueRef GetStyle(Element& element, ScriptCall& call) {
    return MakeStyleDeclaration(call.context, element, StyleForm::Inline);
}
void SetStyle(Element& element, std::string_view text) {
    element.SetAttribute("style", text);
}

// --- Scrolling, in pixels and in hundredths of the view

enum class ViewAxis { Width, Height };

template <ViewAxis kAxis>
float ViewUnit(Element& element) {
    const dom::HostSize size = element.GetDocument()->GetHost().GetViewSize();
    return static_cast<float>(kAxis == ViewAxis::Width ? size.width : size.height) / 100;
}

template <auto kGet, ViewAxis kAxis>
float InViewUnits(Element& element) {
    const float unit = ViewUnit<kAxis>(element);
    return unit > 0 ? (element.*kGet)() / unit : 0;
}

template <auto kSet, ViewAxis kAxis>
void SetInViewUnits(Element& element, float value) {
    (element.*kSet)(value * ViewUnit<kAxis>(element));
}

template <auto kGet, auto kSet, ViewAxis kAxis>
constexpr AttributeDescription ScrollInViewUnits(const char* name) {
    return Bind::ReadWrite<&InViewUnits<kGet, kAxis>, &SetInViewUnits<kSet, kAxis>>(name);
}

// --- Reading attributes, also with a namespace, which is not looked at

JSValueRef GetAttribute(Element& element, ScriptCall& call, std::string_view name) {
    dom::NodeText room;
    return ToScript(call.context, element.GetAttributeText(name, room));
}
JSValueRef GetAttributeNS(Element& element, ScriptCall& call, JSValueRef, std::string_view name) {
    return GetAttribute(element, call, name);
}
RefPtr<dom::Attr> GetAttributeNodeNS(Element& element, JSValueRef, std::string_view name) {
    return element.GetAttributeNode(name);
}
bool HasAttributeNS(Element& element, JSValueRef, std::string_view name) {
    return element.HasAttribute(name);
}
void RemoveAttributeNS(Element& element, JSValueRef, std::string_view name) {
    element.RemoveAttribute(name);
}
void SetAttributeNS(Element& element, JSValueRef, std::string_view name, std::string_view value) {
    element.SetAttribute(name, value);
}
RefPtr<dom::HTMLCollection> GetElementsByTagNameNS(Element& element, JSValueRef, std::string_view name) {
    return element.GetElementsByTagName(name);
}

RefPtr<dom::Attr> SetAttributeNode(Element& element, dom::Attr* attribute) {
    return attribute ? element.SetAttributeNode(*attribute) : nullptr;
}
RefPtr<dom::Attr> RemoveAttributeNode(Element& element, dom::Attr* attribute) {
    return attribute ? element.RemoveAttributeNode(*attribute) : nullptr;
}

JSValueRef GetAttributeNames(Element& element, ScriptCall& call) {
    const JSObjectRef names = JSObjectMakeArray(call.context, 0, nullptr, nullptr);
    unsigned index = 0;
    element.ForEachAttribute([&](std::string_view name, std::string_view) {
        JSObjectSetPropertyAtIndex(call.context, names, index++, ToScript(call.context, name), nullptr);
        return true;
    });
    return names;
}

constexpr AttributeDescription kAttributes[] = {
    Bind::ReadOnly<&Node::GetNodeName>("tagName"),
    Bind::ReadOnly<&GetNothing>("prefix"),
    Bind::ReadOnly<&GetNothing>("namespaceURI"),
    Bind::ReadOnly<&GetLocalName>("localName"),
    Bind::ReadOnly<&Element::GetAttributes>("attributes"),
    Bind::ReadOnly<&Element::GetChildElements>("children"),
    Bind::ReadOnly<&Element::GetFirstElementChild>("firstElementChild"),
    Bind::ReadOnly<&Element::GetLastElementChild>("lastElementChild"),
    Bind::ReadOnly<&Node::GetPreviousElementSibling>("previousElementSibling"),
    Bind::ReadOnly<&Node::GetNextElementSibling>("nextElementSibling"),
    Bind::ReadOnly<&Element::GetChildElementCount>("childElementCount"),
    Bind::ReadOnly<&Node::GetScrollWidth>("scrollWidth"),
    Bind::ReadOnly<&InViewUnits<&Node::GetScrollWidth, ViewAxis::Width>>("scrollWidthVW"),
    Bind::ReadOnly<&InViewUnits<&Node::GetScrollWidth, ViewAxis::Height>>("scrollWidthVH"),
    Bind::ReadOnly<&Node::GetScrollHeight>("scrollHeight"),
    Bind::ReadOnly<&InViewUnits<&Node::GetScrollHeight, ViewAxis::Width>>("scrollHeightVW"),
    Bind::ReadOnly<&InViewUnits<&Node::GetScrollHeight, ViewAxis::Height>>("scrollHeightVH"),
    Bind::ReadOnly<&Element::GetClassList>("classList"),
    Bind::ReadWrite<&GetSlot, &SetSlot>("slot"),
    Bind::ReadWrite<&GetStyle, &SetStyle>("style"),
    Bind::ReadWrite<&Element::GetId, &SetId>("id"),
    Bind::ReadWrite<&Node::GetScrollLeft, &Node::SetScrollLeft>("scrollLeft"),
    ScrollInViewUnits<&Node::GetScrollLeft, &Node::SetScrollLeft, ViewAxis::Width>("scrollLeftVW"),
    ScrollInViewUnits<&Node::GetScrollLeft, &Node::SetScrollLeft, ViewAxis::Height>("scrollLeftVH"),
    Bind::ReadWrite<&Node::GetScrollTop, &Node::SetScrollTop>("scrollTop"),
    ScrollInViewUnits<&Node::GetScrollTop, &Node::SetScrollTop, ViewAxis::Width>("scrollTopVW"),
    ScrollInViewUnits<&Node::GetScrollTop, &Node::SetScrollTop, ViewAxis::Height>("scrollTopVH"),
    Bind::ReadWrite<&Element::GetClassName, &SetClassName>("className"),
    Bind::ReadWrite<&GetInnerHTML, &Element::SetInnerHTML>("innerHTML"),
    EventHandler<"focusin">(),
    EventHandler<"focusout">(),
    EventHandler<"change">(),
    EventHandler<"animationend">(),
    EventHandler<"transitionend">(),
};

constexpr MethodDescription kMethods[] = {
    Bind::Method<"blur", &Element::Blur>(),
    Bind::Method<"closest", &Element::Closest, 1>(),
    Bind::Method<"focus", &Element::Focus>(),
    Bind::Method<"getAnimations", &NotAvailable<Element, "Element::GetAnimations">>(),
    Bind::Method<"getAttribute", &GetAttribute, 1>(),
    Bind::Method<"getAttributeNS", &GetAttributeNS, 2>(),
    Bind::Method<"getAttributeNames", &GetAttributeNames>(),
    Bind::Method<"getAttributeNode", &Element::GetAttributeNode, 1>(),
    Bind::Method<"getAttributeNodeNS", &GetAttributeNodeNS, 2>(),
    Bind::Method<"getBackgroundSVGAnimation", &NotAvailable<Element, "Element::GetBackgroundSVGAnimation">>(),
    Bind::Method<"getBorderSVGAnimation", &NotAvailable<Element, "Element::GetBorderSVGAnimation">>(),
    Bind::Method<"getBoundingClientRect", &Element::GetBoundingClientRect>(),
    Bind::Method<"getElementsByClassName", &Element::GetElementsByClassName, 1>(),
    Bind::Method<"getElementsByTagName", &Element::GetElementsByTagName, 1>(),
    Bind::Method<"getElementsByTagNameNS", &GetElementsByTagNameNS, 2>(),
    Bind::Method<"getMaskSVGAnimation", &NotAvailable<Element, "Element::GetMaskSVGAnimation">>(),
    Bind::Method<"hasAttribute", &Element::HasAttribute, 1>(),
    Bind::Method<"hasAttributeNS", &HasAttributeNS, 2>(),
    Bind::Method<"hasAttributes", &Element::HasAttributes>(),
    Bind::Method<"insertAdjacentElement", &Element::InsertAdjacentElement, 2>(),
    Bind::Method<"insertAdjacentHTML", &Element::InsertAdjacentHTML, 2>(),
    Bind::Method<"insertAdjacentText", &Element::InsertAdjacentText, 2>(),
    Bind::Method<"matches", &Element::Matches, 1>(),
    Bind::Method<"querySelector", &Element::QuerySelector, 1>(),
    Bind::Method<"querySelectorAll", &Element::QuerySelectorAll, 1>(),
    Bind::Method<"removeAttribute", &Element::RemoveAttribute, 1>(),
    Bind::Method<"removeAttributeNS", &RemoveAttributeNS, 2>(),
    Bind::Method<"removeAttributeNode", &RemoveAttributeNode, 1>(),
    Bind::Method<"setAttribute", &Element::SetAttribute, 2>(),
    Bind::Method<"setAttributeNS", &SetAttributeNS, 3>(),
    Bind::Method<"setAttributeNode", &SetAttributeNode, 1>(),
    Bind::Method<"setAttributeNodeNS", &SetAttributeNode, 1>(),
};

}  // namespace

const ClassDescription kElementClass = {.script_class = ScriptClass::Element,
                                        .attributes = kAttributes,
                                        .shared_attributes = kCommonEventHandlers,
                                        .methods = kMethods};

}  // namespace qorvex::script
