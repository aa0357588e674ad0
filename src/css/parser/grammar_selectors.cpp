// Selector lists.
#include "core/limits.h"
#include "css/parser/grammar.h"

namespace qorvex::css {

namespace {

bool StartsSimple(const Token& token) {
    return token.kind == TokenKind::Hash || token.kind == TokenKind::Class ||
           token.kind == TokenKind::DoubleColon || token.Is('[') || token.Is(':');
}

bool StartsCompound(const Token& token) {
    return token.kind == TokenKind::Ident || token.Is('*') || StartsSimple(token);
}

}  // namespace

bool Grammar::ParseSelectorList(SyntaxList<SelectorSyntax>& selectors) {
    for (;;) {
        if (!ParseSelector(selectors)) return false;
        if (!token_.Is(',')) return true;
        AdvanceBeyondSpace();
    }
}

// Compounds joined by ">", "+", "~" or space; space at the end belongs to no combinator.
bool Grammar::ParseSelector(SyntaxList<SelectorSyntax>& selectors) {
    SelectorSyntax* selector = arena_.Make<SelectorSyntax>();
    Combinator combinator = Combinator::Descendant;
    for (;;) {
        if (!StartsCompound(token_)) return Fail();
        CompoundSyntax* compound = arena_.Make<CompoundSyntax>();
        compound->combinator = combinator;
        do {
            if (!ParseSimpleSelector(*compound)) return false;
        } while (StartsSimple(token_));
        selector->compounds.Append(compound);

        bool spaced = token_.kind == TokenKind::Space;
        SkipSpace();
        if (token_.Is('>') || token_.Is('+') || token_.Is('~')) {
            combinator = token_.Is('>')   ? Combinator::Child
                         : token_.Is('+') ? Combinator::Adjacent
                                          : Combinator::Sibling;
            AdvanceBeyondSpace();
        } else if (spaced && StartsCompound(token_)) {
            combinator = Combinator::Descendant;
        } else {
            break;
        }
    }
    selectors.Append(selector);
    return true;
}

bool Grammar::ParseSimpleSelector(CompoundSyntax& compound) {
    SimpleSelectorSyntax* simple = arena_.Make<SimpleSelectorSyntax>();
    simple->text = token_.text();
    switch (token_.kind) {
        case TokenKind::Ident:
            simple->kind = SimpleSelectorSyntaxKind::Type;
            break;
        case TokenKind::Hash:
            simple->kind = SimpleSelectorSyntaxKind::Id;
            simple->text.remove_prefix(1);
            break;
        case TokenKind::Class:
            simple->kind = SimpleSelectorSyntaxKind::Class;
            simple->text.remove_prefix(1);
            break;
        case TokenKind::DoubleColon:
            simple->kind = SimpleSelectorSyntaxKind::PseudoElement;
            Advance();
            if (token_.kind != TokenKind::Ident) return Fail();
            simple->text = token_.text();
            break;
        default:
            if (token_.Is('*')) break;
            compound.simple.Append(simple);
            return token_.Is('[') ? ParseAttribute(*simple) : ParsePseudo(*simple);
    }
    compound.simple.Append(simple);
    Advance();
    return true;
}

bool Grammar::ParsePseudo(SimpleSelectorSyntax& simple) {
    simple.kind = SimpleSelectorSyntaxKind::PseudoClass;
    Advance();
    simple.text = token_.text();
    if (token_.kind == TokenKind::Function) return ParsePseudoArgument(simple);
    if (token_.kind != TokenKind::Ident) return Fail();
    Advance();
    return true;
}

// A selector inside parentheses, of which only the text is kept: no functional pseudo-class is supported.
// Arguments nest, so the nesting is counted and a compound goes on behind each ")".
bool Grammar::ParsePseudoArgument(SimpleSelectorSyntax& simple) {
    simple.text.remove_suffix(1);
    size_t depth = 1;
    AdvanceBeyondSpace();
    const char* start = token_.text().data();
    bool needsCompound = true;
    while (depth > 0) {
        if (needsCompound ? StartsCompound(token_) : StartsSimple(token_)) {
            needsCompound = false;
            if (!token_.Is(':')) {
                CompoundSyntax compound;
                if (!ParseSimpleSelector(compound)) return false;
                continue;
            }
            Advance();
            if (token_.kind == TokenKind::Function) {
                if (++depth > limits::kMaxCssNesting) return Fail("memory exhausted");
                needsCompound = true;
                AdvanceBeyondSpace();
                continue;
            }
            if (token_.kind != TokenKind::Ident) return Fail();
            Advance();
            continue;
        }
        if (needsCompound) return Fail();
        bool spaced = token_.kind == TokenKind::Space;
        SkipSpace();
        if (token_.Is('>') || token_.Is('+') || token_.Is('~')) {
            needsCompound = true;
            AdvanceBeyondSpace();
        } else if (spaced && StartsCompound(token_)) {
            needsCompound = true;
        } else if (token_.Is(')')) {
            --depth;
            simple.argument = {start, static_cast<size_t>(token_.text().data() - start)};
            Advance();
        } else {
            return Fail();
        }
    }
    return true;
}

bool Grammar::ParseAttribute(SimpleSelectorSyntax& simple) {
    simple.kind = SimpleSelectorSyntaxKind::Attribute;
    AdvanceBeyondSpace();
    if (token_.kind != TokenKind::Ident) return Fail();
    simple.text = token_.text();
    AdvanceBeyondSpace();
    if (!token_.Is(']')) {
        switch (token_.kind) {
            case TokenKind::Includes:
                simple.op = AttributeOperator::Includes;
                break;
            case TokenKind::DashMatch:
                simple.op = AttributeOperator::DashMatch;
                break;
            case TokenKind::PrefixMatch:
                simple.op = AttributeOperator::Prefix;
                break;
            case TokenKind::SuffixMatch:
                simple.op = AttributeOperator::Suffix;
                break;
            case TokenKind::SubstrMatch:
                simple.op = AttributeOperator::Substring;
                break;
            default:
                if (!token_.Is('=')) return Fail();
                simple.op = AttributeOperator::Equals;
        }
        AdvanceBeyondSpace();
        if (token_.kind != TokenKind::Ident && token_.kind != TokenKind::String) return Fail();
        simple.value = token_.text();
        AdvanceBeyondSpace();
        if (token_.kind == TokenKind::Ident) {
            simple.flag = token_.text();
            AdvanceBeyondSpace();
        }
    }
    return Expect(']');
}

}  // namespace qorvex::css
