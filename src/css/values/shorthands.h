// Expansion of shorthands: one function per shorthand row of the property table. Each appends its longhands,
// in the order of their ids, as plain values with the flags; what the text leaves out gets its initial value.
#pragma once

#include <string_view>

#include "css/values/declaration.h"

namespace qorvex::css {

struct ShorthandOutput {
    CssVector<Declaration>& declarations;
    uint8_t flags;

    // Reads the text as a plain value of the longhand and appends it.
    [[nodiscard]] bool Add(PropertyId id, std::string_view text);
    void AddInitial(PropertyId id);
    void Add(Declaration declaration);
    // The declaration, or the longhand's initial value when it holds none.
    void AddOrInitial(PropertyId id, Declaration& declaration);
};

#define QORVEX_ROW(id, name, expander) \
    [[nodiscard]] bool expander(std::string_view text, ShorthandOutput& out);
QORVEX_CSS_SHORTHANDS(QORVEX_ROW)
#undef QORVEX_ROW

}  // namespace qorvex::css
