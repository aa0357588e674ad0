#include "script/bindings/style_declaration.h"

#include <cmath>
#include <cstdio>

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "css/parser/convert.h"
#include "css/style/computed_serializer.h"
#include "css/values/property_values.h"
#include "css/values/value_text.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/style_engine.h"
#include "script/class_installation.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using css::Declaration;
using css::Extent;
using css::LengthUnit;
using css::PropertyId;

// "Failed to set Width on 'CSSStyleDeclaration': ..."; false when the form takes writes.
bool RefuseComputed(const StyleHolder& holder, const ScriptCall& call, const char* attribute) {
    if (!holder.IsComputed()) return false;
    char message[128];
    std::snprintf(message, sizeof message,
                  "Failed to set %c%s on 'CSSStyleDeclaration': Computed styles are read-only.",
                  attribute[0] & ~0x20, attribute + 1);
    call.Raise(message);
    return true;
}

void SetDeclaration(dom::Element& element, Declaration declaration) {
    css::ResolveImageUrls(declaration, element.GetDocument()->GetURL());
    if (element.EnsureInlineStyle().Set(std::move(declaration))) MarkInlineStyleChanged(element);
}

void RemoveDeclaration(dom::Element& element, PropertyId id) {
    css::StyleDeclarationSet* style = element.GetInlineStyle();
    if (style && style->Remove(id)) MarkInlineStyleChanged(element);
}

void WriteShorthand(dom::Element& element, PropertyId id, const char* attribute, std::string_view text,
                    uint8_t flags) {
    if (text.find("var(") != text.npos || text.find("calc(") != text.npos) {
        const char first = static_cast<char>(attribute[0] & ~0x20);
        LogWarning("Custom CSS expressions are not supported in shorthand declarations: ", first,
                   attribute + 1, ": ", text, ". Please use the long versions of the CSS property.");
        return;
    }
    css::CssVector<Declaration> declarations;
    // An empty value takes all of the longhands away; "inherit" names them, whatever the shorthand is.
    const bool removes = text.empty();
    if (!css::MakeDeclarations(id, removes ? "inherit" : text, element.GetDocument()->GetStrings(), flags,
                               declarations)) {
        if (!removes) LogWarning("Unable to create declaration from string: ", text);
        return;
    }
    for (Declaration& declaration : declarations) {
        if (removes) {
            RemoveDeclaration(element, declaration.property());
        } else {
            SetDeclaration(element, std::move(declaration));
        }
    }
}

// Declared or computed, the extent behind one of the suffixed attributes; null when there is none.
const Extent* FindExtent(const StyleHolder& holder, PropertyId id) {
    if (holder.IsComputed()) return static_cast<const Extent*>(holder.element().GetStyle().Field(id));
    const css::StyleDeclarationSet* style = holder.element().GetInlineStyle();
    const Declaration* declaration = style ? style->Find(id) : nullptr;
    if (!declaration || declaration->kind() != css::DeclarationKind::Value) return nullptr;
    return static_cast<const Extent*>(declaration->value());
}

const char* UnitName(LengthUnit unit) {
    return unit == LengthUnit::Px ? "px" : unit == LengthUnit::Vw ? "vw" : "vh";
}

}  // namespace

void StyleHolder::Release() {
    if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) delete this;
}

JSValueRef MakeStyleDeclaration(JSContextRef context, dom::Element& element, StyleForm form) {
    const JSClassRef style_class = GetScriptClassTable()[StyleHolder::kScriptClass];
    auto* holder = new StyleHolder(element, form);
    const JSObjectRef object =
        JSObjectMake(context, style_class, PackPrivate(holder, StyleHolder::kScriptClass, false));
    if (ScriptingContext* page = GetScriptingContext(context)) {
        if (const JSObjectRef prototype = GetPrototype(*page, StyleHolder::kScriptClass))
            JSObjectSetPrototype(context, object, prototype);
    }
    return object;
}

void FinaliseStyleDeclaration(JSObjectRef object) {
    const NativePrivate found = UnpackPrivate(JSObjectGetPrivate(object));
    if (!found.object) return;
    JSObjectSetPrivate(object, nullptr);
    static_cast<StyleHolder*>(found.object)->Release();
}

JSValueRef ReadStyleProperty(StyleHolder& holder, ScriptCall& call, PropertyId id) {
    if (!css::IsLonghand(id)) return JSValueMakeNull(call.context);
    css::CssString text;
    if (holder.IsComputed()) {
        css::SerialiseComputed(id, holder.element().GetStyle(), text);
        return ToScript(call.context, text.view());
    }
    const css::StyleDeclarationSet* style = holder.element().GetInlineStyle();
    const Declaration* declaration = style ? style->Find(id) : nullptr;
    if (!declaration) return JSValueMakeNull(call.context);
    css::SerialiseDeclaration(*declaration, text);
    return ToScript(call.context, text.view());
}

void WriteStyleProperty(StyleHolder& holder, ScriptCall& call, PropertyId id, const char* attribute,
                        JSValueRef value, uint8_t flags) {
    if (RefuseComputed(holder, call, attribute)) return;
    dom::Element& element = holder.element();
    ScriptText text;
    // https://drafts.csswg.org/cssom/#dom-cssstyledeclaration-setproperty: null is the empty text.
    if (!JSValueIsNull(call.context, value) && !text.Read(call.context, value, call.exception)) return;
    if (JSValueIsUndefined(call.context, value)) {
        LogDebug("Trying to set ", attribute, " property to invalid value!");
        return;
    }
    if (css::IsShorthand(id)) {
        WriteShorthand(element, id, attribute, text.view(), flags);
    } else if (text.view().empty()) {
        RemoveDeclaration(element, id);
    } else if (auto made =
                   css::MakeDeclaration(id, text.view(), element.GetDocument()->GetStrings(), flags)) {
        SetDeclaration(element, std::move(*made));
    } else {
        LogWarning("Unable to create declaration from string: ", text.view());
    }
}

JSValueRef ReadStyleNumber(StyleHolder& holder, ScriptCall& call, PropertyId id, LengthUnit unit) {
    const Extent* extent = FindExtent(holder, id);
    if (!extent || !extent->IsLength()) return JSValueMakeNull(call.context);
    if (extent->unit == unit) return JSValueMakeNumber(call.context, extent->value);
    const dom::HostSize size = holder.element().GetDocument()->GetHost().GetViewSize();
    const double vw = size.width / 100.0;
    const double vh = size.height / 100.0;
    const auto pixels_per = [&](LengthUnit which) {
        return which == LengthUnit::Px   ? 1.0
               : which == LengthUnit::Vw ? vw
               : which == LengthUnit::Vh ? vh
                                         : 0.0;
    };
    const double from = pixels_per(extent->unit);
    const double to = pixels_per(unit);
    if (from > 0 && to > 0) return JSValueMakeNumber(call.context, extent->value * from / to);
    LogWarning("Could not evaluate property value in ", UnitName(unit),
               " units. Property was not converted to ", UnitName(unit), " units.");
    return JSValueMakeNumber(call.context, extent->value);
}

void WriteStyleNumber(StyleHolder& holder, ScriptCall& call, PropertyId id, LengthUnit unit,
                      const char* attribute, double value) {
    if (RefuseComputed(holder, call, attribute)) return;
    if (!std::isfinite(value)) {
        LogDebug("Trying to set ", attribute, " property to invalid value!");
        return;
    }
    const Extent extent{css::ExtentKind::Length, unit, static_cast<float>(value)};
    switch (id) {
#define QORVEX_EXTENT_CASE(name) \
    case PropertyId::name:       \
        return SetDeclaration(holder.element(), Declaration::Make<PropertyId::name>(extent));
        QORVEX_EXTENT_CASE(Top)
        QORVEX_EXTENT_CASE(Left)
        QORVEX_EXTENT_CASE(Bottom)
        QORVEX_EXTENT_CASE(Right)
        QORVEX_EXTENT_CASE(Width)
        QORVEX_EXTENT_CASE(Height)
        QORVEX_EXTENT_CASE(MinWidth)
        QORVEX_EXTENT_CASE(MinHeight)
        QORVEX_EXTENT_CASE(MaxWidth)
        QORVEX_EXTENT_CASE(MaxHeight)
#undef QORVEX_EXTENT_CASE
        default:
            return;
    }
}

void MarkInlineStyleChanged(dom::Element& element) {
    dom::Document& document = *element.GetDocument();
    if (document.GetStyleEngine().IsSelectorAttribute(atoms::kStyle)) {
        element.MarkStyleDirty();
        return;
    }
    document.MarkSelectorDirty(element);
    document.MarkNodeDirty(element);
}

}  // namespace qorvex::script
