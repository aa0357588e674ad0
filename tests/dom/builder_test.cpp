#include <qorvex/text_services.h>

#include "dom/dom_fixture.h"
#include "dom/html_script_element.h"
#include "dom/node_list.h"
#include "support/repeat.h"

namespace qorvex::dom::test {

using qorvex::test::Repeat;
using qsl::RefPtr;

using BuilderTest = DomTest;

TEST_F(BuilderTest, TreeOfAWholePage) {
    Load("<html lang=en><head><title>t</title></head><body class=b><p>x");
    EXPECT_EQ(Shape(*document_), "#document(html(head(title('t')) body(p('x'))))");
    EXPECT_EQ(document_->GetHtmlElement()->GetAttribute("lang")->view(), "en");
    EXPECT_EQ(
        document_->DumpDOM().view(),
        "Document\n  HTMLHTMLElement\n    HTMLHEADElement\n      HTMLTITLEElement\n        Text [t...]\n"
        "    HTMLBODYElement\n      HTMLPElement\n        Text [x...]\n");
}

TEST_F(BuilderTest, BlockingScriptsRunInOrderBeforeWhatFollows) {
    Load("<script src=1.js></script><p id=p></p><script>inline</script><p id=q></p>");
    ASSERT_EQ(loader_->requests.size(), 1u);
    EXPECT_EQ(loader_->requests[0].what, "file:///1.js");
    EXPECT_EQ(document_->IterateDOMBuilding(), BuildResult::Paused);
    EXPECT_EQ(document_->GetElementById("p"), nullptr);
    loader_->FinishScript(0, "external");
    EXPECT_EQ(document_->IterateDOMBuilding(), BuildResult::Finished);
    EXPECT_EQ(host_->journal, (std::vector<std::string>{"run external", "run inline", "built", "finish"}));
    EXPECT_NE(document_->GetElementById("q"), nullptr);
    EXPECT_TRUE(log_.Contains("Paused DOM building"));
    EXPECT_TRUE(log_.Contains("Resumed DOM building"));
}

TEST_F(BuilderTest, DeferredAndAsyncScriptsDoNotBlock) {
    Load(
        "<script defer src=d1.js></script><script async src=a.js></script><script defer src=d2.js></script>"
        "<script type=module src=m.js></script><script type=text/plain>no</script><p id=p></p>");
    ASSERT_NE(document_->GetElementById("p"), nullptr);
    ASSERT_EQ(loader_->requests.size(), 3u);
    loader_->FinishScript(2, "d2");
    loader_->FinishScript(1, "a");
    loader_->FinishScript(0, "d1");
    EXPECT_FALSE(document_->IsLoadFired());
    EXPECT_EQ(document_->GetReadyState(), "interactive");
    document_->MaybeFinishLoad();
    EXPECT_EQ(host_->journal, (std::vector<std::string>{"built", "run a", "run d1", "run d2", "finish"}));
    EXPECT_EQ(document_->GetReadyState(), "complete");
    document_->MaybeFinishLoad();
    EXPECT_EQ(host_->journal.size(), 5u);
}

TEST_F(BuilderTest, ScriptEvents) {
    LoadEmpty();
    const auto add = [&](const char* type, const char* src, const char* text) {
        RefPtr<Element> script = Make("script");
        for (const char* name : {"load", "error"})
            Listen(*script, name, [this, name](Event&) { host_->journal.push_back(name); });
        if (type) script->SetAttribute("type", type);
        if (src) script->SetAttribute("src", src);
        if (text) script->AppendChild(document_->CreateTextNode(text));
        host_->journal.clear();
        Body().AppendChild(script);
        return script;
    };
    RefPtr<Element> inline_script = add(nullptr, nullptr, "x");
    EXPECT_EQ(host_->journal, (std::vector<std::string>{"run x", "load"}));
    Body().AppendChild(inline_script->CloneNode(true));  // a clone of a script that ran does not run
    EXPECT_EQ(host_->journal.size(), 2u);
    RefPtr<Element> waiting = Make("div");
    waiting->AppendChild(Make("script"))->AppendChild(document_->CreateTextNode("y"));
    host_->journal.clear();
    Body().AppendChild(waiting->CloneNode(true));  // one of a script that did not has its source once
    EXPECT_EQ(host_->journal, (std::vector<std::string>{"run y"}));
    add("module", nullptr, "x");
    EXPECT_EQ(host_->journal, (std::vector<std::string>{"load"}));
    add("text/plain", nullptr, "x");
    EXPECT_TRUE(host_->journal.empty());
    add(nullptr, "gone.js", nullptr);
    loader_->Fail(loader_->requests.size() - 1);
    EXPECT_EQ(host_->journal, (std::vector<std::string>{"error"}));
}

TEST_F(BuilderTest, SheetsHoldTheBuildingUp) {
    Load("<link rel=stylesheet media=screen href=a.css><p id=p></p><style>p{}</style><p id=q></p>");
    ASSERT_EQ(loader_->requests.size(), 1u);
    EXPECT_EQ(document_->GetElementById("p"), nullptr);
    loader_->FinishSheet(0);
    EXPECT_EQ(document_->IterateDOMBuilding(), BuildResult::Paused);
    ASSERT_EQ(loader_->requests.size(), 2u);
    EXPECT_EQ(loader_->requests[1].what, "p{}");
    EXPECT_EQ(style_->sheets, (std::vector<std::string>{"screen"}));
    loader_->FinishSheet(1);
    EXPECT_EQ(document_->IterateDOMBuilding(), BuildResult::Finished);
    EXPECT_EQ(style_->sheets, (std::vector<std::string>{"screen", ""}));
    EXPECT_NE(document_->GetElementById("q"), nullptr);
}

TEST_F(BuilderTest, LinksFollowTheirAttributes) {
    LoadEmpty();
    RefPtr<Element> link = Make("link");
    for (const char* name : {"load", "error"})
        Listen(*link, name, [this, name](Event&) { host_->journal.push_back(name); });
    host_->journal.clear();
    link->SetAttribute("href", "a.css");
    EXPECT_TRUE(loader_->requests.empty());
    link->SetAttribute("rel", "stylesheet");
    link->SetAttribute("type", "text/css");  // one request, not one for each attribute
    ASSERT_EQ(loader_->requests.size(), 1u);
    link->SetAttribute("href", "b.css");
    loader_->FinishSheet(0);  // an answer to an address of the past
    Body().AppendChild(link);
    EXPECT_TRUE(style_->sheets.empty() && host_->journal.empty());
    loader_->FinishSheet(1);
    EXPECT_EQ(style_->sheets.size(), 1u);
    Body().RemoveChild(link.get());
    EXPECT_TRUE(style_->sheets.empty());
    Body().AppendChild(link);
    EXPECT_EQ(style_->sheets.size(), 1u);
    link->SetAttribute("href", "gone.css");
    loader_->FinishSheet(2, false);
    EXPECT_EQ(host_->journal, (std::vector<std::string>{"load", "error"}));
}

TEST_F(BuilderTest, AStyleElementOfScriptIsParsedAtOnce) {
    LoadEmpty();
    RefPtr<Element> style = Make("style");
    style->SetTextContent("p { color: red }");
    Body().AppendChild(style);
    EXPECT_EQ(style_->sheets.size(), 1u);
    EXPECT_EQ(style->GetTextContent().view(), "");
}

TEST_F(BuilderTest, ScriptsChangeThePageThatIsBuilt) {
    host_->on_script = [this](std::string_view source) {
        if (source == "move") document_->GetBodyElement()->AppendChild(RefPtr<Node>(&Find("a")));
        if (source == "remove") document_->GetHtmlElement()->RemoveChild(document_->GetBodyElement());
        if (source == "html") Find("a").SetInnerHTML("<b>in</b><script>no</script>");
    };
    Load("<p id=a></p><script>move</script><script>html</script><p id=b></p>");
    EXPECT_EQ(BodyShape(), "body(script('move') p#a(b('in') script('no')) script('html') p#b)");
    Load("<p id=a></p><script>remove</script><p id=b></p>");
    EXPECT_EQ(Shape(*document_), "#document(html(head))");
    host_->on_script = [this](std::string_view) { document_->Unload(); };
    Load("<script>unload</script><p id=late></p>");
    EXPECT_EQ(document_->GetElementById("late"), nullptr);
}

TEST_F(BuilderTest, InnerHTMLAndItsFamily) {
    Load("<div id=a>old</div>");
    Element& a = Find("a");
    a.SetInnerHTML("<style>x{}</style><p>one</p>two");
    EXPECT_EQ(Shape(a), "div#a(p('one') 'two')");
    a.InsertAdjacentHTML("AfterBegin", "<i></i>");
    a.InsertAdjacentHTML("beforeend", "end");
    a.InsertAdjacentHTML("beforebegin", "<b></b>");
    a.InsertAdjacentHTML("afterend", "<u></u>");
    EXPECT_EQ(BodyShape(), "body(b div#a(i p('one') 'two' 'end') u)");
    a.InsertAdjacentHTML("nowhere", "<u></u>");
    EXPECT_TRUE(log_.Contains("Invalid position provided for InsertAdjacentHTML!"));
    EXPECT_EQ(Body().GetLastElementChild()->InsertAdjacentElement("afterend", Make("p")), nullptr);
    EXPECT_NE(a.InsertAdjacentElement("afterend", Make("p")), nullptr);
    a.SetInnerHTML("");
    EXPECT_EQ(BodyShape(), "body(b div#a p u)");
    document_->Write("<s></s>");
    EXPECT_EQ(Shape(*Body().GetLastChild()), "s");
}

TEST_F(BuilderTest, TranslationsReplaceParsedText) {
    class Translator final : public ILocalizationManager {
      public:
        void Translate(const char* id, ITranslationData* result) override {
            if (std::string_view(id) == "hello") result->Set("Hallo", 5);
            if (std::string_view(id) == "rich") result->Set("<b>x</b>", 8);
        }
        const char* Translate(const char* id) override {
            return std::string_view(id) == "old" ? "alt" : nullptr;
        }
    } translator;
    host_->localization = &translator;
    Load(
        "<p id=a data-l10n-id=hello>text</p><p id=b data-l10n-id=rich>text</p><p id=c "
        "data-l10n-id=none>text</p>"
        "<p id=d data-l10n-id=old></p>");
    EXPECT_EQ(BodyShape(), "body(p#a('Hallo') p#b(b('x')) p#c('text') p#d('alt'))");
    EXPECT_EQ(document_->GetLocalizedElements().size(), 4u);
    {
        const RefPtr<Node> clone = Find("a").CloneNode(true);
        EXPECT_EQ(Shape(*clone), "p#a('Hallo')");
        EXPECT_EQ(document_->GetLocalizedElements().size(), 5u);
    }
    Find("a").RemoveAttribute("data-l10n-id");
    EXPECT_EQ(document_->GetLocalizedElements().size(), 3u);
    DropDocument();
}

TEST_F(BuilderTest, RemotePagesFetchAhead) {
    Load("<script src=/a.js></script><div><link rel=stylesheet type=text/css href=b.css></div>",
         "http://game/ui/page.html");
    ASSERT_GE(loader_->requests.size(), 2u);
    EXPECT_EQ(loader_->requests[0].kind + " " + loader_->requests[0].what, "prefetch http://game/a.js");
    EXPECT_EQ(loader_->requests[1].kind + " " + loader_->requests[1].what,
              "sheet prefetch http://game/ui/b.css");
}

// --- Hostile input

TEST_F(BuilderTest, NestingIsCutAtTheBound) {
    Load(Repeat("<div>", 100000) + "<p id=deep>text</p><script>still runs</script>");
    EXPECT_EQ(log_.Count("HTML nests deeper than 512 levels"), 1u);
    EXPECT_LE(Find("deep").GetDepth(), 512);
    EXPECT_EQ(document_->GetTextContent().view(), "textstill runs");
    EXPECT_EQ(host_->journal.front(), "run still runs");
    const std::string page = Repeat("<b>x<i>", 6000);
    Load(page);
    Load(page + Repeat("<p>a<li>b", 6000));  // closes itself: does not nest
}

TEST_F(BuilderTest, UnclosedFormattingIsBounded) {
    const auto count = [&] { return document_->GetElementsByTagName("b")->GetLength(); };
    std::string page;
    for (int i = 0; i < 1000; ++i)
        page += "<table><tr><td><b class=c" + std::to_string(i) + ">x</table><p>t<ul><li><i>y<li>z</ul>";
    Load(page);
    EXPECT_EQ(log_.Count("HTML leaves too much formatting unclosed"), 0u);
    EXPECT_EQ(count(), 1000u);
    page = "<p>";
    for (int i = 0; i < 1000; ++i)
        page += "<b class=c" + std::to_string(i) + ">";
    Load(page + Repeat("</p><p>t", 10000) + "<script>still runs</script>");
    EXPECT_EQ(log_.Count("HTML leaves too much formatting unclosed"), 1u);
    EXPECT_LT(count(), 200000u);
    std::string text(document_->GetTextContent().view());
    std::erase(text, ' ');
    EXPECT_EQ(text.size(), 10000 + std::string("stillruns").size());
}

TEST_F(BuilderTest, OddBytes) {
    Load(std::string_view("\xEF\xBB\xBF<p id=a>x\0y\xFFz</p>", 21));
    EXPECT_EQ(Find("a").GetTextContent().view(), "xy\xEF\xBF\xBDz");
    Load("");
    EXPECT_EQ(Shape(*document_), "#document(html(head body))");
    Load("<p id=a title='cut");
    EXPECT_EQ(BodyShape(), "body");
    Load(std::string(100000, '<'));
    Load("</p></div><table><p><tr></table></body></html>x");
}

TEST_F(BuilderTest, ManyAttributesAndLongTexts) {
    std::string page = "<p id=a";
    for (int i = 0; i < 5000; ++i)
        page += " a" + std::to_string(i) + "=" + std::to_string(i);
    page += ">" + std::string(10 << 20, 'x') + "</p>";
    Load(page);
    EXPECT_EQ(Find("a").GetAttributeCount(), 5001u);
    EXPECT_EQ(Find("a").GetAttribute("a4999")->view(), "4999");
    EXPECT_EQ(Find("a").GetTextContent().size(), size_t{10} << 20);
}

// The parser compares each attribute of a tag with all before it.
TEST_F(BuilderTest, AttributesBeyondTheBoundAreLeftOut) {
    std::string page = "<p id=before>x</p><p id=a title='a > b'";
    for (int i = 0; i < 60000; ++i)
        page += i % 2 ? " a" + std::to_string(i) + "='" + std::to_string(i) + "'" : " b" + std::to_string(i);
    Load(page + "/>text</p><p id=after>y</p>");
    EXPECT_EQ(log_.Count("HTML has a tag of more than 8192 attributes; the others are left out"), 1u);
    EXPECT_EQ(Find("a").GetAttributeCount(), 8192u);
    EXPECT_EQ(Find("a").GetAttribute("title")->view(), "a > b");
    EXPECT_EQ(Find("a").GetAttribute("a8189")->view(), "8189");
    EXPECT_FALSE(Find("a").HasAttribute("b8190"));
    EXPECT_EQ(document_->GetTextContent().view(), "xtexty");
}

// Tables and formatting elements move what they hold, so that the tree is flat while the source is not.
TEST_F(BuilderTest, SourceThatIsCutIsReportedOnceHoweverTheTreeLooks) {
    Load(Repeat("<b><span><table><div>", 12000) + "<p id=last>text");
    EXPECT_EQ(log_.Count("HTML nests deeper than 512 levels"), 1u);
    EXPECT_EQ(Find("last").GetTextContent().view(), "text");
}

TEST_F(BuilderTest, ParsedPagesAreSharedAndGiveTheirSourceBack) {
    int released = 0;
    const std::string_view page = "<my-page>x</my-page>";
    RefPtr<ParsedHTML> parsed = ParseHTML(page, [&] { ++released; });
    LoadEmpty();
    for (int i = 0; i < 2; ++i) {
        Body().RemoveAllChildren();
        Builder::BuildFragment(parsed, *document_, Body())->Step();
        EXPECT_EQ(BodyShape(), "body(my-page('x'))");
    }
    EXPECT_EQ(released, 0);
    parsed = nullptr;
    EXPECT_EQ(released, 1);
    EXPECT_TRUE(log_.Contains("Parsing HTML with size 20"));
}

}  // namespace qorvex::dom::test
