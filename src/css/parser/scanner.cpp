#include "css/parser/scanner.h"

#include <array>

#include "css/values/text_reader.h"

namespace qorvex::css {

namespace {

enum CharClass : uint8_t {
    kNameByte = 1,
    kNameStart = 2,
    kDigit = 4,
    kSpace = 8,
    kUrlByte = 16,
    kAlone = 32
};

consteval std::array<uint8_t, 256> BuildClasses() {
    std::array<uint8_t, 256> classes{};
    for (int c = 0; c < 256; ++c) {
        bool letter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
        bool digit = c >= '0' && c <= '9';
        bool start = letter || c == '_' || c >= 128;
        uint8_t bits = 0;
        if (start) bits |= kNameStart;
        if (start || digit || c == '-') bits |= kNameByte;
        if (digit) bits |= kDigit;
        if (c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f') bits |= kSpace;
        bool url = c == '!' || (c >= '#' && c <= '&') || (c >= '*' && c <= '~' && c != '\\') || c >= 128;
        if (url) bits |= kUrlByte;
        // Bytes that are a token of their own whatever follows.
        if (c == ';' || c == '{' || c == '}' || c == '(' || c == ')' || c == ',' || c == '>') bits |= kAlone;
        classes[static_cast<size_t>(c)] = bits;
    }
    return classes;
}

constexpr std::array<uint8_t, 256> kClasses = BuildClasses();

bool Has(char c, uint8_t bits) {
    return (kClasses[static_cast<unsigned char>(c)] & bits) != 0;
}

bool IsLineEnd(char c) {
    return c == '\n' || c == '\r' || c == '\f';
}

// Up to four letters in one number, in lower case; no byte of a name but a letter has a lower case here.
constexpr uint32_t PackUnit(std::string_view text) {
    uint32_t packed = 0;
    for (const char c : text)
        packed = packed << 8 | (static_cast<unsigned char>(c) | 0x20);
    return packed;
}

bool IsUnit(std::string_view text) {
    if (text.size() > 4) return false;
    static constexpr uint32_t kUnits[] = {
        PackUnit("px"),  PackUnit("em"),  PackUnit("rem"),  PackUnit("s"),    PackUnit("ms"),
        PackUnit("deg"), PackUnit("vw"),  PackUnit("vh"),   PackUnit("vmin"), PackUnit("vmax"),
        PackUnit("in"),  PackUnit("pt"),  PackUnit("ex"),   PackUnit("cm"),   PackUnit("mm"),
        PackUnit("pc"),  PackUnit("rad"), PackUnit("grad"), PackUnit("hz"),   PackUnit("khz")};
    const uint32_t packed = PackUnit(text);
    for (const uint32_t unit : kUnits)
        if (unit == packed) return true;
    return false;
}

}  // namespace

// A backslash escapes the next byte unless that ends the line; a number of up to six hexadecimal digits takes
// one space with it. The end of the text escapes nothing.
const char* Scanner::SkipEscape(const char* backslash) const {
    const char* next = backslash + 1;
    if (next == end_ || IsLineEnd(*next)) return backslash;
    if (!IsHexDigit(*next)) return next + 1;
    for (int digits = 0; digits < 6 && next != end_ && IsHexDigit(*next); ++digits)
        ++next;
    if (next != end_ && Has(*next, kSpace)) ++next;
    return next;
}

inline const char* Scanner::SkipName(const char* from) const {
    while (Has(*from, kNameByte))
        ++from;
    return *from == '\\' ? SkipNameWithEscapes(from) : from;
}

const char* Scanner::SkipNameWithEscapes(const char* from) const {
    while (from != end_) {
        if (Has(*from, kNameByte)) {
            ++from;
        } else if (*from == '\\') {
            const char* after = SkipEscape(from);
            if (after == from) break;
            from = after;
        } else {
            break;
        }
    }
    return from;
}

bool Scanner::StartsIdent(const char* from) const {
    if (*from == '-') ++from;
    return Has(*from, kNameStart) || (*from == '\\' && SkipEscape(from) != from);
}

bool Scanner::Matches(std::string_view lowerCase) const {
    return StartsWithIgnoreCase({at_, static_cast<size_t>(end_ - at_)}, lowerCase);
}

bool Scanner::SkipComment() {
    if (Peek(1) == '/') {
        while (at_ != end_ && !IsLineEnd(*at_))
            ++at_;
        return true;
    }
    if (Peek(1) != '*') return false;
    std::string_view rest(at_, static_cast<size_t>(end_ - at_));
    size_t close = rest.find("*/", 2);
    at_ = close == std::string_view::npos ? end_ : at_ + close + 2;
    return true;
}

// True with `end` behind the closing quote; false with `end` at the end of the line or text when there is
// none.
bool Scanner::FindStringEnd(const char* quote, const char*& end) const {
    const char mark = *quote;
    for (end = quote + 1; end != end_; ++end) {
        if (*end == mark) {
            ++end;
            return true;
        }
        if (IsLineEnd(*end)) return false;
        if (*end == '\\' && end + 1 != end_) ++end;
    }
    return false;
}

void Scanner::TakeIdent(Token& out) {
    const char* end = SkipName(at_);
    std::string_view text(at_, static_cast<size_t>(end - at_));
    if (*end == '(') {
        if (text.size() == 3 && EqualsIgnoreCase(text, "url")) return TakeUri(out);
        return Take(TokenKind::Function, end + 1, out);
    }
    TokenKind kind = TokenKind::Ident;
    if (text.size() == 3 || text.size() == 4) {
        if ((text[0] | 0x20) == 'a' && EqualsIgnoreCase(text, "and")) kind = TokenKind::And;
        if ((text[0] | 0x20) == 'n' && EqualsIgnoreCase(text, "not")) kind = TokenKind::Not;
        if ((text[0] | 0x20) == 'o' && EqualsIgnoreCase(text, "only")) kind = TokenKind::Only;
    }
    return Take(kind, end, out);
}

// url( spaces, a string or unquoted bytes, spaces, ). What was looked at is part of the token, closed or not.
void Scanner::TakeUri(Token& out) {
    const char* end = at_ + 4;
    while (end != end_ && Has(*end, kSpace))
        ++end;
    if (end != end_ && (*end == '"' || *end == '\'')) {
        if (!FindStringEnd(end, end)) return Take(TokenKind::BadUri, end, out);
    } else {
        while (end != end_) {
            if (Has(*end, kUrlByte)) {
                ++end;
                continue;
            }
            const char* after = *end == '\\' ? SkipEscape(end) : end;
            if (after == end) break;
            end = after;
        }
    }
    while (end != end_ && Has(*end, kSpace))
        ++end;
    if (end == end_ || *end != ')') return Take(TokenKind::BadUri, end, out);
    return Take(TokenKind::Uri, end + 1, out);
}

void Scanner::TakeNumber(Token& out) {
    const char* end = at_ + (*at_ == '+' || *at_ == '-' ? 1 : 0);
    while (Has(*end, kDigit))
        ++end;
    if (*end == '.' && Has(end[1], kDigit)) {
        ++end;
        while (Has(*end, kDigit))
            ++end;
    }
    if (*end == '%') return Take(TokenKind::Percentage, end + 1, out);
    if (!StartsIdent(end)) return Take(TokenKind::Number, end, out);
    const char* unit = end;
    end = SkipName(end);
    bool known = IsUnit({unit, static_cast<size_t>(end - unit)});
    return Take(known ? TokenKind::Numeric : TokenKind::Dimension, end, out);
}

void Scanner::TakeAtWord(Token& out) {
    struct AtWord {
        std::string_view text;
        TokenKind kind;
    };
    static constexpr AtWord kWords[] = {
        {"@import", TokenKind::Import},       {"@page", TokenKind::Page},
        {"@media", TokenKind::Media},         {"@charset ", TokenKind::Charset},
        {"@keyframes", TokenKind::Keyframes}, {"@font-face", TokenKind::FontFace},
    };
    for (const AtWord& word : kWords)
        if (Matches(word.text)) return Take(word.kind, at_ + word.text.size(), out);
    return TakeDelimiter(out);
}

// "!", white space and comments, "important"; otherwise only the "!" is taken.
void Scanner::TakeImportant(Token& out) {
    const char* start = at_++;
    for (;;) {
        if (at_ != end_ && Has(*at_, kSpace))
            ++at_;
        else if (Peek() != '/' || !SkipComment())
            break;
    }
    const char* end = Matches("important") ? at_ + 9 : nullptr;
    at_ = start;
    if (!end) return TakeDelimiter(out);
    Take(TokenKind::Important, end, out);
}

void Scanner::TakePunctuation(Token& out) {
    if (Peek(1) == '=') {
        switch (*at_) {
            case '~':
                return Take(TokenKind::Includes, at_ + 2, out);
            case '|':
                return Take(TokenKind::DashMatch, at_ + 2, out);
            case '^':
                return Take(TokenKind::PrefixMatch, at_ + 2, out);
            case '$':
                return Take(TokenKind::SuffixMatch, at_ + 2, out);
            case '*':
                return Take(TokenKind::SubstrMatch, at_ + 2, out);
        }
    }
    if (*at_ == ':' && Peek(1) == ':') return Take(TokenKind::DoubleColon, at_ + 2, out);
    return TakeDelimiter(out);
}

void Scanner::Next(Token& out) {
    while (*at_ == '/' && SkipComment()) {
    }
    ++count_;
    const char c = *at_;
    if (Has(c, kNameStart)) return TakeIdent(out);
    if (Has(c, kSpace)) {
        const char* end = at_ + 1;
        while (Has(*end, kSpace))
            ++end;
        return Take(TokenKind::Space, end, out);
    }
    if (Has(c, kDigit)) return TakeNumber(out);
    if (Has(c, kAlone)) return TakeDelimiter(out);
    if (c == '\0' && at_ == end_) {
        --count_;
        return Take(TokenKind::End, end_, out);
    }
    TakeSpecial(out);
}

void Scanner::NextBeyondSpace(Token& out) {
    do {
        while (Has(*at_, kSpace))
            ++at_;
        Next(out);
    } while (out.kind == TokenKind::Space);
}

// What starts with a byte that begins several kinds of tokens.
void Scanner::TakeSpecial(Token& out) {
    const char c = *at_;
    const char next = Peek(1);
    switch (c) {
        case '.':
            if (Has(next, kDigit)) return TakeNumber(out);
            if (StartsIdent(at_ + 1)) return Take(TokenKind::Class, SkipName(at_ + 1), out);
            break;
        case '+':
        case '-':
            if (Has(next, kDigit) || (next == '.' && Has(Peek(2), kDigit))) return TakeNumber(out);
            if (c == '+') break;
            if (StartsIdent(at_)) return TakeIdent(out);
            if (Matches("-->")) return Take(TokenKind::Cdc, at_ + 3, out);
            if (next == '-' && SkipName(at_ + 2) != at_ + 2)
                return Take(TokenKind::CustomIdent, SkipName(at_ + 2), out);
            break;
        case '\\':
            if (StartsIdent(at_)) return TakeIdent(out);
            break;
        case '#':
            if (SkipName(at_ + 1) != at_ + 1) return Take(TokenKind::Hash, SkipName(at_ + 1), out);
            break;
        case '"':
        case '\'': {
            const char* end;
            bool closed = FindStringEnd(at_, end);
            return Take(closed ? TokenKind::String : TokenKind::BadString, end, out);
        }
        case '@':
            return TakeAtWord(out);
        case '!':
            return TakeImportant(out);
        case '<':
            if (Matches("<!--")) return Take(TokenKind::Cdo, at_ + 4, out);
            break;
        default:
            break;
    }
    TakePunctuation(out);
}

}  // namespace qorvex::css
