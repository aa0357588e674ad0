#include "css/parser/convert_selector.h"

#include "core/logging/log.h"
#include "css/values/text_reader.h"

namespace qorvex::css {

namespace {

char ToUpper(char c) {
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - ('a' - 'A')) : c;
}

std::string_view WithoutQuotes(std::string_view text) {
    if (text.size() >= 2 && (text[0] == '"' || text[0] == '\'')) return text.substr(1, text.size() - 2);
    return text;
}

// Names of elements and attributes are stored in lower case, as the document stores them.
Atom InternLowerCase(std::string_view name, StringPool& strings) {
    CssString lower(name);
    for (char& c : lower)
        c = ToLower(c);
    return strings.Intern(lower);
}

bool ConvertTag(const SimpleSelectorSyntax& syntax, StringPool& strings, SimpleSelector& out) {
    CssString upper(syntax.text);
    for (char& c : upper)
        c = ToUpper(c);
    out.type = SelectorType::Tag;
    out.tag = TagLookup(upper);
    if (out.tag == TagId::Custom) out.name = InternLowerCase(syntax.text, strings);
    if (out.tag != TagId::Unknown) return true;
    LogWarning("Unsupported CSS selector encountered: ", syntax.text);
    return false;
}

bool ConvertPseudoClass(const SimpleSelectorSyntax& syntax, SimpleSelector& out) {
    struct Pseudo {
        std::string_view name;
        PseudoCode code;
    };
    static constexpr Pseudo kPseudos[] = {{"hover", PseudoCode::Hover},
                                          {"active", PseudoCode::Active},
                                          {"focus", PseudoCode::Focus},
                                          {"root", PseudoCode::Root}};
    out.type = SelectorType::Pseudo;
    bool isFunction = syntax.argument.data() != nullptr;
    for (const Pseudo& pseudo : kPseudos) {
        if (isFunction || !EqualsIgnoreCase(syntax.text, pseudo.name)) continue;
        out.pseudo = pseudo.code;
        return true;
    }
    LogWarning("Unsupported pseudo CSS selector encountered: ", syntax.text);
    return false;
}

bool ConvertPseudoElement(const SimpleSelectorSyntax& syntax, SimpleSelector& out) {
    out.type = SelectorType::Pseudo;
    out.pseudo = PseudoCode::Selection;
    if (EqualsIgnoreCase(syntax.text, "selection")) return true;
    LogWarning("Unsupported pseudo CSS element encountered: ", syntax.text);
    return false;
}

bool ConvertAttribute(const SimpleSelectorSyntax& syntax, StringPool& strings, SimpleSelector& out) {
    out.type = SelectorType::Attribute;
    out.op = syntax.op;
    out.ignoreCase = EqualsIgnoreCase(syntax.flag, "i");
    if (!syntax.flag.empty() && !out.ignoreCase) return false;
    std::string_view name = syntax.text;
    out.isData = StartsWithIgnoreCase(name, "data-");
    if (out.isData) name.remove_prefix(5);
    out.name = InternLowerCase(name, strings);
    out.value = strings.Intern(WithoutQuotes(syntax.value));
    return true;
}

bool ConvertSimple(const SimpleSelectorSyntax& syntax, StringPool& strings, SimpleSelector& out) {
    switch (syntax.kind) {
        case SimpleSelectorSyntaxKind::Universal:
            return true;
        case SimpleSelectorSyntaxKind::Type:
            return ConvertTag(syntax, strings, out);
        case SimpleSelectorSyntaxKind::PseudoClass:
            return ConvertPseudoClass(syntax, out);
        case SimpleSelectorSyntaxKind::PseudoElement:
            return ConvertPseudoElement(syntax, out);
        case SimpleSelectorSyntaxKind::Attribute:
            return ConvertAttribute(syntax, strings, out);
        case SimpleSelectorSyntaxKind::Id:
        case SimpleSelectorSyntaxKind::Class:
            out.type = syntax.kind == SimpleSelectorSyntaxKind::Id ? SelectorType::Id : SelectorType::Class;
            out.name = strings.Intern(syntax.text);
            return true;
    }
    return false;
}

void CountSpecificity(const SimpleSelector& simple, Specificity& out) {
    auto raise = [](uint8_t& counter) {
        if (counter < 255) ++counter;
    };
    switch (simple.type) {
        case SelectorType::Universal:
            break;
        case SelectorType::Tag:
            raise(out.tags);
            break;
        case SelectorType::Id:
            raise(out.ids);
            break;
        default:
            raise(out.classes);
    }
}

}  // namespace

std::optional<ComplexSelector> ConvertComplexSelector(const SelectorSyntax& syntax, StringPool& strings) {
    ComplexSelector made;
    const auto convert = [&](const CompoundSyntax& compound, CompoundSelector& out) {
        for (const SimpleSelectorSyntax& simple : compound.simple) {
            if (!ConvertSimple(simple, strings, out.simple.emplace_back())) return false;
            CountSpecificity(out.simple.back(), made.specificity);
        }
        return true;
    };
    // Most selectors are one compound and need no list.
    if (syntax.compounds.size() == 1) {
        if (!convert(*syntax.compounds.begin(), made.key)) return std::nullopt;
        return made;
    }
    // Converted in the order of the text and turned round at the end: the list is chained one way.
    CssVector<CompoundSelector>& compounds = made.compounds;
    compounds.reserve(syntax.compounds.size());
    for (const CompoundSyntax& compound : syntax.compounds) {
        if (!compounds.empty()) made.combinators.push_back(compound.combinator);
        if (!convert(compound, compounds.emplace_back())) return std::nullopt;
    }
    if (compounds.size() != made.combinators.size() + 1) {
        LogWarning(
            "Invalid complex selector encountered. The Compound selectors and combinators count don't "
            "match!");
        return std::nullopt;
    }
    made.key = compounds.take_back();
    std::reverse(compounds.begin(), compounds.end());
    std::reverse(made.combinators.begin(), made.combinators.end());
    return made;
}

bool SelectsSelection(const ComplexSelector& selector) {
    auto holds = [](const CompoundSelector& compound) {
        return std::any_of(compound.simple.begin(), compound.simple.end(), [](const SimpleSelector& simple) {
            return simple.type == SelectorType::Pseudo && simple.pseudo == PseudoCode::Selection;
        });
    };
    return holds(selector.key) || std::any_of(selector.compounds.begin(), selector.compounds.end(), holds);
}

}  // namespace qorvex::css
