#include "qsl/string.h"

#include <gtest/gtest.h>

#include <cstring>
#include <random>
#include <string>

#include "qsl/city_hash.h"

namespace qsl {
namespace {

TEST(String, AgreesWithAReferenceUnderRandomWork) {
    std::mt19937 random(3);
    string text;
    std::string reference;
    for (int step = 0; step < 20000; ++step) {
        const std::string piece(random() % 12, static_cast<char>('a' + random() % 26));
        const size_t at = random() % (reference.size() + 1);
        const size_t count = random() % 20;
        switch (random() % 9) {
            case 0:
                text += piece, reference += piece;
                break;
            case 1:
                text.insert(at, piece), reference.insert(at, piece);
                break;
            case 2:
                text.erase(at, count), reference.erase(at, count);
                break;
            case 3:
                text.replace(at, count, piece), reference.replace(at, count, piece);
                break;
            case 4:
                text.push_back('x'), reference.push_back('x');
                break;
            case 5:
                text = piece, reference = piece;
                break;
            case 6:
                text.resize(at), reference.resize(at);
                break;
            case 7:
                text.shrink_to_fit();
                break;
            default: {
                string copy = text;
                string moved = std::move(text);
                EXPECT_TRUE(text.empty());
                text = std::move(copy);
                EXPECT_EQ(moved, text);
            }
        }
        ASSERT_EQ(text.view(), reference);
        ASSERT_EQ(std::strlen(text.c_str()), reference.size());
    }
}

TEST(String, KeepsShortTextsInside) {
    EXPECT_EQ(sizeof(string), 24u);
    string text(22, 'a');
    EXPECT_TRUE(text.is_short());
    EXPECT_EQ(reinterpret_cast<const unsigned char*>(&text)[0] & 1, 1);
    text.push_back('b');
    EXPECT_FALSE(text.is_short());
    EXPECT_EQ(reinterpret_cast<const unsigned char*>(&text)[0] & 1, 0);
    EXPECT_EQ(text.size(), 23u);
}

TEST(String, TakesPartsOfItself) {
    string text("0123456789");
    for (int i = 0; i < 5; ++i)
        text.append(text.view());
    EXPECT_EQ(text.size(), 320u);
    text.insert(1, text.view().substr(2, 3));
    EXPECT_TRUE(text.starts_with("023412"));
    text.assign(text.view().substr(1, 4));
    EXPECT_EQ(text, "2341");
}

TEST(CityHash, KnowsTheEmptyTextAndSeparatesLengths) {
    EXPECT_EQ(CityHash64(""), 0x9ae16a3b2f90404fULL);
    EXPECT_EQ(CityHash64("abc"), 2640714258260161385ULL);  // as published
    const std::string text(200, 'q');
    for (size_t a = 1; a < text.size(); ++a)
        EXPECT_NE(CityHash64({text.data(), a}), CityHash64({text.data(), a - 1}));
}

}  // namespace
}  // namespace qsl
