#include "dom/dom_rect.h"

#include "script/bindings/bound_classes.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::DOMRect;
using dom::DOMRectReadOnly;

using Bind = Binding<DOMRectReadOnly>;
constexpr AttributeDescription kReadOnlyAttributes[] = {
    Bind::ReadOnly<&DOMRectReadOnly::GetX>("x"),
    Bind::ReadOnly<&DOMRectReadOnly::GetY>("y"),
    Bind::ReadOnly<&DOMRectReadOnly::GetWidth>("width"),
    Bind::ReadOnly<&DOMRectReadOnly::GetHeight>("height"),
    Bind::ReadOnly<&DOMRectReadOnly::GetTop>("top"),
    Bind::ReadOnly<&DOMRectReadOnly::GetRight>("right"),
    Bind::ReadOnly<&DOMRectReadOnly::GetBottom>("bottom"),
    Bind::ReadOnly<&DOMRectReadOnly::GetLeft>("left"),
};

using BindRect = Binding<DOMRect>;
constexpr AttributeDescription kAttributes[] = {
    BindRect::ReadWrite<&DOMRect::GetX, &DOMRect::SetX>("x"),
    BindRect::ReadWrite<&DOMRect::GetY, &DOMRect::SetY>("y"),
    BindRect::ReadWrite<&DOMRect::GetWidth, &DOMRect::SetWidth>("width"),
    BindRect::ReadWrite<&DOMRect::GetHeight, &DOMRect::SetHeight>("height"),
};

}  // namespace

const ClassDescription kDOMRectReadOnlyClass = {.script_class = ScriptClass::DOMRectReadOnly,
                                                .attributes = kReadOnlyAttributes};
const ClassDescription kDOMRectClass = {.script_class = ScriptClass::DOMRect, .attributes = kAttributes};

}  // namespace qorvex::script
