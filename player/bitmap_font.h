#pragma once

#include <string>
#include <vector>

namespace player {

// A glyph table (BMFont, text form) and the image files that its page lines name, which lie beside it.
struct BitmapFont {
    std::string family;
    std::string table;
    std::vector<std::string> pages;

    // False with one line when a file cannot be read.
    [[nodiscard]] bool Load(const std::string& path, std::string& error);
};

}  // namespace player
