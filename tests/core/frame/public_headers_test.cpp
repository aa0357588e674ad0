// Clients compile the public headers with their own compiler settings, in C++17 as well as C++20.
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>

namespace {

namespace fs = std::filesystem;

const fs::path kRoot = QORVEX_SOURCE_DIR;

// The headers that one source file could include alone, in a file of their own each; one compiler run for
// all.
bool Compiles(const std::string& compiler, const std::string& standard) {
    const fs::path folder = fs::path(testing::TempDir()) / ("headers" + standard);
    fs::create_directories(folder);
    std::string sources;
    for (const auto& entry : fs::directory_iterator(kRoot / "include/qorvex")) {
        if (entry.path().extension() != ".h") continue;
        const fs::path source = folder / (entry.path().stem().string() + ".cpp");
        std::ofstream(source) << "#include <qorvex/" << entry.path().filename().string() << ">\n";
        sources += " " + source.string();
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

TEST(PublicHeaders, IncludeNoHeaderOfADependency) {
    const std::string forbidden[] = {"JavaScriptCore", "yoga", "gumbo", "uriparser",
                                     "ft2build",       "hb.h", "glib"};
    for (const auto& entry : fs::directory_iterator(kRoot / "include/qorvex")) {
        std::ifstream file(entry.path());
        for (std::string line; std::getline(file, line);) {
            if (line.rfind("#include", 0) != 0) continue;
            for (const std::string& name : forbidden)
                EXPECT_EQ(line.find(name), std::string::npos) << entry.path();
        }
    }
}

}  // namespace
