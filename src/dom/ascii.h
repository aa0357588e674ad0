// ASCII helpers of HTML text: https://infra.spec.whatwg.org/#strings
#pragma once

#include <string_view>

namespace qorvex::dom {

constexpr bool IsAsciiSpace(char c) {
    return c == ' ' || c == '\t' || c == '\n' || c == '\f' || c == '\r';
}
constexpr bool IsAsciiUpper(char c) {
    return c >= 'A' && c <= 'Z';
}
constexpr bool IsAsciiLower(char c) {
    return c >= 'a' && c <= 'z';
}
constexpr bool IsAsciiAlnum(char c) {
    return IsAsciiUpper(c) || IsAsciiLower(c) || (c >= '0' && c <= '9');
}
constexpr char ToAsciiLower(char c) {
    return IsAsciiUpper(c) ? static_cast<char>(c + 32) : c;
}
constexpr char ToAsciiUpper(char c) {
    return IsAsciiLower(c) ? static_cast<char>(c - 32) : c;
}

constexpr bool EqualsIgnoringAsciiCase(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (size_t i = 0; i < a.size(); ++i)
        if (ToAsciiLower(a[i]) != ToAsciiLower(b[i])) return false;
    return true;
}

}  // namespace qorvex::dom
