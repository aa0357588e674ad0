// Runs the files of cases/: each is a page with a <style> and, in comments, what must come out of it, one a
// line:
//   expect SELECTOR | property | value
//   log TEXT            a line that must be logged
// Adding a case is adding a file or a line.
#include <filesystem>
#include <fstream>
#include <sstream>

#include "css/style/style_fixture.h"

namespace qorvex::css::test {
namespace {

std::string Between(const std::string& text, const std::string& open, const std::string& close) {
    std::string found;
    for (size_t at = text.find(open); at != std::string::npos; at = text.find(open, at)) {
        const size_t start = at + open.size();
        const size_t end = text.find(close, start);
        found += text.substr(start, end - start);
        at = end;
    }
    return found;
}

std::string Trim(const std::string& text) {
    const size_t first = text.find_first_not_of(" \t");
    return first == std::string::npos ? "" : text.substr(first, text.find_last_not_of(" \t") - first + 1);
}

class StyleCases : public StyleTest {
  protected:
    void Run(const std::filesystem::path& path) {
        SCOPED_TRACE(path.filename().string());
        std::stringstream text;
        text << std::ifstream(path).rdbuf();
        const std::string page = text.str();
        log_.Clear();
        Load(Between(page, "<body>", "</body>"), Between(page, "<style>", "</style>"));
        Solve();
        std::istringstream lines(page);
        int count = 0;
        for (std::string line; std::getline(lines, line);) {
            if (line.starts_with("expect ")) {
                Check(line.substr(7));
                ++count;
            } else if (line.starts_with("log ")) {
                EXPECT_TRUE(log_.Contains(line.substr(4))) << line;
                ++count;
            }
        }
        EXPECT_GT(count, 0);
    }

    void Check(const std::string& line) {
        std::istringstream fields(line);
        std::string selector, property, value;
        std::getline(fields, selector, '|');
        std::getline(fields, property, '|');
        std::getline(fields, value);
        const dom::Element* element = engine_->QuerySelector(*document_, Trim(selector));
        ASSERT_TRUE(element) << line;
        EXPECT_EQ(Computed(*element, Trim(property)), Trim(value)) << line;
    }
};

TEST_F(StyleCases, EveryPageComputesWhatItsCommentsSay) {
    for (const auto& entry : std::filesystem::directory_iterator(QORVEX_SOURCE_DIR "/tests/css/style/cases"))
        Run(entry.path());
}

}  // namespace
}  // namespace qorvex::css::test
