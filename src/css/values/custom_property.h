// Custom properties (--name: text) and values that hold var() or calc(), kept as text templates that are
// filled and parsed anew for each element.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

#include "core/memory/string_pool.h"
#include "css/values/css_containers.h"
#include "css/values/shared_value.h"

namespace qorvex::css {

// Flag byte of a declaration and of a custom property.
enum DeclarationFlags : uint8_t {
    kHasVar = 1,
    kImportant = 2,
    kHasCalc = 4,
};

// The value of a declaration of kind CustomExpression: its text with every var(--name) cut out.
struct CustomExpression {
    struct Reference {
        uint32_t offset = 0;  // in `text`, where the variable's text belongs
        Atom name;            // without "--"
        friend bool operator==(const Reference&, const Reference&) = default;
    };
    CssString text;
    CssSmallVector<Reference, 2> references;  // in text order

    // The text with the references put back.
    void AppendText(CssString& out) const;
    friend bool operator==(const CustomExpression&, const CustomExpression&) = default;
};

// Shared by rules, elements and maps; immutable.
struct CustomProperty : SharedValue<CustomProperty> {
    struct Reference {
        uint32_t offset = 0;  // of "var(" in `text`
        uint32_t length = 0;  // up to and with ")"
        Atom name;
        friend bool operator==(const Reference&, const Reference&) = default;
    };
    CssString text;
    CssSmallVector<Reference, 2> references;
    uint8_t flags = 0;  // DeclarationFlags

    bool SameAs(const CustomProperty& other) const {
        return flags == other.flags && text == other.text;  // the references follow from the text
    }
};

using CustomPropertyPtr = RefPtr<const CustomProperty>;
// Name without "--" to record.
using CustomPropertyMap = CssHashMap<Atom, CustomPropertyPtr>;

// The map in force for a node, shared along the tree like a style group.
struct SharedCustomProperties : SharedValue<SharedCustomProperties> {
    CustomPropertyMap map;
};

// Logs and returns nothing for a text that is no custom expression.
[[nodiscard]] std::optional<CustomExpression> PrepareCustomExpression(std::string_view valueText,
                                                                      StringPool& strings);
[[nodiscard]] CustomPropertyPtr MakeCustomProperty(std::string_view valueText, uint8_t flags,
                                                   StringPool& strings);

}  // namespace qorvex::css
