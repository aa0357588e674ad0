// Selectors in their matching form: names interned, tags by number, stored from the right.
#pragma once

#include <cstdint>

#include "core/memory/string_pool.h"
#include "css/values/css_containers.h"
#include "css/values/html_tags.h"

namespace qorvex::css {

enum class SelectorType : uint8_t { Universal = 0, Tag = 1, Id = 2, Class = 3, Pseudo = 5, Attribute = 6 };

// `1 << code` is the bit of the pseudo state.
enum class PseudoCode : uint8_t { None = 0, Hover = 1, Root = 2, Selection = 3, Active = 4, Focus = 5 };

enum class AttributeOperator : uint8_t {
    Presence = 0,
    Equals = 1,     // =
    Includes = 2,   // ~=
    DashMatch = 3,  // |=
    Prefix = 4,     // ^=
    Suffix = 5,     // $=
    Substring = 6,  // *=
};

enum class Combinator : uint8_t { Descendant = 0, Child = 1, Adjacent = 2, Sibling = 3 };

struct SimpleSelector {
    SelectorType type = SelectorType::Universal;
    TagId tag = TagId::Any;                              // Tag
    PseudoCode pseudo = PseudoCode::None;                // Pseudo
    AttributeOperator op = AttributeOperator::Presence;  // Attribute
    bool ignoreCase = false;                             // Attribute: the "i" flag
    bool isData = false;                                 // Attribute: `name` lacks its "data-"
    Atom name;                                           // Id, Class, Attribute, Tag of a custom element
    Atom value;                                          // Attribute
    friend bool operator==(const SimpleSelector&, const SimpleSelector&) = default;
};

// The first simple selector lies inline, since most compounds have no other.
struct CompoundSelector {
    CssSmallVector<SimpleSelector, 1> simple;
    friend bool operator==(const CompoundSelector&, const CompoundSelector&) = default;
};

// Compared as one number: ids before classes, attributes and pseudos, before tags. Counters stop at 255.
struct Specificity {
    uint8_t reserved = 0;
    uint8_t ids = 0;
    uint8_t classes = 0;
    uint8_t tags = 0;

    uint32_t AsNumber() const {
        return uint32_t{reserved} << 24 | uint32_t{ids} << 16 | uint32_t{classes} << 8 | tags;
    }
};

// combinators[i] stands between compounds[i] and what is to its right (the key for i = 0).
struct ComplexSelector {
    CompoundSelector key;                   // the rightmost
    CssVector<CompoundSelector> compounds;  // going leftward
    CssVector<Combinator> combinators;      // as many as compounds
    Specificity specificity;

    bool HasCombinators() const { return !combinators.empty(); }
    // No combinator and one simple selector of type universal, tag, id or class.
    bool IsQuick() const {
        return combinators.empty() && key.simple.size() == 1 && key.simple[0].type <= SelectorType::Class;
    }
};

}  // namespace qorvex::css
