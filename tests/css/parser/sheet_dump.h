// Sheets as text, for tests that compare whole results.
#pragma once

#include <string>

#include "css/parser/convert.h"
#include "css/values/value_text.h"

namespace qorvex::css {

inline std::string Dump(const SimpleSelector& simple) {
    static const char* const kOperators[] = {"", "=", "~=", "|=", "^=", "$=", "*="};
    static const char* const kPseudos[] = {"", ":hover", ":root", "::selection", ":active", ":focus"};
    std::string name(simple.name.view());
    switch (simple.type) {
        case SelectorType::Universal:
            return "*";
        case SelectorType::Tag:
            return simple.tag == TagId::Custom ? "<" + name + ">" : std::string(TagName(simple.tag));
        case SelectorType::Id:
            return "#" + name;
        case SelectorType::Class:
            return "." + name;
        case SelectorType::Pseudo:
            return kPseudos[static_cast<int>(simple.pseudo)];
        case SelectorType::Attribute:
            return "[" + std::string(simple.isData ? "data:" : "") + name +
                   kOperators[static_cast<int>(simple.op)] + std::string(simple.value.view()) +
                   (simple.ignoreCase ? " i" : "") + "]";
    }
    return "?";
}

inline std::string Dump(const CompoundSelector& compound) {
    std::string text;
    for (const SimpleSelector& simple : compound.simple)
        text += Dump(simple);
    return text;
}

// From the right, as stored: "key <combinator> next ...".
inline std::string Dump(const ComplexSelector& selector) {
    std::string text = Dump(selector.key);
    for (size_t i = 0; i < selector.compounds.size(); ++i) {
        text += std::string(1, " >+~"[static_cast<int>(selector.combinators[i])]);
        text += Dump(selector.compounds[i]);
    }
    return text;
}

inline std::string Dump(const Ruleset& rule) {
    std::string text = Dump(rule.selector) + "{";
    for (const Declaration& declaration : rule.declarations()) {
        CssString value;
        SerialiseDeclaration(declaration, value);
        text += std::string(PropertyName(declaration.property())) + ":" + std::string(value.view()) +
                (declaration.important() ? "!" : "") + ";";
    }
    text += "}";
    return text;
}

inline std::string Dump(const Stylesheet& sheet) {
    std::string text;
    for (const Ruleset& rule : sheet.rules)
        text += Dump(rule);
    for (const MediaBlock& media : sheet.mediaBlocks) {
        text += "@media(";
        for (const MediaFeature& feature : media.features)
            text += std::to_string(static_cast<int>(feature.code)) + ",";
        text += "){";
        for (const Ruleset& rule : media.rules)
            text += Dump(rule);
        text += "}";
    }
    return text;
}

}  // namespace qorvex::css
