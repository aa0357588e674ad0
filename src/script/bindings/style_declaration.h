// `element.style` and `getComputedStyle(element)`: the declared or the computed values of one element,
// property by property. The script object holds a small record with the element and the form, not the element
// itself, and each read of `style` makes a new one.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <atomic>
#include <string_view>

#include "css/values/length.h"
#include "css/values/property_id.h"
#include "dom/element.h"
#include "script/class_table.h"
#include "script/pooled_memory.h"

namespace qorvex::script {

struct ScriptCall;

enum class StyleForm : uint32_t { Inline = 0, Computed = 1 };

// The private of a CSSStyleDeclaration. Counted atomically, as the pool clean-up of another thread may drop
// it.
class StyleHolder {
  public:
    static constexpr ScriptClass kScriptClass = ScriptClass::CSSStyleDeclaration;
    // What the argument-count errors of its methods call it.
    static constexpr const char* kErrorClassName = "ElementStyleExtractor";

    QORVEX_POOLED(StyleHolder, 32)

    StyleHolder(dom::Element& element, StyleForm form) : element_(&element), form_(form) {}

    void Release();
    [[nodiscard]] dom::Element& element() const { return *element_; }
    [[nodiscard]] bool IsComputed() const { return form_ == StyleForm::Computed; }

  private:
    std::atomic<uint32_t> count_{1};
    qsl::RefPtr<dom::Element> element_;
    StyleForm form_;
};

[[nodiscard]] JSValueRef MakeStyleDeclaration(JSContextRef context, dom::Element& element, StyleForm form);
void FinaliseStyleDeclaration(JSObjectRef object);

// The text of a property: declared (a custom expression as written) or computed; null when it is not
// declared, and for shorthands, which have no value of their own.
[[nodiscard]] JSValueRef ReadStyleProperty(StyleHolder& holder, ScriptCall& call, css::PropertyId id);

// An empty text or null removes the declaration; text that does not parse is logged and changes nothing.
// `attribute` is the script name, `flags` are css::DeclarationFlags. Computed forms raise an error.
void WriteStyleProperty(StyleHolder& holder, ScriptCall& call, css::PropertyId id, const char* attribute,
                        JSValueRef value, uint8_t flags = 0);

// The suffixed attributes (widthPX, topVW): plain numbers in that unit.
[[nodiscard]] JSValueRef ReadStyleNumber(StyleHolder& holder, ScriptCall& call, css::PropertyId id,
                                         css::LengthUnit unit);
void WriteStyleNumber(StyleHolder& holder, ScriptCall& call, css::PropertyId id, css::LengthUnit unit,
                      const char* attribute, double value);

// What changed is the inline style of this element: it is matched and solved again, nothing below it is
// matched.
void MarkInlineStyleChanged(dom::Element& element);

}  // namespace qorvex::script
