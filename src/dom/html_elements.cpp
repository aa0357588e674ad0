#include "dom/html_elements.h"

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "display/display_paragraph.h"
#include "display/page_elements.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/event.h"

namespace qorvex::dom {

HTMLHtmlElement::HTMLHtmlElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {
    document.SetHtmlElement(*this);
}
HTMLHtmlElement::~HTMLHtmlElement() {
    GetDocument()->ForgetLandmark(*this);
}

layout::HandlePtr HTMLHtmlElement::CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) {
    if (!GetLayoutHandle()) AssertFailure("Missing HTML Layout node!");
    return layout::HandlePtr(GetLayoutHandle());
}

dsp::DisplayElementPtr HTMLHtmlElement::CreateDisplayElement() {
    return MakeRef<dsp::DisplayHTML>();
}

HTMLHeadElement::HTMLHeadElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {
    document.SetHeadElement(*this);
}
HTMLHeadElement::~HTMLHeadElement() {
    GetDocument()->ForgetLandmark(*this);
}

HTMLBodyElement::HTMLBodyElement(Document& document, css::TagId tag) : HTMLElement(document, tag) {
    document.SetBodyElement(*this);
}
HTMLBodyElement::~HTMLBodyElement() {
    GetDocument()->ForgetLandmark(*this);
}

dsp::DisplayElementPtr HTMLBodyElement::CreateDisplayElement() {
    return MakeRef<dsp::DisplayBody>();
}

namespace {
constexpr std::string_view kInlineAttribute = "qor-inline";
}

dsp::DisplayElementPtr HTMLParagraphElement::CreateDisplayElement() {
    if (HasAttribute(kInlineAttribute)) return MakeRef<dsp::DisplayParagraph>();
    return HTMLElement::CreateDisplayElement();
}

void HTMLParagraphElement::AttributeChanged(AttributeName name, std::optional<Atom> old_value,
                                            std::optional<Atom> new_value) {
    HTMLElement::AttributeChanged(name, old_value, new_value);
    if (name.is_data || name.name.view() != kInlineAttribute) return;
    if (old_value.has_value() == new_value.has_value() || !display_element_) return;
    display_element_ = CreateDisplayElement();
    if (layout::LayoutHandle* handle = GetLayoutHandle()) {
        GetDocument()->GetLayoutTree().SetDisplayElement(*handle, display_element_);
        MarkLayoutDirty();
    }
}

void DOM_A::PostDispatch(Event& event) {
    HTMLElement::PostDispatch(event);
    if (event.GetType() != atoms::kClick && event.GetType() != atoms::kTouchstart) return;
    const Atom* href = FindAttribute(atoms::kHref);
    if (!href || href->empty()) {
        LogDebug("A Node has invalid URL; Will not change location!");
        return;
    }
    GetDocument()->GetHost().NavigateTo(GetDocument()->ResolveURL(href->view()));
}

void CustomElement::ToDebugString(NodeText& out) const {
    out.append("Custom(");
    out.append(name_.view());
    out.append(")");
}

}  // namespace qorvex::dom
