#include "css/values/text_reader.h"

#include <algorithm>

namespace qorvex::css {

namespace {

bool EndsInBackslash(std::string_view text) {
    const size_t last = text.find_last_not_of('\\');
    return (text.size() - (last == std::string_view::npos ? 0 : last + 1)) % 2 != 0;
}

// Where the escape ends that starts at `backslash`; a number takes the space behind it.
size_t EndOfEscape(std::string_view text, size_t backslash) {
    size_t end = backslash + 1;
    if (end == text.size()) return end;
    if (!IsHexDigit(text[end])) return end + 1;
    while (end < text.size() && end <= backslash + 6 && IsHexDigit(text[end]))
        ++end;
    return end < text.size() && IsSpace(text[end]) ? end + 1 : end;
}

}  // namespace

std::string_view Trim(std::string_view text) {
    while (!text.empty() && IsSpace(text.front()))
        text.remove_prefix(1);
    size_t size = text.size();
    while (size > 0 && IsSpace(text[size - 1]))
        --size;
    // An escaped space is a letter of what it ends.
    if (size < text.size() && EndsInBackslash(text.substr(0, size))) ++size;
    return text.substr(0, size);
}

bool EqualsIgnoreCase(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (size_t i = 0; i < a.size(); ++i)
        if (ToLower(a[i]) != ToLower(b[i])) return false;
    return true;
}

bool StartsWithIgnoreCase(std::string_view text, std::string_view prefix) {
    return text.size() >= prefix.size() && EqualsIgnoreCase(text.substr(0, prefix.size()), prefix);
}

namespace {

bool IsNameByte(char c) {
    return IsDigit(c) || (ToLower(c) >= 'a' && ToLower(c) <= 'z') || c == '-' || c == '_' || c == '\\' ||
           static_cast<unsigned char>(c) >= 128;
}

}  // namespace

bool IsIdentifier(std::string_view word) {
    if (word.empty() || IsDigit(word[0])) return false;
    if (word[0] == '-' && (word.size() == 1 || IsDigit(word[1]))) return false;
    return std::all_of(word.begin(), word.end(), IsNameByte);
}

bool HoldsUnescaped(std::string_view text, char c) {
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] == c) return true;
        if (text[i] == '\\') ++i;
    }
    return false;
}

bool TakeFunction(std::string_view text, std::string_view name, std::string_view& arguments) {
    if (text.size() < name.size() + 2 || text[name.size()] != '(' || text.back() != ')') return false;
    if (!StartsWithIgnoreCase(text, name)) return false;
    arguments = Trim(text.substr(name.size() + 1, text.size() - name.size() - 2));
    return true;
}

namespace {

// Follows parentheses and quotes along a text.
class Nesting {
  public:
    // True while the character, and what precedes it, lies outside of both.
    bool Outside(std::string_view text, size_t& i) {
        char c = text[i];
        if (quote_) {
            if (c == '\\' && i + 1 < text.size())
                ++i;
            else if (c == quote_)
                quote_ = 0;
            return false;
        }
        if (c == '"' || c == '\'') {
            quote_ = c;
            return false;
        }
        if (c == '\\') {
            i = EndOfEscape(text, i) - 1;
            return false;
        }
        if (c == '(') ++depth_;
        if (c == ')' && depth_ > 0) {
            --depth_;
            return false;
        }
        return depth_ == 0;
    }

  private:
    size_t depth_ = 0;
    char quote_ = 0;
};

}  // namespace

bool WordReader::Next(std::string_view& word) {
    while (!rest_.empty() && IsSpace(rest_.front()))
        rest_.remove_prefix(1);
    if (rest_.empty()) return false;
    size_t end = 0;
    if (slashes_ && rest_.front() == '/') {
        end = 1;
    } else {
        Nesting nesting;
        for (; end < rest_.size(); ++end) {
            if (!nesting.Outside(rest_, end)) continue;
            if (IsSpace(rest_[end]) || (slashes_ && rest_[end] == '/')) break;
        }
    }
    word = rest_.substr(0, end);
    rest_.remove_prefix(word.size());
    return true;
}

bool ListReader::Next(std::string_view& item) {
    if (done_) return false;
    Nesting nesting;
    size_t end = 0;
    for (; end < rest_.size(); ++end)
        if (nesting.Outside(rest_, end) && rest_[end] == ',') break;
    item = Trim(rest_.substr(0, end));
    if (end < rest_.size())
        rest_.remove_prefix(end + 1);
    else
        done_ = true;
    return true;
}

}  // namespace qorvex::css
