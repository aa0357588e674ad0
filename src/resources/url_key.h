// URLs as keys of tables. Two URLs are the same when their texts agree without regard to ASCII case, which is
// how URL compares them; a key is the text in lower case.
#pragma once

#include <string_view>

#include "core/memory/containers.h"
#include "core/url/url.h"

namespace qorvex {

using UrlKey = TaggedString<MemoryTag::Resources>;

inline char ToLowerASCII(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

inline bool EqualsIgnoringCase(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (size_t i = 0; i < a.size(); ++i)
        if (ToLowerASCII(a[i]) != ToLowerASCII(b[i])) return false;
    return true;
}

inline UrlKey MakeUrlKey(const URL& url) {
    UrlKey key(std::string_view(url.GetText()));
    for (char& c : key)
        c = ToLowerASCII(c);
    return key;
}

}  // namespace qorvex
