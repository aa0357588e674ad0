#include "core/url/url.h"

#include <gtest/gtest.h>

#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

class URLTest : public testing::Test {
  protected:
    test::ScopedLibraryState state_;
};

TEST_F(URLTest, CleansBeforeItParses) {
    EXPECT_EQ(URL("http://a/b c%20d").GetText().view(), "http://a/b%20c%20d");
    EXPECT_EQ(URL("http://a/\nb\tc").GetText().view(), "http://a/bc");
    EXPECT_EQ(URL("http://a/{|}\xC3\xA9").GetText().view(), "http://a/%7B%7C%7D%C3%A9");
    EXPECT_FALSE(URL("http://a/%zz").IsValid());
    EXPECT_TRUE(URL("").IsEmpty());
    EXPECT_TRUE(URL("blob:x").IsBlob());
    EXPECT_FALSE(URL("blob:").IsBlob());
}

TEST_F(URLTest, OriginLeavesOutTheDefaultPortAlone) {
    EXPECT_EQ(URL("http://host:80/x").GetOriginLikePart(true).view(), "http://host");
    EXPECT_EQ(URL("http://host:8080/x").GetOriginLikePart(true).view(), "http://host:8080");
    EXPECT_EQ(URL("game://host:80/x").GetOriginLikePart(true).view(), "game://host:80");
    EXPECT_EQ(URL("https://[::1]:443/").GetOriginLikePart(false).view(), "[::1]");
    EXPECT_TRUE(URL("file:///x").GetOriginLikePart(true).empty());
    EXPECT_EQ(URL("http://host").GetPath().view(), "/");
}

TEST_F(URLTest, MergesAsTheStandardSays) {
    // RFC 3986, 5.4.
    const URL base("http://a/b/c/d;p?q");
    const char* cases[][2] = {
        {"g", "http://a/b/c/g"},   {"./g", "http://a/b/c/g"},    {"/g", "http://a/g"},
        {"//g", "http://g"},       {"?y", "http://a/b/c/d;p?y"}, {"#s", "http://a/b/c/d;p?q#s"},
        {"../../g", "http://a/g"}, {"../../../g", "http://a/g"}, {"game://x", "game://x"}};
    for (const auto& [relative, merged] : cases) {
        EXPECT_EQ(URL(relative).Merge(base).GetText().view(), merged) << relative;
    }
    EXPECT_EQ(URL("style.css").Merge(URL("file:///a%20b/index.html")).GetText().view(),
              "file:///a%20b/style.css");
    EXPECT_FALSE(URL().Merge(base).IsValid());
}

TEST_F(URLTest, ReplacesOnePart) {
    const URL url("http://user@host:81/Path/x?q=1#f");
    const std::pair<URLPart, const char*> cases[] = {{URLPart::Protocol, "https://user@host:81/Path/x?q=1#f"},
                                                     {URLPart::Host, "http://user@v/Path/x?q=1#f"},
                                                     {URLPart::Hostname, "http://user@v:81/Path/x?q=1#f"},
                                                     {URLPart::Pathname, "http://user@host:81/v?q=1#f"},
                                                     {URLPart::Search, "http://user@host:81/Path/x?v#f"},
                                                     {URLPart::Hash, "http://user@host:81/Path/x?q=1#v"}};
    for (const auto& [part, expected] : cases) {
        EXPECT_EQ(url.SetPart(part == URLPart::Protocol ? "https" : "v", part).GetText().view(), expected);
    }
    EXPECT_EQ(url.SetPart("90", URLPart::Port).GetPort(), "90");
    EXPECT_TRUE(url.SetPart("", URLPart::Hash).GetFragment().empty());
    EXPECT_EQ(URL("file:///a/b").SetPart("c", URLPart::Search).GetText().view(), "file:///a/b?c");
}

TEST_F(URLTest, ComparesWithoutCaseAndSharesBodies) {
    const URL a("http://HOST/x");
    const URL copy = a;
    EXPECT_EQ(copy, URL("http://host/X"));
    EXPECT_FALSE(URL("::") == URL("::"));
    EXPECT_EQ(&copy.GetText(), &a.GetText());
}

}  // namespace
}  // namespace qorvex
