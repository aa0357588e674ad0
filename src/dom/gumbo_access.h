// The parser's C tree with our types.
#pragma once

#include <gumbo.h>

#include <span>
#include <string_view>

#include "dom/ascii.h"

namespace qorvex::dom {

inline std::span<const GumboNode* const> ChildrenOf(const GumboElement& element) {
    return {reinterpret_cast<const GumboNode* const*>(element.children.data), element.children.length};
}

inline std::span<const GumboAttribute* const> AttributesOf(const GumboElement& element) {
    return {reinterpret_cast<const GumboAttribute* const*>(element.attributes.data),
            element.attributes.length};
}

// Empty when the element does not have the attribute.
inline std::string_view AttributeValue(const GumboElement& element, std::string_view name) {
    for (const GumboAttribute* attribute : AttributesOf(element))
        if (EqualsIgnoringAsciiCase(attribute->name, name)) return attribute->value;
    return {};
}

}  // namespace qorvex::dom
