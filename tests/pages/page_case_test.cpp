// Runs the pages below cases/ through the public interfaces alone: a game loads each one and asks for
// computed styles. A directive is told in page_case.h; adding a case is adding a file.
#include "pages/page_case.h"

#include <gtest/gtest.h>
#include <qorvex/debug_interface.h>

#include <algorithm>
#include <filesystem>
#include <map>

#include "core/frame/client.h"
#include "support/image_files.h"

namespace qorvex::pages {
namespace {

namespace fs = std::filesystem;
using Style = std::vector<std::pair<std::string, std::string>>;

constexpr const char* kFolder = "coui://case/";

class CaseRunner {
  public:
    explicit CaseRunner(const PageCase& page) : page_(page), client_(MakeOptions(page)) {
        debug_ = static_cast<IDebugInterface*>(client_.library->GetFeatureInterface(kDebugFeature));
        debug_->SetConsoleCallback(
            [](void* out, const ConsoleMessage& message) {
                static_cast<std::string*>(out)->assign(message.Text, message.Length);
            },
            &console_);
    }

    static bool IsDirective(const std::string& word) { return Handlers().count(word) > 0; }

    void Run() {
        for (const auto& [name, text] : page_.files)
            client_.files.Put(kFolder + name, text);
        client_.files.Put("any.png", test::Png(test::Plain(4, 4, 0xFF808080)));
        client_.Load(page_.html, std::string(kFolder) + "index.html");
        size_t checks = 0;
        for (const Directive& directive : page_.directives) {
            SCOPED_TRACE("line " + std::to_string(directive.line) + ": " + directive.name + " " +
                         directive.text);
            (this->*Handlers().at(directive.name))(directive.text);
            ++checks;
        }
        EXPECT_GT(checks, 0u) << "a case without expectations";
        CheckLog();
    }

  private:
    using Handler = void (CaseRunner::*)(const std::string&);

    static client::Options MakeOptions(const PageCase& page) {
        client::Options options;
        options.width = page.width;
        options.height = page.height;
        options.complex_selectors = page.complexSelectors;
        return options;
    }

    static const std::map<std::string, Handler>& Handlers() {
        static const std::map<std::string, Handler> kHandlers = {
            {"expect", &CaseRunner::Expect},    {"same", &CaseRunner::Same},
            {"feed", &CaseRunner::Feed},        {"none", &CaseRunner::None},
            {"box", &CaseRunner::Box},          {"pixel", &CaseRunner::Pixel},
            {"js", &CaseRunner::Evaluate},      {"script", &CaseRunner::Script},
            {"resize", &CaseRunner::Resize},    {"log", &CaseRunner::NoteLog},
            {"nolog", &CaseRunner::NoLog},      {"wait", &CaseRunner::Wait},
            {"requests", &CaseRunner::Requests}};
        return kHandlers;
    }

    Style Computed(const std::string& selector) {
        Style style;
        const auto add = [](void* out, const char* name, const char* value) {
            static_cast<Style*>(out)->emplace_back(name, value);
        };
        debug_->VisitComputedStyle(client_.view, selector.c_str(), add, &style);
        return style;
    }

    void Expect(const std::string& text) {
        const auto [selector, block] = SplitAt(text, '{');
        ASSERT_TRUE(block.ends_with('}'));
        const Style style = Computed(selector);
        ASSERT_FALSE(style.empty()) << "nothing matches";
        for (std::string rest = block.substr(0, block.size() - 1); !Trim(rest).empty();) {
            const auto [declaration, more] = SplitAt(rest, ';');
            const std::pair<std::string, std::string> wanted = SplitAt(declaration, ':');
            const auto found = std::find_if(style.begin(), style.end(),
                                            [&](const auto& e) { return e.first == wanted.first; });
            if (found == style.end())
                ADD_FAILURE() << "no longhand " << wanted.first;
            else
                EXPECT_EQ(found->second, wanted.second) << wanted.first;
            rest = more;
        }
    }

    void Same(const std::string& text) {
        const auto [first, second] = SplitAt(text, '|');
        ASSERT_FALSE(Computed(first).empty());
        ExpectAlike(Computed(first), Computed(second));
    }

    static void ExpectAlike(const Style& a, const Style& b) {
        ASSERT_EQ(a.size(), b.size());
        for (size_t i = 0; i < a.size(); ++i)
            EXPECT_EQ(a[i].second, b[i].second) << a[i].first;
    }

    void Feed(const std::string& selector) {
        const Style style = Computed(selector);
        ASSERT_FALSE(style.empty()) << "nothing matches";
        std::string script = "{const from = document.querySelector('" + selector +
                             "'), to = document.createElement(from.nodeName);"
                             "to.id = 'fed'; from.parentNode.appendChild(to);";
        for (const auto& [name, value] : style) {
            if (value.empty()) continue;  // the empty text cannot be declared
            std::string quoted;
            for (const char c : value)
                quoted += c == '\\' || c == '\'' ? std::string("\\") + c : std::string(1, c);
            script += "to.style.setProperty('" + name + "', '" + quoted + "');";
        }
        Script(script + "}");
        ExpectAlike(style, Computed("#fed"));
        Script("{const fed = document.getElementById('fed'); fed.parentNode.removeChild(fed)}");
    }

    void None(const std::string& selector) {
        debug_->VisitComputedStyle(
            client_.view, selector.c_str(),
            [](void*, const char* name, const char*) {
                if (std::string(name) == "display") ADD_FAILURE() << "an element matches";
            },
            nullptr);
    }

    void Box(const std::string& text) {
        const auto [id, wanted] = SplitAt(text, '|');
        boxes_.clear();
        debug_->VisitElementBoxes(
            client_.view,
            [](void* out, const ElementBox& box) {
                char numbers[96];
                std::snprintf(numbers, sizeof numbers, "%g %g %g %g", double{box.X}, double{box.Y},
                              double{box.Width}, double{box.Height});
                static_cast<std::map<std::string, std::string>*>(out)->emplace(std::string("#") + box.Id,
                                                                               numbers);
            },
            &boxes_);
        EXPECT_EQ(boxes_[id], wanted);
    }

    void Pixel(const std::string& text) {
        const auto [place, wanted] = SplitAt(text, '|');
        unsigned x = 0, y = 0;
        ASSERT_EQ(std::sscanf(place.c_str(), "%u %u", &x, &y), 2);
        const uint32_t rgba = client_.Pixel(x, y);
        char color[8];
        std::snprintf(color, sizeof color, "%02x%02x%02x", rgba & 255, rgba >> 8 & 255, rgba >> 16 & 255);
        EXPECT_EQ(color, wanted);
    }

    void Evaluate(const std::string& text) {
        const size_t bar = text.rfind(" |");
        ASSERT_NE(bar, std::string::npos);
        console_.clear();
        client_.view->ExecuteScript(("console.log('=' + (" + text.substr(0, bar) + "))").c_str());
        EXPECT_EQ(Trim(console_), "=" + Trim(text.substr(bar + 2)));
    }

    void Script(const std::string& text) {
        client_.view->ExecuteScript(text.c_str());
        client_.Frame();
        client_.Frame();
    }

    void Resize(const std::string& text) {
        unsigned width = 0, height = 0;
        ASSERT_EQ(std::sscanf(text.c_str(), "%ux%u", &width, &height), 2);
        client_.view->Resize(width, height);
        client_.Frame();
        client_.Frame();
    }

    void Wait(const std::string& text) { client_.Frame(std::stod(text)); }

    // How often the page's folder was asked for the file.
    void Requests(const std::string& text) {
        const auto [name, count] = SplitAt(text, '|');
        const std::vector<std::string>& all = client_.files.requests;
        EXPECT_EQ(std::to_string(std::count(all.begin(), all.end(), kFolder + name)), count);
    }

    void NoteLog(const std::string& text) {
        const auto [level, line] = SplitAt(text, ' ');
        expected_.push_back({level, line, false});
    }

    void NoLog(const std::string& text) { EXPECT_FALSE(client_.log.Contains(text)); }

    struct ExpectedLine {
        std::string level;
        std::string text;
        bool seen;

        bool Fits(const std::string& other_level, const std::string& line) const {
            if (level != other_level) return false;
            if (!text.ends_with("...")) return Trim(line) == text;
            return line.starts_with(text.substr(0, text.size() - 3));
        }
    };

    void CheckLog() {
        static constexpr const char* kLevels[] = {"trace", "debug", "info", "warning", "error", "assert"};
        for (const auto& [severity, line] : client_.log.LinesWithSeverity()) {
            // The game of these tests ships no fonts.
            bool told = line == "Unable to load default font name Droid Sans";
            for (ExpectedLine& expected : expected_) {
                if (!expected.Fits(kLevels[severity], line)) continue;
                expected.seen = told = true;
            }
            if (!told && severity >= Logging::Warning) ADD_FAILURE() << kLevels[severity] << ": " << line;
        }
        for (const ExpectedLine& expected : expected_)
            EXPECT_TRUE(expected.seen) << "not logged: " << expected.level << " " << expected.text;
    }

    const PageCase& page_;
    client::Client client_;
    IDebugInterface* debug_;
    std::string console_;
    std::map<std::string, std::string> boxes_;
    std::vector<ExpectedLine> expected_;
};

// One test a folder, so that a run of a single theme is a filter; the folders are known when tests are
// listed.
class PageCases : public testing::TestWithParam<std::string> {};

TEST_P(PageCases, ComputeWhatTheySay) {
    std::vector<fs::path> files;
    for (const auto& entry :
         fs::directory_iterator(fs::path(QORVEX_SOURCE_DIR "/tests/pages/cases") / GetParam()))
        files.push_back(entry.path());
    std::sort(files.begin(), files.end());
    const char* only = std::getenv("QORVEX_CASE");  // a part of a name, to run one page by hand
    for (const fs::path& file : files) {
        if (only && file.string().find(only) == std::string::npos) continue;
        SCOPED_TRACE(file.lexically_relative(QORVEX_SOURCE_DIR).string());
        const PageCase page = ReadPageCase(file.string(), CaseRunner::IsDirective);
        CaseRunner(page).Run();
    }
}

std::vector<std::string> Themes() {
    std::vector<std::string> themes;
    for (const auto& entry : fs::directory_iterator(QORVEX_SOURCE_DIR "/tests/pages/cases"))
        themes.push_back(entry.path().filename().string());
    std::sort(themes.begin(), themes.end());
    return themes;
}

INSTANTIATE_TEST_SUITE_P(Themes, PageCases, testing::ValuesIn(Themes()),
                         [](const auto& info) { return info.param; });

}  // namespace
}  // namespace qorvex::pages
