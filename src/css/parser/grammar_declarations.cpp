// Declaration blocks and values.
#include "core/limits.h"
#include "css/parser/grammar.h"
#include "css/values/custom_property.h"
#include "css/values/text_reader.h"

namespace qorvex::css {

bool Grammar::ParseBlock(SyntaxList<DeclarationSyntax>& out) {
    if (!Expect('{')) return false;
    SkipSpace();
    while (!token_.Is('}')) {
        if (token_.kind == TokenKind::End) return Fail();
        if (token_.Is(';')) {
            AdvanceBeyondSpace();
            continue;
        }
        Outcome outcome = ParseDeclaration(out);
        if (outcome == Outcome::Exhausted) return Fail("memory exhausted");
        if (outcome == Outcome::Good) continue;
        Fail();
        while (token_.kind != TokenKind::End && !token_.Is(';') && !token_.Is('}'))
            Advance();
    }
    AdvanceBeyondSpace();
    return true;
}

// Appended only when what follows may follow a declaration.
Grammar::Outcome Grammar::ParseDeclaration(SyntaxList<DeclarationSyntax>& out) {
    if (token_.kind != TokenKind::Ident && token_.kind != TokenKind::CustomIdent) return Outcome::Bad;
    std::string_view name = token_.text();
    AdvanceBeyondSpace();
    if (!token_.Is(':')) return Outcome::Bad;
    AdvanceBeyondSpace();
    std::string_view value;
    uint8_t flags = 0;
    Outcome outcome = ParseValue(value, flags);
    if (outcome != Outcome::Good) return outcome;
    if (token_.kind == TokenKind::Important) {
        flags |= kImportant;
        AdvanceBeyondSpace();
    }
    if (!token_.Is(';') && !token_.Is('}')) return Outcome::Bad;
    DeclarationSyntax* declaration = arena_.Make<DeclarationSyntax>();
    declaration->name = name;
    declaration->value = value;
    declaration->flags = flags;
    out.Append(declaration);
    return Outcome::Good;
}

bool Grammar::StartsTerm() const {
    switch (token_.kind) {
        case TokenKind::Number:
        case TokenKind::Percentage:
        case TokenKind::Numeric:
        case TokenKind::String:
        case TokenKind::Ident:
        case TokenKind::CustomIdent:
        case TokenKind::Uri:
        case TokenKind::Hash:
        case TokenKind::Function:
            return true;
        default:
            return token_.Is('(');
    }
}

namespace {

// Does it end in the number of an escape that has not taken its space yet?
bool EndsInOpenEscape(std::string_view text) {
    constexpr size_t kMostDigits = 6;
    size_t start = text.size();
    while (start > 0 && IsHexDigit(text[start - 1]))
        --start;
    const size_t digits = text.size() - start;
    size_t backslashes = 0;
    while (backslashes < start && text[start - 1 - backslashes] == '\\')
        ++backslashes;
    return digits > 0 && digits <= kMostDigits && backslashes % 2 != 0;
}

// Builds the normalised text of a value. As long as that equals the text as written it is a slice of it;
// copying into the arena starts with the first difference.
class ValueText {
  public:
    explicit ValueText(ParserArena& arena) : arena_(arena) {}

    void Append(std::string_view piece) {
        if (!copied_ && (slice_.empty() || slice_.data() + slice_.size() == piece.data())) {
            slice_ = slice_.empty() ? piece : std::string_view(slice_.data(), slice_.size() + piece.size());
            return;
        }
        StartCopy();
        arena_.AppendText(piece);
        last_ = piece;
    }
    // One space, then the piece. The first space behind the number of an escape is a part of that, so a
    // piece behind a space as written does not follow such a number.
    void AppendTerm(std::string_view piece) {
        const char* end = slice_.data() + slice_.size();
        if (!copied_ && end + 1 == piece.data() && *end == ' ') {
            slice_ = {slice_.data(), slice_.size() + 1 + piece.size()};
            return;
        }
        StartCopy();
        arena_.AppendText(EndsInOpenEscape(last_) ? "  " : " ");
        arena_.AppendText(piece);
        last_ = piece;
    }
    // An escape that ends the text needs its space no more, and what is read again comes without.
    std::string_view Finish() { return Trim(copied_ ? arena_.FinishText() : slice_); }

  private:
    void StartCopy() {
        if (copied_) return;
        copied_ = true;
        arena_.BeginText();
        arena_.AppendText(slice_);
        last_ = slice_;
    }

    ParserArena& arena_;
    std::string_view slice_;
    std::string_view last_;  // that was copied
    bool copied_ = false;
};

bool IsOperator(const Token& token) {
    return token.Is('/') || token.Is(',') || token.Is('+') || token.Is('-') || token.Is('*');
}

// An operator, or a sign of its own, whose place in the text waits for the token after it.
struct Joint {
    Token token;
    bool isSign = false;
    bool spaceBefore = false;

    bool IsWaiting() const { return token.size != 0; }
    // Would they be other tokens without space? A value is printed as it is kept, and has to read back (CSS
    // Syntax Module Level 3, 9).
    bool NeedsSpace(TokenKind before, const Token& after) const {
        const char next = *after.begin;
        if (isSign) return token.Is('-') && (next == '-' || after.kind == TokenKind::Uri);
        if (token.Is('+')) return IsDigit(next) || next == '.';
        const bool afterName = before == TokenKind::Ident || before == TokenKind::CustomIdent ||
                               before == TokenKind::Hash || before == TokenKind::Numeric;
        return token.Is('-') &&
               (afterName || std::string_view("(#+'\"").find(next) == std::string_view::npos);
    }
};

}  // namespace

// Terms and operators in turn. Parentheses and functions only raise a counter: whatever they hold has the
// same form, and behind a ")" the same may follow as behind any term.
Grammar::Outcome Grammar::ParseValue(std::string_view& text, uint8_t& flags) {
    enum class State { NeedsTerm, FunctionOpened, AfterTerm } state = State::NeedsTerm;
    ValueText value(arena_);
    size_t depth = 0;
    Joint joint;
    TokenKind before = TokenKind::End;
    // True when the token after it needs a space before itself.
    const auto placeJoint = [&] {
        if (!joint.IsWaiting()) return false;
        const bool spaced = joint.NeedsSpace(before, token_);
        if (joint.spaceBefore || (spaced && !joint.isSign))
            value.AppendTerm(joint.token.text());
        else
            value.Append(joint.token.text());
        joint = {};
        return spaced;
    };
    for (;; AdvanceBeyondSpace()) {
        if (StartsTerm()) {
            if (placeJoint() || state == State::AfterTerm)
                value.AppendTerm(token_.text());
            else
                value.Append(token_.text());
            before = token_.kind;
            state = State::AfterTerm;
            if (token_.kind == TokenKind::Function) {
                if (token_.text().find("var(") != std::string_view::npos) flags |= kHasVar;
                if (token_.text().find("calc(") != std::string_view::npos) flags |= kHasCalc;
                state = State::FunctionOpened;
            } else if (token_.Is('(')) {
                state = State::NeedsTerm;
            }
            if (state != State::AfterTerm && ++depth > limits::kMaxCssNesting) return Outcome::Exhausted;
        } else if (token_.Is(')') && depth > 0) {
            if (state == State::NeedsTerm) return Outcome::Bad;
            value.Append(token_.text());
            before = TokenKind::Delimiter;
            --depth;
            state = State::AfterTerm;
        } else if (IsOperator(token_) && state == State::AfterTerm) {
            joint = {token_};
            state = State::NeedsTerm;
        } else if ((token_.Is('+') || token_.Is('-')) && state != State::AfterTerm && !joint.isSign) {
            // A sign of its own before a term, which has one at most.
            const bool spaced = placeJoint();
            joint = {token_, true, spaced};
            state = State::NeedsTerm;
        } else {
            break;
        }
    }
    if (state != State::AfterTerm || depth > 0) return Outcome::Bad;
    text = value.Finish();
    return Outcome::Good;
}

}  // namespace qorvex::css
