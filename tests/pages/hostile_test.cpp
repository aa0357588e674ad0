// Pages that mean harm, or were cut and scrambled on the way: a game loads them, goes on, and what was sound
// in them works. Sizes shrink under sanitizers, which take ten times as long.
#include <gtest/gtest.h>
#include <qorvex/debug_interface.h>

#include <map>
#include <random>
#include <sstream>

#include "core/frame/client.h"
#include "support/repeat.h"
#include "support/slow_build.h"

namespace qorvex::pages {
namespace {

using test::Repeat;

constexpr size_t kShrink = test::kSlowBuild ? 10 : 1;

std::string PageWith(const std::string& sheet, const std::string& body) {
    return "<html><head><style>" + sheet + "</style></head><body>" + body + "</body></html>";
}

class HostilePages : public testing::Test {
  protected:
    using Style = std::map<std::string, std::string>;

    void Load(const std::string& html) {
        client_.Load(html, "coui://case/index.html");
        CheckNumbers();
    }

    // Empty when nothing matches.
    Style Computed(const std::string& selector) {
        Style style;
        Debug()->VisitComputedStyle(
            client_.view, selector.c_str(),
            [](void* out, const char* name, const char* value) { (*static_cast<Style*>(out))[name] = value; },
            &style);
        return style;
    }

    // No place of the page may have become a number that is none.
    void CheckNumbers() {
        bool finite = true;
        Debug()->VisitElementBoxes(
            client_.view,
            [](void* out, const ElementBox& box) {
                for (const float side : {box.X, box.Y, box.Width, box.Height})
                    if (!std::isfinite(side)) *static_cast<bool*>(out) = false;
            },
            &finite);
        EXPECT_TRUE(finite);
    }

    // Computed values are CSS text: what is not finite has no text form.
    void CheckFinite(const std::string& selector) {
        for (const auto& [name, value] : Computed(selector)) {
            EXPECT_EQ(value.find("nan"), std::string::npos) << name << ": " << value;
            EXPECT_TRUE(value.find("inf") == std::string::npos || value.find("infinite") != std::string::npos)
                << name << ": " << value;
        }
    }

    IDebugInterface* Debug() {
        return static_cast<IDebugInterface*>(client_.library->GetFeatureInterface(kDebugFeature));
    }

    static client::Options Quiet() {
        client::Options options;
        options.severity = Logging::Warning;
        return options;
    }

    client::Client client_{Quiet()};
};

TEST_F(HostilePages, SheetsOfManyRules) {
    const size_t count = 100000 / kShrink;
    std::string sheet;
    for (size_t i = 0; i < count; ++i) {
        const std::string number = std::to_string(i);
        sheet += ".c" + number + "{width:" + number + "px}";
    }
    const std::string last = std::to_string(count - 1);
    Load(PageWith(sheet, "<p id=a class=c" + last + "></p>"));
    EXPECT_EQ(Computed("#a")["width"], last + "px");

    // The same as media rules of which one in two holds.
    sheet.clear();
    for (size_t i = 0; i < count / 10; ++i)
        sheet += std::string("@media (m") + (i % 2 ? "in" : "ax") +
                 "-width:10px){#a{left:" + std::to_string(i) + "px}}";
    Load(PageWith(sheet, "<p id=a></p>"));
    EXPECT_EQ(Computed("#a")["left"], std::to_string(count / 10 - 1) + "px");
}

TEST_F(HostilePages, VariablesByTheThousand) {
    const size_t count = 100000 / kShrink;
    std::string block, rules;
    for (size_t i = 0; i < count; ++i) {
        const std::string declaration = "--v" + std::to_string(i) + ":" + std::to_string(i) + "px;";
        block += declaration;
        if (i % 4 == 0) rules += "#a{" + declaration + "}";
    }
    Load(PageWith("p{" + block + "}" + rules + "p{width:var(--v" + std::to_string(count - 1) + ")}",
                  "<p id=a></p><p style='" + block + "'></p>"));
    EXPECT_EQ(Computed("#a")["width"], std::to_string(count - 1) + "px");
}

// Rules that look at siblings, for many siblings: none, one and all of them find what they look for.
TEST_F(HostilePages, SiblingsByTheThousand) {
    const size_t count = 60000 / kShrink;
    Load(PageWith("q ~ p{left:1px}#f ~ p{top:2px}p ~ p{width:3px}p + p{height:4px}q + p{left:5px}",
                  "<p id=f></p>" + Repeat("<p></p>", count) + "<p id=a></p>"));
    Style style = Computed("#a");
    EXPECT_EQ(style["left"], "auto");
    EXPECT_EQ(style["top"], "2px");
    EXPECT_EQ(style["width"], "3px");
    EXPECT_EQ(style["height"], "4px");

    std::string sheet;
    for (size_t i = 0; i < 1000 / kShrink; ++i)
        sheet += "q" + std::to_string(i) + " ~ p{left:1px}";
    Load(PageWith(sheet + "p ~ p{width:3px}", Repeat("<p></p>", 2000 / kShrink) + "<p id=a></p>"));
    EXPECT_EQ(Computed("#a")["width"], "3px");
}

TEST_F(HostilePages, SelectorsOf64Kilobytes) {
    const size_t size = 65536;
    const std::string compound = Repeat(".a", size / 2);
    const std::string children = Repeat("div>", size / 4) + "p";
    const std::string descendants = Repeat("div ", size / 4) + "p";
    const std::string siblings = Repeat("p+", size / 2) + "p";
    const std::string list = Repeat("i,", size / 2) + "p";
    const std::string attributes = Repeat("[x]", size / 3);
    const std::string name = "." + std::string(size, 'n');
    const std::string body =
        Repeat("<div>", 30) + "<p></p><p></p><p id=a class=a x=1></p>" + Repeat("</div>", 30);
    Load(PageWith(compound + "{width:1px}" + children + "{height:1px}" + descendants + "{height:1px}" +
                      siblings + "{height:1px}" + list + "{left:2px}" + attributes + "{top:3px}" + name +
                      "{height:1px}",
                  body));
    Style style = Computed("#a");
    EXPECT_EQ(style["width"], "1px");
    EXPECT_EQ(style["height"], "auto");
    EXPECT_EQ(style["left"], "2px");
    EXPECT_EQ(style["top"], "3px");
    EXPECT_FALSE(Computed(compound).empty());
    EXPECT_TRUE(Computed(children).empty());
}

TEST_F(HostilePages, NestingOfDocuments) {
    for (const char* tag : {"div", "span", "b", "p", "table", "svg", "a", "button", "li"}) {
        const std::string open = std::string("<") + tag + ">";
        SCOPED_TRACE(tag);
        Load(PageWith("* { margin: 1px } #a { width: 5px }",
                      "<p id=a></p>" + Repeat(open, 5000) + "deep<p id=z></p>"));
        EXPECT_EQ(Computed("#a")["width"], "5px");
    }
    client_.view->ExecuteScript(
        "let e = document.body; for (let i = 0; i < 5000; ++i) { const d = document.createElement('div');"
        "e.appendChild(d); e = d } e.id = 'bottom'; e.style.width = '7px'");
    client_.Frame();
    client_.Frame();
    EXPECT_EQ(Computed("#bottom")["width"], "7px");
    client_.view->ExecuteScript("document.body.innerHTML = ''");
    client_.Frame();
}

TEST_F(HostilePages, NestingOfValues) {
    const size_t levels = 5000;
    const std::string sum = Repeat("(", levels - 2) + "1px" + Repeat(")", levels - 2);
    const std::string calcs = Repeat("calc(", levels / 2) + "1px" + Repeat("+1px)", levels / 2);
    std::string chain = "#c{";
    for (size_t i = 0; i < levels; ++i)
        chain += "--v" + std::to_string(i) + ":var(--v" + std::to_string(i + 1) + ");";
    chain += "--v" + std::to_string(levels) + ":9px;width:var(--v0)}";
    const std::string fields = Repeat("a(", levels) + Repeat(")", levels);
    Load(PageWith("#a{width:calc" + sum + ";height:4px}#b{width:" + calcs + ";height:4px}" + chain +
                      "#d{width:" + fields + ";transform:" + fields + ";background:" + sum + ";filter:blur" +
                      sum + ";height:4px}#e{width:" + Repeat("(", levels * 2) + ";height:5px}#f{width:4px}",
                  "<p id=a></p><p id=b></p><p id=c></p><p id=d></p><p id=f style='width:" +
                      Repeat("calc(", levels) + "'></p>"));
    EXPECT_EQ(Computed("#a")["width"], "1px");
    EXPECT_EQ(Computed("#b")["width"], std::to_string(levels / 2 + 1) + "px");
    EXPECT_EQ(Computed("#c")["width"], "9px");
    EXPECT_EQ(Computed("#d")["height"], "4px");
}

// Every longhand with each of these texts, from a sheet and from script.
TEST_F(HostilePages, NumbersWithoutMeasure) {
    const std::string digits(400, '9');
    const std::string numbers[] = {"1e999",
                                   digits,
                                   "-" + digits,
                                   "0." + digits,
                                   digits + "." + digits,
                                   "." + std::string(400, '0') + "1",
                                   "1e-999",
                                   "3e38",
                                   "340282350000000000000000000000000000000",
                                   "-0",
                                   "+.5",
                                   "2147483648",
                                   "-2147483649",
                                   "NaN",
                                   "Infinity"};
    std::vector<std::string> names;
    Load(PageWith("", "<p id=a></p>"));
    for (const auto& [name, value] : Computed("#a"))
        names.push_back(name);
    ASSERT_EQ(names.size(), 118u);
    std::string sheet, script = "const s = document.getElementById('a').style;";
    for (const std::string& number : numbers) {
        for (const char* form :
             {"%", "%px", "%%", "%em", "%vmax", "%deg", "%s", "%ms", "rgb(%,%,%)", "calc(% * %px)",
              "translate(%px,%em)", "scale(%)", "matrix(%,%,%,%,%,%)", "blur(%px)", "%px %px %px red",
              "circle(%px)", "linear-gradient(%deg,red %px,blue)", "cubic-bezier(0,%,1,%)", "steps(%)"}) {
            std::string value;
            for (const char c : std::string_view(form)) {
                if (c == '%' && value.ends_with(number) && std::string_view(form) == "%%") {
                    value += '%';
                } else if (c == '%') {
                    value += number;
                } else {
                    value += c;
                }
            }
            script += "for (const name of names) s.setProperty(name, '" + value + "');\n";
            for (const std::string& name : names)
                if (sheet.size() < (2u << 20) / kShrink) sheet += "#a{" + name + ":" + value + "}";
        }
    }
    std::string list = "const names = [";
    for (const std::string& name : names)
        list += "'" + name + "',";
    Load(PageWith(sheet, "<p id=a>text</p><div id=b><p>text</p></div>"));
    CheckFinite("#a");
    client_.view->ExecuteScript((list + "];" + script).c_str());
    client_.Frame();
    client_.Frame();
    CheckNumbers();
}

TEST_F(HostilePages, BytesThatAreNoText) {
    const std::string nul(1, '\0');
    const std::string wrong = "\xFF\xFE\x80\xC0\xAF\xED\xA0\x80\xF5\x80\x80\x80\xE2\x82";
    Load("<html><head><style>#a{width:1px;qor-composition-id:\"" + wrong + "\";} .\xFF\xC3{left:2px} " + nul +
         "#b{width:2px}</style><style>#c{width:3px}#d{--x" + wrong + ":4px;width:var(--x" + wrong +
         ")}</style></head><body " + wrong + "=1 " + nul + "x=2><p id=a " + nul +
         "></p><p id=c class='\xFF\xC3" + nul + "' data-" + wrong + "=7 style='top:5px" + nul +
         ";left:6px'>" + wrong + nul + "</p><p id=d></p>" + nul + "</body></html>");
    EXPECT_EQ(Computed("#a")["width"], "1px");
    EXPECT_EQ(Computed("#c")["width"], "3px");
    EXPECT_EQ(Computed("#d")["width"], "4px");
    std::mt19937 random(1);
    for (int i = 0; i < 30; ++i) {
        std::string bytes(2000, ' ');
        for (char& c : bytes)
            c = static_cast<char>(random() >> 8);
        Load(bytes);
        Load(PageWith(bytes, "<p style='" + bytes.substr(0, 300) + "'>" + bytes));
    }
}

const std::string kWholePage =
    "<!DOCTYPE html><html lang=en><head><title>t</title><link rel=stylesheet href=x.css media='(min-width: "
    "1px)'><style>"
    "@charset \"x\"; #a, .b > p:hover [c|=\"d\" i] + * { margin: 1px 2%; color: rgba(1, 2, 3, .5) "
    "!important; --x: var(--y);"
    "background: url('a.png') no-repeat 1px / cover, linear-gradient(45deg, red 1px, blue) } @media "
    "(orientation: landscape) and"
    " (max-width: 5em) { q::selection { color: red } } @keyframes k { from, 50% { top: calc(1px + 2vw) } to "
    "{ top: 3px } }"
    "@font-face { font-family: f; src: url(f.ttf) } /* c */ // d\n</style><script>var x = "
    "'<p>';</script></head><body class='a "
    "b'><!-- c --><p id=a style=\"width: calc(1px * 3); transform: rotate(3deg) scale(2)\">text &amp; &#65; "
    "&eacute;<br>more"
    "</p><svg><path d='M0 0'/></svg><table><tr><td>1</table><input value=\"v\"><div data-l10n-id=k "
    "onclick=\"x()\">z</div></body>"
    "</html>";

TEST_F(HostilePages, PagesCutAnywhere) {
    for (size_t length = 0; length <= kWholePage.size(); length += kShrink > 1 ? 17 : 3)
        Load(kWholePage.substr(0, length));
    Load(kWholePage);
    EXPECT_EQ(Computed("#a")["width"], "3px");
}

// Pieces of pages in any order: nothing is asked of them but that the game goes on.
TEST_F(HostilePages, PiecesInAnyOrder) {
    std::istringstream list(
        "{|}|(|)|[|]|;|:|,|\"|'|/*|*/|<!--|-->|@media|@keyframes k|@font-face|from|50%|#a|.b|"
        "*|p|>|+|~|::selection|:hover|[x=y]|width|color|margin|flex|transform|background|font|"
        "animation|mask|border-image|--x|var(--x)|calc(|1px|2em|3%|-4|.5|red|rgb(1,2,3)|"
        "url(a.png)|linear-gradient(red,blue)|!important|inherit|initial|auto|none|and|"
        "(min-width:1px)| |\n|//|\\|\xC3\xA9|translate(1px)|blur(1px)|polygon(0 0,1px 1px)|"
        "ease|1s");
    std::vector<std::string> pieces;
    for (std::string piece; std::getline(list, piece, '|');)
        pieces.push_back(piece);
    std::mt19937 random(7);
    for (size_t round = 0; round < 300 / kShrink; ++round) {
        SCOPED_TRACE("round " + std::to_string(round));
        std::string sheet, text;
        for (int i = 0; i < 400; ++i)
            sheet += pieces[random() % pieces.size()] + (random() % 3 ? " " : "");
        for (int i = 0; i < 40; ++i)
            text += pieces[random() % pieces.size()] + " ";
        for (size_t at = text.find('"'); at != std::string::npos; at = text.find('"'))
            text[at] = ' ';
        Load(PageWith(sheet, "<p id=a class=b style=\"" + text + "\">t<b>u</b></p>"));
        EXPECT_EQ(Computed("#a").size(), 118u);
    }
}

}  // namespace
}  // namespace qorvex::pages
