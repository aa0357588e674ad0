// Where tokens begin and end.
#include "css/parser/scanner.h"

#include <string>

#include "support/scoped_library_state.h"

namespace qorvex::css {
namespace {

// Letters of the kinds, one per token, and the texts between bars.
std::string Scan(std::string_view text) {
    static const char* const kKinds[] = {
        "end", "_",   "<!--",  "-->",  "~=",   "|=",    "^=",  "$=",      "*=",  "and", "not", "only",
        "str", "bad", "id",    "--id", "hash", "class", "imp", "pag",     "med", "chs", "key", "fnt",
        "::",  "!",   "num+u", "dim",  "%",    "num",   "uri", "bad-uri", "fn",  "c"};
    const std::string ended(text);  // a zero byte behind it
    Scanner scanner(ended);
    std::string out;
    Token token;
    for (scanner.Next(token); token.kind != TokenKind::End; scanner.Next(token)) {
        if (!out.empty()) out += ' ';
        out += kKinds[static_cast<int>(token.kind)];
        if (token.kind != TokenKind::Space) out += "<" + std::string(token.text()) + ">";
    }
    return out;
}

TEST(ScannerTest, TakesTheLongestMatch) {
    static const struct {
        const char* text;
        const char* expected;
    } kCases[] = {
        {"1px-2px", "dim<1px-2px>"},
        {"1px -2px+.5EM", "num+u<1px> _ num+u<-2px> num+u<+.5EM>"},
        {"1. .5. 1.5.2", "num<1> c<.> _ num<.5> c<.> _ num<1.5> num<.2>"},
        {"1e3 1e 5%", "dim<1e3> _ dim<1e> _ %<5%>"},
        {"1--x", "num<1> --id<--x>"},
        {"-foo _foo -- --1 -->", "id<-foo> _ id<_foo> _ c<-> c<-> _ --id<--1> _ --><-->>"},
        {"and ANDY not( only", "and<and> _ id<ANDY> _ fn<not(> _ only<only>"},
        {"#1a #", "hash<#1a> _ c<#>"},
        {".a.-b .1 .", "class<.a> class<.-b> _ num<.1> _ c<.>"},
        {"a\\{b \\66oo \\", "id<a\\{b> _ id<\\66oo> _ c<\\>"},
        {"\xC3\xA9t\xC3\xA9", "id<\xC3\xA9t\xC3\xA9>"},
        {"'a\\'b' \"x\ny", "str<'a\\'b'> _ bad<\"x> _ id<y>"},
        {"'abc\\", "bad<'abc\\>"},
        {"url( 'a b' ) URL(a.png?x) url(a b) url(",
         "uri<url( 'a b' )> _ uri<URL(a.png?x)> _ bad-uri<url(a > id<b> "
         "c<)> _ bad-uri<url(>"},
        {"url(http://x//y)//z\nq", "uri<url(http://x//y)> _ id<q>"},
        {"a/*x*/b/*c", "id<a> id<b>"},
        {"a / b", "id<a> _ c</> _ id<b>"},
        {"! /*x*/ IMPORTANT !x", "!<! /*x*/ IMPORTANT> _ c<!> id<x>"},
        {"@Media @-webkit-keyframes @charset \"x\"",
         "med<@Media> _ c<@> id<-webkit-keyframes> _ chs<@charset > "
         "str<\"x\">"},
        {"~= |= ^= $= *= * :: :<!--",
         "~=<~=> _ |=<|=> _ ^=<^=> _ $=<$=> _ *=<*=> _ c<*> _ ::<::> _ c<:> "
         "<!--<<!-->"},
    };
    for (const auto& c : kCases)
        EXPECT_EQ(Scan(c.text), c.expected) << c.text;
}

TEST(ScannerTest, TakesBytesThatAreNoText) {
    EXPECT_EQ(Scan(std::string_view("a\0\x01", 3)), std::string("id<a> c<") + '\0' + "> c<\x01>");
    EXPECT_EQ(Scan("\xFF\xFE{"), "id<\xFF\xFE> c<{>");
}

}  // namespace
}  // namespace qorvex::css
