// The script attributes of CSSStyleDeclaration, made from the property table.
#include "css/parser/convert.h"
#include "css/values/custom_property.h"
#include "css/values/property_table.h"
#include "css/values/style_declaration_set.h"
#include "css/values/value_text.h"
#include "dom/document.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/style_declaration.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using css::LengthUnit;
using css::PropertyId;
using Bind = Binding<StyleHolder>;

// "border-top-width" as borderTopWidth; what the dashes leave free is zeros.
template <FixedString kCssName>
inline constexpr auto kAttributeName = [] {
    auto name = kCssName;
    size_t length = 0;
    bool upper = false;
    for (char c : kCssName.text) {
        if (c == '-') {
            upper = true;
            continue;
        }
        name.text[length++] = upper && c >= 'a' && c <= 'z' ? static_cast<char>(c - ('a' - 'A')) : c;
        upper = false;
    }
    while (length < sizeof name.text)
        name.text[length++] = '\0';
    return name;
}();

template <PropertyId kId>
JSValueRef Get(StyleHolder& holder, ScriptCall& call) {
    return ReadStyleProperty(holder, call, kId);
}
template <PropertyId kId, FixedString kName>
void Set(StyleHolder& holder, ScriptCall& call, JSValueRef value) {
    WriteStyleProperty(holder, call, kId, kText<kName>.text, value);
}

template <PropertyId kId, LengthUnit kUnit>
JSValueRef GetNumber(StyleHolder& holder, ScriptCall& call) {
    return ReadStyleNumber(holder, call, kId, kUnit);
}
template <PropertyId kId, LengthUnit kUnit, FixedString kName>
void SetNumber(StyleHolder& holder, ScriptCall& call, double value) {
    WriteStyleNumber(holder, call, kId, kUnit, kText<kName>.text, value);
}

template <PropertyId kId, FixedString kName>
constexpr AttributeDescription Property() {
    return Bind::ReadWrite<&Get<kId>, &Set<kId, kName>>(kText<kName>.text);
}
template <PropertyId kId, LengthUnit kUnit, FixedString kName>
constexpr AttributeDescription Number() {
    return Bind::ReadWrite<&GetNumber<kId, kUnit>, &SetNumber<kId, kUnit, kName>>(kText<kName>.text);
}

// --- Access by name

css::StyleDeclarationSet* InlineSet(StyleHolder& holder) {
    return holder.element().GetInlineStyle();
}

// Null when there is no such property.
JSValueRef ReadByName(StyleHolder& holder, ScriptCall& call, std::string_view name) {
    if (name.starts_with("--")) {
        const Atom atom = holder.element().GetDocument()->FindAtom(name.substr(2));
        const css::CustomPropertyMap* map = nullptr;
        if (!holder.IsComputed()) {
            map = InlineSet(holder) ? &InlineSet(holder)->customProperties() : nullptr;
        } else if (const auto& shared = holder.element().GetStyle().customProperties) {
            map = &shared->map;
        }
        const css::CustomPropertyPtr* record = map && atom ? map->get(atom) : nullptr;
        return record ? ToScript(call.context, (*record)->text.view()) : JSValueMakeNull(call.context);
    }
    const PropertyId id = css::FindProperty(name);
    return id == PropertyId::kUnknown ? JSValueMakeNull(call.context) : ReadStyleProperty(holder, call, id);
}

// https://drafts.csswg.org/cssom/#dom-cssstyledeclaration-getpropertyvalue: nothing is the empty text.
JSValueRef GetPropertyValue(StyleHolder& holder, ScriptCall& call, std::string_view name) {
    const JSValueRef value = ReadByName(holder, call, name);
    return JSValueIsNull(call.context, value) ? ToScript(call.context, "") : value;
}

void SetCustomProperty(StyleHolder& holder, std::string_view name, std::string_view value, uint8_t flags) {
    dom::Element& element = holder.element();
    dom::Document& document = *element.GetDocument();
    const Atom atom = document.Intern(name.substr(2));
    if (!value.empty()) {
        const auto expression = static_cast<uint8_t>(css::FindExpressionFlags(value) | flags);
        css::CustomPropertyPtr record = css::MakeCustomProperty(value, expression, document.GetStrings());
        if (!record) return;
        element.EnsureInlineStyle().SetCustomProperty(atom, std::move(record));
    } else if (!InlineSet(holder) || !InlineSet(holder)->RemoveCustomProperty(atom)) {
        return;
    }
    MarkInlineStyleChanged(element);
}

void SetProperty(StyleHolder& holder, ScriptCall& call, std::string_view name, JSValueRef value,
                 std::optional<std::string_view> priority) {
    const uint8_t flags = priority && *priority == "important" ? css::kImportant : 0;
    const PropertyId id = css::FindProperty(name);
    if (name.size() > 2 && name.starts_with("--") && !holder.IsComputed()) {
        ScriptText text;
        if (text.Read(call.context, value, call.exception))
            SetCustomProperty(holder, name, text.view(), flags);
    } else if (id != PropertyId::kUnknown) {
        WriteStyleProperty(holder, call, id, String(name).c_str(), value, flags);
    }
}

JSValueRef RemoveProperty(StyleHolder& holder, ScriptCall& call, std::string_view name) {
    const JSValueRef old_value = GetPropertyValue(holder, call, name);
    SetProperty(holder, call, name, ToScript(call.context, ""), std::nullopt);
    return old_value;
}

css::CssString GetCssText(StyleHolder& holder) {
    if (holder.IsComputed() || !InlineSet(holder)) return css::CssString();
    return InlineSet(holder)->ToText();
}
void SetCssText(StyleHolder& holder, ScriptCall& call, std::string_view text) {
    if (holder.IsComputed()) {
        call.Raise("Failed to set CssText on 'CSSStyleDeclaration': Computed styles are read-only.");
        return;
    }
    holder.element().SetAttribute("style", text);
}

#define QORVEX_STYLE_UNITS(id, name)                         \
    Number<PropertyId::id, LengthUnit::Px, name "PX">(),     \
        Number<PropertyId::id, LengthUnit::Vw, name "VW">(), \
        Number<PropertyId::id, LengthUnit::Vh, name "VH">(),

constexpr AttributeDescription kAttributes[] = {
#define QORVEX_ROW(id, name, ...) Property<PropertyId::id, kAttributeName<name>>(),
    QORVEX_CSS_LONGHANDS(QORVEX_ROW) QORVEX_CSS_SHORTHANDS(QORVEX_ROW)
#undef QORVEX_ROW
    // The one attribute whose name does not follow from its property.
    Property<PropertyId::FontSdf, "qorSdf">(),
    QORVEX_STYLE_UNITS(Top, "top") QORVEX_STYLE_UNITS(Left, "left") QORVEX_STYLE_UNITS(Bottom, "bottom")
        QORVEX_STYLE_UNITS(Right, "right") QORVEX_STYLE_UNITS(Width, "width")
            QORVEX_STYLE_UNITS(Height, "height") QORVEX_STYLE_UNITS(MinWidth, "minWidth")
                QORVEX_STYLE_UNITS(MinHeight, "minHeight") QORVEX_STYLE_UNITS(MaxWidth, "maxWidth")
                    QORVEX_STYLE_UNITS(MaxHeight, "maxHeight")
                        Bind::ReadWrite<&GetCssText, &SetCssText>("cssText"),
};

constexpr MethodDescription kMethods[] = {
    Bind::Method<"getPropertyValue", &GetPropertyValue, 1>(),
    Bind::Method<"removeProperty", &RemoveProperty, 1>(),
    Bind::Method<"setProperty", &SetProperty, 2>(),
};

}  // namespace

const ClassDescription kCSSStyleDeclarationClass = {.script_class = ScriptClass::CSSStyleDeclaration,
                                                    .attributes = kAttributes,
                                                    .methods = kMethods,
                                                    .finalise = FinaliseStyleDeclaration};

}  // namespace qorvex::script
