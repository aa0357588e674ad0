// Values that hold var() or calc(): the text template is filled with the custom properties in force, calc()
// is computed, and the plain text goes through the property's ordinary parser. Nothing is cached between two
// solves: the computed value lands in a style group like any other.
#pragma once

#include "css/values/layout_style_refs.h"
#include "css/values/length_context.h"

namespace qorvex {
class URL;
}

namespace qorvex::css {

// What an expression is evaluated against. An em is the parent's font size, a rem the root's.
struct ExpressionContext {
    const LayoutStyleRefs* parent = nullptr;
    const LayoutStyleRefs* root = nullptr;
    float vw = 0;  // one hundredth of the viewport's sides
    float vh = 0;
    const URL* base = nullptr;  // the document's: whose URLs a variable holds is not known any more
};

// True with the evaluated declaration in `out`: a plain value, or inherit. False, with the reason logged,
// when a variable is unknown or cyclic, a calc() is wrong or the resulting text is no value of the property.
[[nodiscard]] bool EvaluateCustomExpression(const Declaration& declaration, const LayoutStyleRefs& style,
                                            const ExpressionContext& context, Declaration& out);

}  // namespace qorvex::css
