// The client's text services against the conformance data of Unicode, and against bad input.
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

#include "host/icu_text_services.h"
#include "host/json_localization.h"

namespace {

using namespace qorvex;
using i18n::BreakIteratorBoundary;

// Where Debian's package unicode-data puts it.
const std::string kData = "/usr/share/unicode/";

void AppendUtf8(uint32_t code, std::string& out) {
    if (code < 0x80) {
        out += static_cast<char>(code);
        return;
    }
    const int more = code < 0x800 ? 1 : code < 0x10000 ? 2 : 3;
    constexpr uint8_t kLead[] = {0, 0xC0, 0xE0, 0xF0};
    out += static_cast<char>(kLead[more] | code >> (6 * more));
    for (int i = more - 1; i >= 0; --i)
        out += static_cast<char>(0x80 | (code >> (6 * i) & 0x3F));
}

struct Text {
    std::string utf8;
    std::vector<size_t> starts;  // of each code point
    void Add(uint32_t code) {
        starts.push_back(utf8.size());
        AppendUtf8(code, utf8);
    }
};

std::vector<std::string> Words(const std::string& line) {
    std::vector<std::string> words;
    for (size_t at = 0; at < line.size();) {
        const size_t end = std::min(line.find(' ', at), line.size());
        if (end > at) words.push_back(line.substr(at, end - at));
        at = end + 1;
    }
    return words;
}

struct Runs final : i18n::TextDirectionResult {
    explicit Runs(size_t bytes) : levels(bytes, 0xFF) {}
    void AddRun(unsigned start, unsigned length, unsigned level) override {
        ASSERT_LE(size_t{start} + length, levels.size());
        std::fill_n(levels.begin() + start, length, level);
    }
    std::vector<unsigned> levels;
};

// A direction of the paragraph that a case prescribes becomes a mark in front of the text, which counts as
// the start of the paragraph does.
TEST(TextServices, BidiConformance) {
    std::ifstream file(kData + "BidiCharacterTest.txt");
    if (!file) GTEST_SKIP() << "unicode-data is not installed";
    host::IcuInternationalization service;
    // ICU 72 gives an isolate that follows the end of an override the level of the embedding before it.
    constexpr int kLibraryFaults = 31;
    int cases = 0, wrong = 0;
    for (std::string line; std::getline(file, line);) {
        if (line.empty() || line[0] == '#') continue;
        std::vector<std::string> fields;
        for (size_t at = 0; at <= line.size();) {
            const size_t end = std::min(line.find(';', at), line.size());
            fields.push_back(line.substr(at, end - at));
            at = end + 1;
        }
        if (fields.size() < 4) continue;
        constexpr uint32_t kLeftToRightMark = 0x200E, kRightToLeftMark = 0x200F;
        Text text;
        const size_t mark = fields[1] == "2" ? 0 : 1;
        if (mark) text.Add(fields[1] == "0" ? kLeftToRightMark : kRightToLeftMark);
        for (const std::string& code : Words(fields[0]))
            text.Add(static_cast<uint32_t>(std::stoul(code, nullptr, 16)));
        // A paragraph separator begins a new one, which the data does not mean.
        if (fields[0].find("2029") != std::string::npos) continue;
        Runs runs(text.utf8.size());
        service.ComputeTextDirection(text.utf8.data(), static_cast<unsigned>(text.utf8.size()), &runs);
        const std::vector<std::string> levels = Words(fields[3]);
        ++cases;
        for (size_t i = 0; i < levels.size(); ++i) {
            // "x": the character takes no part.
            if (levels[i] == "x" || runs.levels[text.starts[i + mark]] == std::stoul(levels[i])) continue;
            ++wrong;
            if (wrong > kLibraryFaults) ADD_FAILURE() << line;
            break;
        }
    }
    EXPECT_GT(cases, 10000);
    EXPECT_LE(wrong, kLibraryFaults);
}

struct BreakCase {
    const char* file;
    BreakIteratorBoundary boundary;
    // Cases in which ICU follows rules of its own, as the standard allows: a colon ends words; a full stop
    // and the number behind it stay together.
    int tailored;
};

class BreakConformance : public testing::TestWithParam<BreakCase> {};

TEST_P(BreakConformance, BoundariesAreThoseOfTheData) {
    std::ifstream file(kData + "auxiliary/" + GetParam().file);
    if (!file) GTEST_SKIP() << "unicode-data is not installed";
    host::IcuInternationalization service;
    i18n::IBreakIterator* iterator = service.CreateBreakIterator(GetParam().boundary);
    int cases = 0, wrong = 0;
    for (std::string line; std::getline(file, line);) {
        const std::string data = line.substr(0, line.find('#'));
        if (data.find_first_not_of(" \t") == std::string::npos) continue;
        Text text;
        std::vector<int> expected;
        for (const std::string& word : Words(data.substr(0, data.find('\t')))) {
            if (word == "÷")
                expected.push_back(static_cast<int>(text.utf8.size()));
            else if (word != "×")
                text.Add(static_cast<uint32_t>(std::stoul(word, nullptr, 16)));
        }
        if (!expected.empty() && expected[0] == 0) expected.erase(expected.begin());
        iterator->SetText(text.utf8.data(), static_cast<unsigned>(text.utf8.size()));
        std::vector<int> found;
        for (int at = iterator->MoveToNext(); at != i18n::kBreakIteratorDone; at = iterator->MoveToNext())
            found.push_back(at);
        ++cases;
        wrong += found != expected;
        if (found != expected && wrong > GetParam().tailored) ADD_FAILURE() << line;
        // Asking from inside finds the same boundaries and moves nothing.
        iterator->ResetToBeginning();
        for (size_t i = 0; found == expected && i < expected.size(); ++i)
            EXPECT_EQ(iterator->GetBoundaryAfter(expected[i] - 1), expected[i]) << line;
        EXPECT_EQ(iterator->GetCurrentPosition(), 0);
        iterator->ClearText();
    }
    iterator->Destroy();
    EXPECT_GT(cases, 500);
    std::printf("%s: %d cases, %d tailored\n", GetParam().file, cases, wrong);
}

INSTANTIATE_TEST_SUITE_P(Unicode, BreakConformance,
                         testing::Values(BreakCase{"GraphemeBreakTest.txt", BreakIteratorBoundary::Character,
                                                   0},
                                         BreakCase{"WordBreakTest.txt", BreakIteratorBoundary::Word, 15},
                                         BreakCase{"LineBreakTest.txt", BreakIteratorBoundary::Line, 22}));

TEST(TextServices, BreakIteratorMovesBothWaysAndEnds) {
    i18n::IBreakIterator* iterator;
    {
        // It outlives the service.
        host::IcuInternationalization service;
        iterator = service.CreateBreakIterator(BreakIteratorBoundary::Word);
    }
    EXPECT_EQ(iterator->MoveToNext(), i18n::kBreakIteratorDone);  // no text yet
    const std::string text = "ab cd";
    iterator->Restart(text.data(), 5);
    EXPECT_EQ(iterator->MoveToNext(), 2);
    EXPECT_EQ(iterator->MoveToCandidateAfter(3), 5);
    EXPECT_EQ(iterator->MoveToNext(), i18n::kBreakIteratorDone);
    EXPECT_EQ(iterator->GetCurrentPosition(), 5);
    EXPECT_EQ(iterator->MoveToPrevious(), 3);
    iterator->ResetToEnd();
    EXPECT_EQ(iterator->GetCurrentPosition(), 5);
    iterator->ResetToBeginning();
    EXPECT_EQ(iterator->MoveToPrevious(), i18n::kBreakIteratorDone);
    EXPECT_EQ(iterator->GetBoundaryAfter(99), i18n::kBreakIteratorDone);
    iterator->Destroy();
}

TEST(TextServices, DirectionOfTextsAndBadUtf8) {
    host::IcuInternationalization service;
    const auto base = [&](const std::string& text) {
        return service.ComputeBaseDirection(text.data(), static_cast<unsigned>(text.size()));
    };
    EXPECT_EQ(base("12 abc שלום"), TextDirection::LeftToRight);
    EXPECT_EQ(base("12 שלום abc"), TextDirection::RightToLeft);
    EXPECT_EQ(base(""), TextDirection::LeftToRight);
    // Every byte belongs to exactly one run, whatever the bytes are; nesting beyond the limit is no fault.
    std::string deep;
    for (int i = 0; i < 200; ++i)
        deep += "\u202Ba\u2067";
    for (const std::string& text :
         {std::string("a\xED\xA0\x80\xFF\xC3"), deep, std::string("\u05D0\0b", 4)}) {
        Runs runs(text.size());
        service.ComputeTextDirection(text.data(), static_cast<unsigned>(text.size()), &runs);
        EXPECT_EQ(std::count(runs.levels.begin(), runs.levels.end(), 0xFFu), 0);
    }
}

// What is plainly backward is answered without the algorithm. A mark behind the text asks the algorithm and
// changes nothing.
TEST(TextServices, PlainlyBackwardTextIsWhatTheAlgorithmSays) {
    constexpr uint32_t kCodes[] = {' ',   '!',   '(',   ')',   '-',   '.',   '/',   0x5D0, 0x5EA, 0x60C,
                                   0x61B, 0x620, 0x640, 0x64A, 0x64B, 0x65F, 0x66E, 0x670, 0x6D3, '7'};
    constexpr uint32_t kMark = 0x200F;
    host::IcuInternationalization services;
    std::mt19937 random(2);
    for (int round = 0; round < 3000; ++round) {
        std::string text;
        // A letter in front, so that the mark does not decide the direction of the paragraph.
        AppendUtf8(0x5D0, text);
        for (uint32_t i = random() % 10; i > 0; --i)
            AppendUtf8(kCodes[random() % std::size(kCodes)], text);
        std::string marked = text;
        AppendUtf8(kMark, marked);
        Runs plain(text.size()), asked(marked.size());
        services.ComputeTextDirection(text.data(), static_cast<unsigned>(text.size()), &plain);
        services.ComputeTextDirection(marked.data(), static_cast<unsigned>(marked.size()), &asked);
        asked.levels.resize(text.size());
        ASSERT_EQ(plain.levels, asked.levels) << text;
    }
}

TEST(TextServices, CaseMapping) {
    host::IcuTextTransformation service;
    const auto map = [&](CaseOperation operation, const std::string& text) {
        std::vector<char> out(text.size() * 4 + 1);
        unsigned length = static_cast<unsigned>(out.size());
        EXPECT_TRUE(service.CaseMapCharacters(operation, text.data(), static_cast<unsigned>(text.size()),
                                              out.data(), &length));
        EXPECT_EQ(out[length], '\0');
        return std::string(out.data(), length);
    };
    EXPECT_EQ(map(CaseOperation::ToUpper, "straße ÿ"), "STRASSE Ÿ");
    EXPECT_EQ(map(CaseOperation::ToLower, "ΌΣΟΣ"), "όσος");
    EXPECT_EQ(map(CaseOperation::Capitalize, "one tWO élan"), "One TWO Élan");
    // A result that does not fit is left to the other form.
    char small[3];
    unsigned length = sizeof(small);
    EXPECT_FALSE(service.CaseMapCharacters(CaseOperation::ToUpper, "abc", 3, small, &length));
    struct Result final : ITransformationResult {
        void Set(const char* utf8, unsigned size) override { text.assign(utf8, size); }
        std::string text;
    } result;
    EXPECT_TRUE(service.CaseMapCharacters(CaseOperation::ToUpper, "abc", 3, &result));
    EXPECT_EQ(result.text, "ABC");
    EXPECT_EQ(map(CaseOperation::ToUpper, "a\xFF").substr(0, 1), "A");
}

TEST(TextServices, TranslationsFromJson) {
    host::JsonLocalization texts;
    std::string error;
    EXPECT_TRUE(
        texts.AddText(R"({"menu": {"start": "Los", "deep": {"x": "y"}}, "quit": "Ende", "n": 3})", error));
    EXPECT_EQ(texts.Count(), 3u);
    EXPECT_STREQ(texts.Translate("menu.start"), "Los");
    EXPECT_STREQ(texts.Translate("menu.deep.x"), "y");
    EXPECT_EQ(texts.Translate("n"), nullptr);
    EXPECT_FALSE(texts.AddText("{\"a\": ", error));
    EXPECT_NE(error.find("at byte"), std::string::npos);
    EXPECT_FALSE(texts.AddText("[1]", error));
    EXPECT_FALSE(texts.AddFile("/nowhere.json", error));
    // Nesting must not need stack.
    std::string nested;
    for (int i = 0; i < 100000; ++i)
        nested += "{\"a\":";
    EXPECT_FALSE(texts.AddText(nested, error));
}

}  // namespace
