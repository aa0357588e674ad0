// CSS text to tokens. Tokens are slices of the text as written: escapes stay, case stays. The longest match
// wins. Comments are read over; "//" starts one that ends with the line, which is this scanner's own
// extension.
#pragma once

#include <cstdint>
#include <string_view>

namespace qorvex::css {

enum class TokenKind : uint8_t {
    End,
    Space,
    Cdo,          // <!--
    Cdc,          // -->
    Includes,     // ~=
    DashMatch,    // |=
    PrefixMatch,  // ^=
    SuffixMatch,  // $=
    SubstrMatch,  // *=
    And,          // these three words are never identifiers
    Not,
    Only,
    String,
    BadString,
    Ident,
    CustomIdent,  // --name
    Hash,         // #name
    Class,        // .name
    Import,
    Page,
    Media,
    Charset,
    Keyframes,
    FontFace,
    DoubleColon,
    Important,
    Numeric,    // a number with a unit that the grammar takes
    Dimension,  // a number with any other unit: no term
    Percentage,
    Number,
    Uri,
    BadUri,
    Function,  // name(
    Delimiter,
};

struct Token {
    TokenKind kind = TokenKind::End;
    std::string_view text;

    bool Is(char delimiter) const { return kind == TokenKind::Delimiter && text[0] == delimiter; }
};

class Scanner {
  public:
    explicit Scanner(std::string_view text) : at_(text.data()), end_(text.data() + text.size()) {}

    // Each byte is looked at a bounded number of times, whatever the text.
    Token Next();
    uint64_t count() const { return count_; }

  private:
    char Peek(size_t offset = 0) const {
        return offset < static_cast<size_t>(end_ - at_) ? at_[offset] : '\0';
    }
    const char* SkipName(const char* from) const;
    const char* SkipEscape(const char* backslash) const;
    bool StartsIdent(const char* from) const;
    bool Matches(std::string_view lowerCase) const;
    bool SkipComment();
    bool FindStringEnd(const char* quote, const char*& end) const;

    Token Take(TokenKind kind, const char* end);
    Token TakeIdent();
    Token TakeNumber();
    Token TakeUri();
    Token TakeAtWord();
    Token TakeImportant();
    Token TakeDelimiter();

    const char* at_;
    const char* end_;
    uint64_t count_ = 0;
};

}  // namespace qorvex::css
