#include "pages/page_case.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <fstream>
#include <sstream>

#include "support/image_files.h"

namespace qorvex::pages {
namespace {

// The lines of a file inside the page, up to "end".
std::string ReadFile(std::istream& lines, int& number) {
    std::string text;
    for (std::string line; std::getline(lines, line);) {
        ++number;
        if (Trim(line) == "end") break;
        text += line + "\n";
    }
    return text;
}

// "NAME WxH RRGGBB", or a delay for each frame instead of the colour.
std::pair<std::string, std::string> ReadPicture(const std::string& line, bool animated) {
    std::istringstream words(line);
    std::string name, size;
    words >> name >> size;
    unsigned width = 0, height = 0;
    EXPECT_EQ(std::sscanf(size.c_str(), "%ux%u", &width, &height), 2) << line;
    if (animated) {
        std::vector<uint32_t> delays;
        for (uint32_t delay; words >> delay;)
            delays.push_back(delay);
        return {name, test::Gif(width, height, delays)};
    }
    uint32_t rgb = 0;
    EXPECT_TRUE(words >> std::hex >> rgb) << line;
    const uint32_t rgba = (rgb >> 16 & 255) | (rgb & 0xFF00) | (rgb & 255) << 16 | 0xFF000000;
    return {name, test::Png(test::Plain(width, height, rgba))};
}

}  // namespace

std::string Trim(const std::string& text) {
    const size_t first = text.find_first_not_of(" \t\r\n");
    return first == std::string::npos ? "" : text.substr(first, text.find_last_not_of(" \t\r\n") - first + 1);
}

std::pair<std::string, std::string> SplitAt(const std::string& text, char separator) {
    size_t at = 0;
    for (char quote = 0; at < text.size() && (quote || text[at] != separator); ++at) {
        if (quote ? text[at] == quote : text[at] == '"') quote = quote ? '\0' : '"';
    }
    if (at == text.size()) return {Trim(text), ""};
    return {Trim(text.substr(0, at)), Trim(text.substr(at + 1))};
}

PageCase ReadPageCase(const std::string& path, bool (*isDirective)(const std::string& word)) {
    PageCase page;
    std::stringstream whole;
    whole << std::ifstream(path, std::ios::binary).rdbuf();
    page.html = whole.str();
    std::istringstream lines(page.html);
    int number = 0;
    EXPECT_TRUE(page.html.starts_with("<!--")) << path;
    for (std::string line; std::getline(lines, line);) {
        ++number;
        if (line.starts_with("<!--")) continue;
        if (line.starts_with("-->")) break;
        EXPECT_EQ(line.find("-->"), std::string::npos) << path << ":" << number << " ends the comment";
        const auto [word, rest] = SplitAt(line, ' ');
        if (word == "file") {
            page.files.emplace_back(rest, ReadFile(lines, number));
        } else if (word == "picture" || word == "animation") {
            page.files.push_back(ReadPicture(rest, word == "animation"));
        } else if (word == "simple") {
            page.complexSelectors = false;
        } else if (word == "view") {
            EXPECT_EQ(std::sscanf(rest.c_str(), "%ux%u", &page.width, &page.height), 2) << line;
        } else if (isDirective(word)) {
            page.directives.push_back({word, rest, number});
        } else {
            // Prose is welcome, a directive with a typing error is not: prose has no braces and bars.
            EXPECT_EQ(line.find_first_of("{|"), std::string::npos) << path << ":" << number << ": " << line;
        }
    }
    return page;
}

}  // namespace qorvex::pages
