// Sheets, at-rules and rulesets.
#include "core/logging/log.h"
#include "css/parser/grammar.h"

namespace qorvex::css {

bool Grammar::Fail(std::string_view message) {
    LogDebug("CSS parsing error \"", message, "\" near text: ", token_.text());
    context_.hasError_ = true;
    return false;
}

bool Grammar::Expect(char delimiter) {
    if (!token_.Is(delimiter)) return Fail();
    Advance();
    return true;
}

// White space and the SGML comment marks that may stand between rules.
void Grammar::SkipSpaceAndComments() {
    while (token_.kind == TokenKind::Space || token_.kind == TokenKind::Cdo || token_.kind == TokenKind::Cdc)
        Advance();
}

void Grammar::ParseSheet() {
    if (ParsePrologue()) {
        while (token_.kind != TokenKind::End && ParseItem())
            SkipSpaceAndComments();
    }
    context_.tokenCount_ = scanner_.count();
}

bool Grammar::ParsePrologue() {
    if (token_.kind == TokenKind::Charset) {
        Advance();
        if (token_.kind != TokenKind::String) return Fail();
        Advance();
        if (!Expect(';')) return false;
    }
    SkipSpaceAndComments();
    return token_.kind != TokenKind::Import || ParseImport();
}

// Accepted and ignored: no sheet is fetched. A second one is a syntax error.
bool Grammar::ParseImport() {
    AdvanceBeyondSpace();
    if (token_.kind != TokenKind::String && token_.kind != TokenKind::Uri) return Fail();
    AdvanceBeyondSpace();
    SyntaxList<MediaQuerySyntax> ignored;
    if (!token_.Is(';') && !ParseMediaQuery(ignored)) return false;
    if (!Expect(';')) return false;
    SkipSpace();
    return true;
}

bool Grammar::ParseItem() {
    switch (token_.kind) {
        case TokenKind::Media:
            return ParseMedia();
        case TokenKind::Page:
            return ParsePage();
        case TokenKind::Keyframes:
            return ParseKeyframes();
        case TokenKind::FontFace:
            return ParseFontFace();
        default:
            break;
    }
    if (!ParseRuleset(context_.rulesets_)) return false;
    ++context_.ruleCount_;
    return true;
}

bool Grammar::ParseRuleset(SyntaxList<RulesetSyntax>& rulesets) {
    RulesetSyntax* ruleset = arena_.Make<RulesetSyntax>();
    if (!ParseSelectorList(ruleset->selectors) || !ParseBlock(ruleset->declarations)) return false;
    rulesets.Append(ruleset);
    return true;
}

bool Grammar::ParsePage() {
    AdvanceBeyondSpace();
    if (token_.Is(':')) {
        Advance();
        if (token_.kind != TokenKind::Ident) return Fail();
        AdvanceBeyondSpace();
    }
    SyntaxList<DeclarationSyntax> ignored;
    return ParseBlock(ignored);
}

bool Grammar::ParseFontFace() {
    AdvanceBeyondSpace();
    FontFaceSyntax* face = arena_.Make<FontFaceSyntax>();
    if (!ParseBlock(face->declarations)) return false;
    context_.fontFaces_.Append(face);
    return true;
}

bool Grammar::ParseKeyframes() {
    AdvanceBeyondSpace();
    if (token_.kind != TokenKind::Ident && token_.kind != TokenKind::String) return Fail();
    KeyframesSyntax* keyframes = arena_.Make<KeyframesSyntax>();
    keyframes->name = token_.text();
    AdvanceBeyondSpace();
    if (!Expect('{')) return false;
    SkipSpace();
    do {
        if (!ParseKeyframeBlock(*keyframes)) return false;
    } while (!token_.Is('}'));
    AdvanceBeyondSpace();
    context_.keyframes_.Append(keyframes);
    return true;
}

bool Grammar::ParseKeyframeBlock(KeyframesSyntax& keyframes) {
    KeyframeBlockSyntax* block = arena_.Make<KeyframeBlockSyntax>();
    for (;;) {
        if (token_.kind != TokenKind::Percentage && token_.kind != TokenKind::Ident) return Fail();
        KeyframeSelectorSyntax* selector = arena_.Make<KeyframeSelectorSyntax>();
        selector->text = token_.text();
        block->selectors.Append(selector);
        AdvanceBeyondSpace();
        if (!token_.Is(',')) break;
        AdvanceBeyondSpace();
    }
    if (!ParseBlock(block->declarations)) return false;
    keyframes.blocks.Append(block);
    return true;
}

bool Grammar::ParseMedia() {
    AdvanceBeyondSpace();
    MediaSyntax* media = arena_.Make<MediaSyntax>();
    for (;;) {
        if (!ParseMediaQuery(media->queries)) return false;
        if (!token_.Is(',')) break;
        AdvanceBeyondSpace();
    }
    if (!Expect('{')) return false;
    SkipSpace();
    do {
        if (!ParseRuleset(media->rulesets)) return false;
    } while (!token_.Is('}'));
    AdvanceBeyondSpace();
    context_.mediaBlocks_.Append(media);
    return true;
}

bool Grammar::ParseMediaQuery(SyntaxList<MediaQuerySyntax>& queries) {
    if (token_.kind == TokenKind::Not || token_.kind == TokenKind::Only || token_.kind == TokenKind::Ident)
        return Fail("Media queries with media type are unsupported");
    MediaQuerySyntax* query = arena_.Make<MediaQuerySyntax>();
    for (;;) {
        if (!ParseMediaExpression(*query)) return false;
        if (token_.kind != TokenKind::And) break;
        AdvanceBeyondSpace();
    }
    queries.Append(query);
    return true;
}

bool Grammar::ParseMediaExpression(MediaQuerySyntax& query) {
    if (!Expect('(')) return false;
    SkipSpace();
    if (token_.kind != TokenKind::Ident) return Fail();
    MediaExpressionSyntax* expression = arena_.Make<MediaExpressionSyntax>();
    expression->name = token_.text();
    AdvanceBeyondSpace();
    if (!Expect(':')) return false;
    SkipSpace();
    uint8_t flags = 0;
    Outcome outcome = ParseValue(expression->value, flags);
    if (outcome != Outcome::Good) return Fail(outcome == Outcome::Bad ? "syntax error" : "memory exhausted");
    if (!Expect(')')) return false;
    SkipSpace();
    query.expressions.Append(expression);
    return true;
}

}  // namespace qorvex::css
