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

// Begin and size are read one by one: as a view of two words a token would be read in one piece right after
// it was written in two, which stalls.
struct Token {
    const char* begin = nullptr;
    uint32_t size = 0;
    TokenKind kind = TokenKind::End;
    char delimiter = '\0';  // of a Delimiter the byte itself

    std::string_view text() const { return {begin, size}; }
    bool Is(char byte) const { return delimiter == byte && kind == TokenKind::Delimiter; }
};

class Scanner {
  public:
    // A zero byte must follow the text: it belongs to no kind of bytes, and ends every run of them.
    explicit Scanner(std::string_view text) : at_(text.data()), end_(text.data() + text.size()) {}

    // Each byte is looked at a bounded number of times, whatever the text. The token is written where it is
    // used: handing it back by value costs more than finding it.
    void Next(Token& out);
    // The next one that is no white space.
    void NextBeyondSpace(Token& out);
    uint64_t count() const { return count_; }

  private:
    char Peek(size_t offset = 0) const {
        return offset < static_cast<size_t>(end_ - at_) ? at_[offset] : '\0';
    }
    const char* SkipName(const char* from) const;
    const char* SkipNameWithEscapes(const char* from) const;
    const char* SkipEscape(const char* backslash) const;
    bool StartsIdent(const char* from) const;
    bool Matches(std::string_view lowerCase) const;
    bool SkipComment();
    bool FindStringEnd(const char* quote, const char*& end) const;

    void Take(TokenKind kind, const char* end, Token& out) {
        out.kind = kind;
        out.delimiter = '\0';
        out.begin = at_;
        out.size = static_cast<uint32_t>(end - at_);
        at_ = end;
    }
    void TakeDelimiter(Token& out) {
        const char byte = *at_;
        Take(TokenKind::Delimiter, at_ + 1, out);
        out.delimiter = byte;
    }
    void TakeIdent(Token& out);
    void TakeNumber(Token& out);
    void TakeUri(Token& out);
    void TakeAtWord(Token& out);
    void TakeImportant(Token& out);
    void TakePunctuation(Token& out);
    void TakeSpecial(Token& out);

    const char* at_;
    const char* end_;
    uint64_t count_ = 0;
};

}  // namespace qorvex::css
