// The complex path: directions, clusters, fonts by unit, positions of characters. The client's manager is a
// table of runs, so that the order on the line is the engine's own work.
#include <fresco/rendering_library.h>
#include <gtest/gtest.h>
#include <qorvex/text_services.h>

#include <cmath>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "layout/fonts/memory_stream.h"
#include "layout/text/complex_ranges.h"
#include "layout/text/direction_runs.h"
#include "layout/text/text_layout.h"
#include "layout/text/text_positions.h"
#include "support/scoped_library_state.h"

namespace qorvex::layout {
namespace {

constexpr char kSans[] = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";

// Hebrew and Arabic letters run from right to left, all else from left to right.
class TableManager final : public IInternationalizationManager {
  public:
    TextDirection ComputeBaseDirection(const char* utf8, unsigned length) override {
        return length > 0 && IsBackward(utf8[0]) ? TextDirection::RightToLeft : TextDirection::LeftToRight;
    }
    void ComputeTextDirection(const char* utf8, unsigned length, i18n::TextDirectionResult* result) override {
        for (unsigned first = 0; first < length;) {
            unsigned end = first + 1;
            while (end < length && (IsInside(utf8[end]) || utf8[end] == ' ' ||
                                    IsBackward(utf8[end]) == IsBackward(utf8[first])))
                ++end;
            result->AddRun(first, end - first, IsBackward(utf8[first]) ? 1 : 0);
            first = end;
        }
        // What no client should say must do no harm.
        result->AddRun(length, 5, 1);
        result->AddRun(0xFFFFFFF0u, 0xFFFFFFFFu, 7);
    }

  private:
    // By the first byte of a character.
    static bool IsBackward(char byte) { return byte >= '\xD6' && byte <= '\xDB'; }
    static bool IsInside(char byte) { return (byte & 0xC0) == 0x80; }
};

class ComplexTextTest : public testing::Test {
  protected:
    ComplexTextTest() : library_(fresco::CreateNullRenderingLibrary({})) {
        std::ifstream file(kSans, std::ios::binary);
        bytes_.assign(std::istreambuf_iterator<char>(file), {});
        MemoryStream stream(reinterpret_cast<const unsigned char*>(bytes_.data()), bytes_.size());
        font_ = library_->GetFontService()->LoadFace(&stream, 0, fresco::SdfMode::Never);
        style_.typefaces.push_back(font_);
    }
    ~ComplexTextTest() override { library_->Destroy(); }
    void SetUp() override {
        if (font_ == fresco::kNoId) GTEST_SKIP() << "no DejaVu on this machine";
    }

    TextInfo Lay(std::string_view text, float width = NAN) {
        TextInfo info;
        EXPECT_TRUE(CalculateTextRunsAndGlyphsForComplexText(
            {text, style_, width, NAN, *library_->GetFontService(), nullptr, &manager_}, info));
        return info;
    }
    // First characters of the runs of a line, from left to right, backward ones with a minus.
    static std::string Order(const TextInfo& info, size_t line = 0) {
        std::string order;
        for (uint32_t i = 0; i < info.lines[line].runCount; ++i) {
            const TextRun& run = info.runs[info.lines[line].firstRun + i];
            order += (run.rightToLeft ? "-" : "+") + std::to_string(run.firstCharacter) + " ";
        }
        return order;
    }

    test::ScopedLibraryState state_;
    fresco::IRenderingLibrary* library_;
    fresco::FontId font_ = fresco::kNoId;
    std::string bytes_;
    TableManager manager_;
    TextStyle style_;
};

TEST(ComplexRanges, WhatNeedsTheComplexPath) {
    const auto needs = [](std::initializer_list<uint32_t> codes) {
        return NeedsComplexText(codes.begin(), codes.size());
    };
    EXPECT_FALSE(needs({'a', '9', 0xE9, 0x2E4}));
    EXPECT_FALSE(needs({0x3042, 0x4E00, 0xAC00, 0x1F600}));
    EXPECT_TRUE(needs({'e', 0x301}));
    EXPECT_TRUE(needs({0x627}));
    EXPECT_TRUE(needs({0x5D0}));
    EXPECT_TRUE(needs({0x915}));
    EXPECT_TRUE(needs({0x1F1E6}));
    EXPECT_TRUE(needs({0x1F900, 0x200D}));
    EXPECT_FALSE(needs({0x1F600, 0x200D}));
}

TEST(ComplexRanges, VisualOrderOfNestedLevels) {
    struct Item {
        char name;
        uint8_t level;
    };
    const auto order = [](std::vector<Item> items) {
        ReorderVisually(items.data(), items.size());
        std::string names;
        for (const Item& item : items)
            names += item.name;
        return names;
    };
    EXPECT_EQ(order({{'a', 0}, {'B', 1}, {'C', 1}, {'d', 0}}), "aCBd");
    EXPECT_EQ(order({{'A', 1}, {'b', 2}, {'c', 2}, {'D', 1}}), "DbcA");
    EXPECT_EQ(order({{'a', 0}, {'B', 1}, {'c', 2}, {'D', 3}, {'e', 2}}), "acDeB");
    EXPECT_EQ(order({}), "");
}

TEST_F(ComplexTextTest, RunsStandInVisualOrderOnEachLine) {
    // Read: "ab ", Hebrew "אב גד", "cd".
    const TextInfo one = Lay("ab אב גד cd");
    EXPECT_EQ(Order(one), "+0 -3 +9 ");
    // The last Hebrew letter is the leftmost glyph of its run.
    const TextRun& hebrew = one.runs[1];
    EXPECT_EQ(one.clusters[hebrew.firstGlyph], hebrew.endCharacter - 1);
    EXPECT_EQ(one.clusters[hebrew.firstGlyph + hebrew.glyphCount - 1], hebrew.firstCharacter);
    float end = 0;
    for (const TextRun& run : one.runs) {
        EXPECT_NEAR(run.x, end, 0.01f);
        end = run.x + run.width;
    }
    EXPECT_NEAR(end, one.width, 0.01f);
    // Broken in the middle, each line orders what it shows.
    const TextInfo two = Lay("אב גד אב", one.width * 0.4f);
    EXPECT_GE(two.lines.size(), 2u);
    EXPECT_EQ(Order(two, 1).substr(0, 1), "-");
}

TEST_F(ComplexTextTest, EqualsThePlainPathWhereNothingIsShaped) {
    style_.letterSpacing = 1;
    const char* text = "one two three four";
    TextInfo plain;
    ASSERT_TRUE(LayoutText({text, style_, 90, NAN, *library_->GetFontService()}, plain));
    const TextInfo complex = Lay(text, 90);
    ASSERT_EQ(plain.lines.size(), complex.lines.size());
    // The shaper may kern, so glyphs are compared and places are not.
    ASSERT_EQ(plain.glyphs.size(), complex.glyphs.size());
    for (size_t i = 0; i < plain.glyphs.size(); ++i)
        EXPECT_EQ(plain.glyphs[i].index, complex.glyphs[i].index);
    EXPECT_FLOAT_EQ(plain.height, complex.height);
}

TEST_F(ComplexTextTest, ClustersAreNotCut) {
    style_.overflowWrap = css::OverflowWrapMode::Anywhere;
    // Lam and alef make one glyph; e and its accent too, or one over the other.
    for (const TextInfo& info : {Lay("لالالالا", 12), Lay("e\u0301e\u0301e\u0301e\u0301", 8)}) {
        EXPECT_GT(info.lines.size(), 1u);
        for (const TextLineInfo& line : info.lines) {
            EXPECT_EQ(line.firstCharacter % 2, 0u);
            EXPECT_GT(line.endCharacter, line.firstCharacter);
        }
    }
}

TEST_F(ComplexTextTest, PositionsOfCharacters) {
    const std::string text = "ab אב";
    const TextInfo info = Lay(text);
    TextPositions positions;
    ComputeTextPositions(info, text, style_.whiteSpace, nullptr, positions);
    ASSERT_EQ(positions.x.size(), 6u);
    EXPECT_EQ(positions.OffsetOf(3), 3u);
    EXPECT_EQ(positions.OffsetOf(4), 5u);
    EXPECT_FLOAT_EQ(positions.x[0], 0);
    EXPECT_GT(positions.x[1], 0);
    // Reading the first Hebrew letter begins at the right end of the line.
    EXPECT_NEAR(positions.x[3], info.width, 0.01f);
    EXPECT_LT(positions.x[4], positions.x[3]);
    ASSERT_EQ(positions.lines.size(), 1u);
    EXPECT_FLOAT_EQ(positions.lines[0].height, info.height);
}

TEST_F(ComplexTextTest, EllipsisStandsWhereReadingEnds) {
    style_.whiteSpace = css::WhiteSpaceMode::NoWrap;
    style_.overflow = css::TextOverflowMode::Ellipsis;
    const TextInfo forward = Lay("ab אבגד אבגד", 60);
    EXPECT_GT(forward.lines[0].ellipsis.x, 30);
    const TextInfo backward = Lay("אבגד אבגד אבגד", 60);
    EXPECT_NE(backward.lines[0].ellipsis.font, css::kNoTypeface);
    EXPECT_FLOAT_EQ(backward.lines[0].ellipsis.x, 0);
    EXPECT_LE(backward.width, 60);
}

TEST_F(ComplexTextTest, HostileTextIsBounded) {
    std::string marks, controls, scripts, mixed, lines, word;
    for (int i = 0; i < 100000; ++i)
        marks += "\u0301";
    const std::string onLetter = "a" + marks;
    for (int i = 0; i < 200; ++i)
        controls += "\u202E\u2067a";
    for (uint32_t code = 0x80; code < 0x30000; code += 7) {
        if (code >= 0xD800 && code < 0xE000) continue;
        if (code < 0x800) {
            scripts += {static_cast<char>(0xC0 | code >> 6), static_cast<char>(0x80 | (code & 63))};
        } else if (code < 0x10000) {
            scripts += {static_cast<char>(0xE0 | code >> 12), static_cast<char>(0x80 | (code >> 6 & 63)),
                        static_cast<char>(0x80 | (code & 63))};
        } else {
            scripts += {static_cast<char>(0xF0 | code >> 18), static_cast<char>(0x80 | (code >> 12 & 63)),
                        static_cast<char>(0x80 | (code >> 6 & 63)), static_cast<char>(0x80 | (code & 63))};
        }
    }
    for (int i = 0; i < 60000; ++i)
        mixed += "a אب ";
    for (int i = 0; i < 100000; ++i)
        lines += "ا\n";
    // Long enough without a place to break that a square of it would show.
    for (int i = 0; i < 500000; ++i)
        word += "ب";
    for (const std::string& text : {marks, onLetter, controls, scripts, mixed, word,
                                    std::string("\xED\xA0\x80\xED\xBF\xBF\u0301"), std::string("\u0301")}) {
        const TextInfo info = Lay(text, 200);
        EXPECT_TRUE(std::isfinite(info.width) && std::isfinite(info.height));
        for (const fresco::Glyph& glyph : info.glyphs)
            ASSERT_TRUE(std::isfinite(glyph.x) && std::isfinite(glyph.y));
    }
    style_.whiteSpace = css::WhiteSpaceMode::Pre;
    EXPECT_EQ(Lay(lines, 200).lines.size(), 100001u);
    for (const float size : {0.0f, -4.0f, 1e9f, INFINITY, NAN}) {
        style_.fontSize = style_.usedSize = size;
        const TextInfo info = Lay("سلام", 200);
        EXPECT_FALSE(std::isnan(info.width));
        EXPECT_FALSE(std::isnan(info.height));
    }
}

}  // namespace
}  // namespace qorvex::layout
