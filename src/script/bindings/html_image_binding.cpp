// Pictures: <img>, and `new Image(width, height)`.
#include "dom/document.h"
#include "dom/html_image_element.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/construction.h"
#include "script/bindings/reflected_attributes.h"
#include "script/bindings/unavailable.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::HTMLImageElement;
using Bind = Binding<HTMLImageElement>;

constexpr AttributeDescription kAttributes[] = {
    Reflected<HTMLImageElement, "src">(),
    Bind::ReadWrite<&HTMLImageElement::GetWidth, &HTMLImageElement::SetWidth>("width"),
    Bind::ReadWrite<&HTMLImageElement::GetHeight, &HTMLImageElement::SetHeight>("height"),
};

constexpr MethodDescription kMethods[] = {
    Bind::Method<"getSrcSVGAnimation",
                 &NotAvailable<HTMLImageElement, "HTMLImageElement::GetSrcSVGAnimation">>(),
};

// 0 for an argument that sets nothing.
uint32_t SideAt(ConstructorCall& call, size_t index) {
    Argument<uint32_t> side;
    if (call.count() <= index || *call.exception()) return 0;
    return side.Read(call.context(), call.ValueAt(index), call.exception()) ? side.Get() : 0;
}

qsl::RefPtr<dom::Element> NewImage(dom::Document& document, ConstructorCall& call) {
    const uint32_t width = SideAt(call, 0), height = SideAt(call, 1);
    qsl::RefPtr<dom::Element> image = document.CreateElement("img");
    if (width > 0) static_cast<HTMLImageElement&>(*image).SetWidth(width);
    if (height > 0) static_cast<HTMLImageElement&>(*image).SetHeight(height);
    return image;
}

}  // namespace

const ClassDescription kHTMLImageElementClass = {.script_class = ScriptClass::HTMLImageElement,
                                                 .attributes = kAttributes,
                                                 .methods = kMethods,
                                                 .construct = Construct<NewImage>,
                                                 .alias = "Image"};

}  // namespace qorvex::script
