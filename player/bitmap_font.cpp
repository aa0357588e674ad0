#include "bitmap_font.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>

namespace player {
namespace {

bool ReadFile(const std::filesystem::path& path, std::string& out, std::string& error) {
    std::ifstream file(path, std::ios::binary);
    if (!file) {
        error = "cannot read " + path.string();
        return false;
    }
    out.assign(std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>());
    return true;
}

// The text in quotes behind `name`; empty when there is none.
std::string Quoted(const std::string& line, const std::string& name) {
    const size_t at = line.find(name + "=\"");
    if (at == std::string::npos) return {};
    const size_t first = at + name.size() + 2;
    return line.substr(first, line.find('"', first) - first);
}

}  // namespace

bool BitmapFont::Load(const std::string& path, std::string& error) {
    if (!ReadFile(path, table, error)) return false;
    std::istringstream lines(table);
    for (std::string line; std::getline(lines, line);) {
        if (line.rfind("info ", 0) == 0) family = Quoted(line, "face");
        if (line.rfind("page ", 0) != 0) continue;
        const std::filesystem::path page = std::filesystem::path(path).parent_path() / Quoted(line, "file");
        if (!ReadFile(page, pages.emplace_back(), error)) return false;
    }
    return true;
}

}  // namespace player
