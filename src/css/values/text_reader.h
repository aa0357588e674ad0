// Cutting of value texts: words, comma lists and function arguments, with parentheses and quotes respected.
// Readers walk the text once, front to back, and allocate nothing.
#pragma once

#include <array>
#include <cstddef>
#include <string_view>

namespace qorvex::css {

constexpr bool IsSpace(char c) {
    return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f';
}
constexpr bool IsDigit(char c) {
    return c >= '0' && c <= '9';
}
constexpr char ToLower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c;
}
constexpr bool IsHexDigit(char c) {
    return IsDigit(c) || (ToLower(c) >= 'a' && ToLower(c) <= 'f');
}

[[nodiscard]] std::string_view Trim(std::string_view text);
[[nodiscard]] bool EqualsIgnoreCase(std::string_view a, std::string_view b);
[[nodiscard]] bool StartsWithIgnoreCase(std::string_view text, std::string_view prefix);

// A name without quotes; escapes count as letters.
[[nodiscard]] bool IsIdentifier(std::string_view word);
// True when the character stands there without a backslash before it.
[[nodiscard]] bool HoldsUnescaped(std::string_view text, char c);
// The quotes that a text which was in quotes can be put into again; escapes in it are kept as written.
[[nodiscard]] inline char QuoteFor(std::string_view text) {
    return HoldsUnescaped(text, '"') ? '\'' : '"';
}

// For text "name(arguments)" with that name: the arguments, trimmed. Case is ignored.
[[nodiscard]] bool TakeFunction(std::string_view text, std::string_view name, std::string_view& arguments);

// Words between white space outside parentheses and quotes.
class WordReader {
  public:
    // With `slashes` a "/" outside parentheses is a word of its own wherever it stands.
    explicit WordReader(std::string_view text, bool slashes = false) : rest_(text), slashes_(slashes) {}
    bool Next(std::string_view& word);
    // What has not been read.
    std::string_view rest() const { return rest_; }

  private:
    std::string_view rest_;
    bool slashes_;
};

// Items between commas outside parentheses and quotes, trimmed; an item may be empty. The empty text is one
// empty item.
class ListReader {
  public:
    explicit ListReader(std::string_view text) : rest_(text) {}
    bool Next(std::string_view& item);

  private:
    std::string_view rest_;
    bool done_ = false;
};

// Up to N words; count is N + 1 when there are more.
template <size_t N>
struct Words {
    explicit Words(std::string_view text) {
        WordReader reader(text);
        std::string_view word;
        while (count <= N && reader.Next(word)) {
            if (count < N) at[count] = word;
            ++count;
        }
    }
    std::array<std::string_view, N> at;
    size_t count = 0;
};

}  // namespace qorvex::css
