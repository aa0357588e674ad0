#include "css/parser/scanner.h"

#include <array>

#include "css/values/text_reader.h"

namespace qorvex::css {

namespace {

enum CharClass : uint8_t { kNameByte = 1, kNameStart = 2, kDigit = 4, kSpace = 8, kUrlByte = 16 };

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

bool IsUnit(std::string_view text) {
    static constexpr std::string_view kUnits[] = {"px", "em",   "rem",  "s",    "ms", "deg", "vw",
                                                  "vh", "vmin", "vmax", "in",   "pt", "ex",  "cm",
                                                  "mm", "pc",   "rad",  "grad", "hz", "khz"};
    for (std::string_view unit : kUnits)
        if (EqualsIgnoreCase(unit, text)) return true;
    return false;
}

}  // namespace

// A backslash escapes the next byte unless that ends the line; a number of up to six hexadecimal digits takes
// one space with it. The end of the text escapes nothing.
const char* Scanner::SkipEscape(const char* backslash) const {
    const char* next = backslash + 1;
    if (next == end_ || IsLineEnd(*next)) return backslash;
    auto isHex = [](char c) { return IsDigit(c) || (ToLower(c) >= 'a' && ToLower(c) <= 'f'); };
    if (!isHex(*next)) return next + 1;
    for (int digits = 0; digits < 6 && next != end_ && isHex(*next); ++digits)
        ++next;
    if (next != end_ && Has(*next, kSpace)) ++next;
    return next;
}

const char* Scanner::SkipName(const char* from) const {
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
    if (from != end_ && *from == '-') ++from;
    if (from == end_) return false;
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

Token Scanner::Take(TokenKind kind, const char* end) {
    Token token{kind, {at_, static_cast<size_t>(end - at_)}};
    at_ = end;
    return token;
}

Token Scanner::TakeIdent() {
    const char* end = SkipName(at_);
    std::string_view text(at_, static_cast<size_t>(end - at_));
    if (end != end_ && *end == '(') {
        if (EqualsIgnoreCase(text, "url")) return TakeUri();
        return Take(TokenKind::Function, end + 1);
    }
    TokenKind kind = TokenKind::Ident;
    if (text.size() == 3 || text.size() == 4) {
        if (EqualsIgnoreCase(text, "and")) kind = TokenKind::And;
        if (EqualsIgnoreCase(text, "not")) kind = TokenKind::Not;
        if (EqualsIgnoreCase(text, "only")) kind = TokenKind::Only;
    }
    return Take(kind, end);
}

// url( spaces, a string or unquoted bytes, spaces, ). What was looked at is part of the token, closed or not.
Token Scanner::TakeUri() {
    const char* end = at_ + 4;
    while (end != end_ && Has(*end, kSpace))
        ++end;
    if (end != end_ && (*end == '"' || *end == '\'')) {
        if (!FindStringEnd(end, end)) return Take(TokenKind::BadUri, end);
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
    if (end == end_ || *end != ')') return Take(TokenKind::BadUri, end);
    return Take(TokenKind::Uri, end + 1);
}

Token Scanner::TakeNumber() {
    const char* end = at_ + (*at_ == '+' || *at_ == '-' ? 1 : 0);
    while (end != end_ && Has(*end, kDigit))
        ++end;
    if (end_ - end > 1 && *end == '.' && Has(end[1], kDigit)) {
        ++end;
        while (end != end_ && Has(*end, kDigit))
            ++end;
    }
    if (end != end_ && *end == '%') return Take(TokenKind::Percentage, end + 1);
    if (!StartsIdent(end)) return Take(TokenKind::Number, end);
    const char* unit = end;
    end = SkipName(end);
    bool known = IsUnit({unit, static_cast<size_t>(end - unit)});
    return Take(known ? TokenKind::Numeric : TokenKind::Dimension, end);
}

Token Scanner::TakeAtWord() {
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
        if (Matches(word.text)) return Take(word.kind, at_ + word.text.size());
    return Take(TokenKind::Delimiter, at_ + 1);
}

// "!", white space and comments, "important"; otherwise only the "!" is taken.
Token Scanner::TakeImportant() {
    const char* start = at_++;
    for (;;) {
        if (at_ != end_ && Has(*at_, kSpace))
            ++at_;
        else if (Peek() != '/' || !SkipComment())
            break;
    }
    bool matches = Matches("important");
    const char* end = matches ? at_ + 9 : start + 1;
    at_ = start;
    return Take(matches ? TokenKind::Important : TokenKind::Delimiter, end);
}

Token Scanner::TakeDelimiter() {
    if (Peek(1) == '=') {
        switch (*at_) {
            case '~':
                return Take(TokenKind::Includes, at_ + 2);
            case '|':
                return Take(TokenKind::DashMatch, at_ + 2);
            case '^':
                return Take(TokenKind::PrefixMatch, at_ + 2);
            case '$':
                return Take(TokenKind::SuffixMatch, at_ + 2);
            case '*':
                return Take(TokenKind::SubstrMatch, at_ + 2);
        }
    }
    if (*at_ == ':' && Peek(1) == ':') return Take(TokenKind::DoubleColon, at_ + 2);
    return Take(TokenKind::Delimiter, at_ + 1);
}

Token Scanner::Next() {
    while (at_ != end_ && *at_ == '/' && SkipComment()) {
    }
    if (at_ == end_) return {TokenKind::End, {end_, 0}};
    ++count_;
    const char c = *at_;
    if (Has(c, kSpace)) {
        const char* end = at_ + 1;
        while (end != end_ && Has(*end, kSpace))
            ++end;
        return Take(TokenKind::Space, end);
    }
    if (Has(c, kNameStart)) return TakeIdent();
    if (Has(c, kDigit)) return TakeNumber();
    const char next = Peek(1);
    switch (c) {
        case '.':
            if (Has(next, kDigit)) return TakeNumber();
            if (StartsIdent(at_ + 1)) return Take(TokenKind::Class, SkipName(at_ + 1));
            break;
        case '+':
        case '-':
            if (Has(next, kDigit) || (next == '.' && Has(Peek(2), kDigit))) return TakeNumber();
            if (c == '+') break;
            if (StartsIdent(at_)) return TakeIdent();
            if (Matches("-->")) return Take(TokenKind::Cdc, at_ + 3);
            if (next == '-' && SkipName(at_ + 2) != at_ + 2)
                return Take(TokenKind::CustomIdent, SkipName(at_ + 2));
            break;
        case '\\':
            if (StartsIdent(at_)) return TakeIdent();
            break;
        case '#':
            if (SkipName(at_ + 1) != at_ + 1) return Take(TokenKind::Hash, SkipName(at_ + 1));
            break;
        case '"':
        case '\'': {
            const char* end;
            bool closed = FindStringEnd(at_, end);
            return Take(closed ? TokenKind::String : TokenKind::BadString, end);
        }
        case '@':
            return TakeAtWord();
        case '!':
            return TakeImportant();
        case '<':
            if (Matches("<!--")) return Take(TokenKind::Cdo, at_ + 4);
            break;
        default:
            break;
    }
    return TakeDelimiter();
}

}  // namespace qorvex::css
