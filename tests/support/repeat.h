#pragma once

#include <string>
#include <string_view>

namespace qorvex::test {

inline std::string Repeat(std::string_view piece, size_t count) {
    std::string text;
    text.reserve(piece.size() * count);
    for (size_t i = 0; i < count; ++i)
        text += piece;
    return text;
}

}  // namespace qorvex::test
