// Clients compile the public headers with their own compiler settings, in C++17 as well as C++20.
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <regex>
#include <string>

namespace {

namespace fs = std::filesystem;

const fs::path kRoot = QORVEX_SOURCE_DIR;
const char* const kFolders[] = {"include/qorvex", "fresco/include/fresco"};

// The headers that one source file could include alone, in a file of their own each; one compiler run for
// all.
bool Compiles(const std::string& compiler, const std::string& standard) {
    const fs::path folder = fs::path(testing::TempDir()) / ("headers" + standard);
    fs::create_directories(folder);
    std::string sources;
    for (const char* public_folder : kFolders) {
        const std::string prefix = fs::path(public_folder).filename().string();
        for (const auto& entry : fs::directory_iterator(kRoot / public_folder)) {
            if (entry.path().extension() != ".h") continue;
            const fs::path source = folder / (prefix + "_" + entry.path().stem().string() + ".cpp");
            std::ofstream(source) << "#include <" << prefix << "/" << entry.path().filename().string()
                                  << ">\n";
            sources += " " + source.string();
        }
    }
    const std::string command = compiler + " -std=" + standard +
                                " -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor -Woverloaded-virtual "
                                "-Werror -fsyntax-only -I" +
                                (kRoot / "include").string() + " -I" + (kRoot / "fresco/include").string() +
                                sources;
    return std::system(command.c_str()) == 0;
}

TEST(PublicHeaders, CompileAloneInBothStandardsWithoutAWarning) {
    for (const char* compiler : {"g++", "clang++"}) {
        EXPECT_TRUE(Compiles(compiler, "c++17")) << compiler;
        EXPECT_TRUE(Compiles(compiler, "c++20")) << compiler;
    }
}

// Only each other, and the standard library's, which has no folders and no suffix.
TEST(PublicHeaders, IncludeNoHeaderOfADependency) {
    const std::regex allowed("#include <((qorvex|fresco)/[a-z_0-9]+\\.h|[a-z_0-9]+)>.*");
    for (const char* folder : kFolders) {
        for (const auto& entry : fs::directory_iterator(kRoot / folder)) {
            if (entry.path().extension() != ".h") continue;
            std::ifstream file(entry.path());
            for (std::string line; std::getline(file, line);) {
                if (line.rfind("#include", 0) == 0) {
                    EXPECT_TRUE(std::regex_match(line, allowed)) << entry.path() << ": " << line;
                }
            }
        }
    }
}

}  // namespace
