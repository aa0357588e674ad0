#include "css/values/keywords.h"

#include "css/values/text_reader.h"

namespace qorvex::css {

int FindKeyword(std::span<const std::string_view> words, std::string_view text) {
    for (size_t i = 0; i < words.size(); ++i)
        if (EqualsIgnoreCase(words[i], text)) return static_cast<int>(i);
    return -1;
}

}  // namespace qorvex::css
