// The grammar of sheets: tokens to the syntax tree of a ParserContext.
//
// Recovery happens only inside declaration blocks: a bad declaration is dropped and reading goes on behind
// the next
// ";" or at the next "}". Anywhere else a syntax error ends the parse, and what was finished before it
// stands; a rule whose block is not closed is not finished. Nothing recurses: nesting is a counter with a
// limit.
#pragma once

#include <string_view>

#include "css/parser/parser_context.h"
#include "css/parser/scanner.h"

namespace qorvex::css {

class Grammar {
  public:
    Grammar(std::string_view text, ParserContext& context)
        : context_(context), arena_(context.arena_), scanner_(text) {
        Advance();
    }

    void ParseSheet();

  private:
    // All functions read from the current token on and leave the first one that is not theirs. False ends the
    // parse; the error has been reported then.
    bool ParsePrologue();
    bool ParseImport();
    bool ParseItem();
    bool ParsePage();
    bool ParseFontFace();
    bool ParseKeyframes();
    bool ParseKeyframeBlock(KeyframesSyntax& keyframes);

    bool ParseMedia();
    bool ParseMediaQuery(SyntaxList<MediaQuerySyntax>& queries);
    bool ParseMediaExpression(MediaQuerySyntax& query);

    bool ParseRuleset(SyntaxList<RulesetSyntax>& rulesets);
    bool ParseSelectorList(SyntaxList<SelectorSyntax>& selectors);
    bool ParseSelector(SyntaxList<SelectorSyntax>& selectors);
    bool ParseSimpleSelector(CompoundSyntax& compound);
    bool ParsePseudo(SimpleSelectorSyntax& simple);
    bool ParsePseudoArgument(SimpleSelectorSyntax& simple);
    bool ParseAttribute(SimpleSelectorSyntax& simple);

    // "{" declarations "}" with the space around; nothing is kept when `out` is null.
    bool ParseBlock(SyntaxList<DeclarationSyntax>& out);
    enum class Outcome { Good, Bad, Exhausted };
    Outcome ParseDeclaration(SyntaxList<DeclarationSyntax>& out);
    // A value and its normalised text.
    Outcome ParseValue(std::string_view& text, uint8_t& flags);
    bool StartsTerm() const;

    void Advance() { scanner_.Next(token_); }
    void AdvanceBeyondSpace() { scanner_.NextBeyondSpace(token_); }
    void SkipSpace() {
        if (token_.kind == TokenKind::Space) AdvanceBeyondSpace();
    }
    void SkipSpaceAndComments();
    bool Expect(char delimiter);
    bool Fail(std::string_view message = "syntax error");

    ParserContext& context_;
    ParserArena& arena_;
    Scanner scanner_;
    Token token_;
};

}  // namespace qorvex::css
