// The rule index as the object model sees it, layout presence, root propagation, fonts,
// transitions.
#include "css/parser/convert.h"
#include "css/style/style_fixture.h"
#include "dom/character_data.h"
#include "layout/dom_tasks.h"
#include "layout/fonts/font_resolver.h"
#include "support/repeat.h"

namespace qorvex::css::test {
namespace {

using qorvex::test::Repeat;

class Engine : public StyleTest {
  protected:
    Ruleset Rule(std::string_view text) { return MakeStylesheet(text, {}, host_->strings)->rules[0]; }
};

TEST_F(Engine, LongSelectorsStayCheap) {
    const std::string tildes = Repeat("b ~ ", 200), depth = Repeat("div ", 200);
    Load(Repeat("<b></b>", 300) + "<i id='i'></i>");
    EXPECT_TRUE(engine_->Matches(Find("i"), tildes + "i"));
    EXPECT_FALSE(engine_->Matches(Find("i"), "u ~ " + tildes + "i"));
    EXPECT_FALSE(engine_->Matches(Find("i"), "u + " + tildes + "i"));
    EXPECT_FALSE(engine_->Matches(Find("i"), depth + "i"));
}

TEST_F(Engine, RulesInsertedInTheMiddleTakeTheirPlaceInTheCascade) {
    Load("<p id='p' class='x'></p>", ".x { width: 1px } p.x { height: 1px } .x { width: 2px }");
    RuleIndex& rules = engine_->GetAuthorRules();
    const CssVector<uint64_t> before = rules.GetAllRuleIds();
    const uint64_t made = rules.InsertRule(Rule(".x { width: 9px; left: 9px }"), before[2]);
    document_->RequestFullStyleSolve();
    EXPECT_EQ(Computed("p", "width"), "2px");
    EXPECT_EQ(Computed("p", "left"), "9px");
    const CssVector<uint64_t> after = rules.GetAllRuleIds();
    EXPECT_EQ(after[2], made);
    EXPECT_EQ(after[3], before[2]);
    EXPECT_TRUE(rules.RemoveRule(before[2]));
    EXPECT_FALSE(rules.RemoveRule(before[2]));
    document_->RequestFullStyleSolve();
    EXPECT_EQ(Computed("p", "width"), "9px");
    // A complex rule that becomes quick is found as one.
    const uint32_t quick = rules.GetQuickRuleCount();
    EXPECT_TRUE(rules.SetSelector(before[1], Rule("#other { width: 0px }").selector));
    EXPECT_EQ(rules.GetQuickRuleCount(), quick + 1);
    document_->RequestFullStyleSolve();
    EXPECT_EQ(Computed("p", "height"), "auto");
}

TEST_F(Engine, SheetsOfManyRulesComeAndGoInOnePass) {
    std::string sheet;
    for (int i = 0; i < 20000; ++i)
        sheet += ".r" + std::to_string(i) + (i % 2 ? " p" : "") + "{width:1px}";
    Load("<p id='p' class='r7'></p><style id='s'></style>");
    AddSheet(sheet, &Find("s"));
    Solve();
    engine_->RemoveStyleSheet(*document_, &Find("s"));
    Solve();
    EXPECT_TRUE(engine_->GetAuthorRules().IsEmpty());
    EXPECT_EQ(engine_->SubtreeInvalidatingRules(), 0u);
}

TEST_F(Engine, AttributesMatterOnlyWhereASelectorAsks) {
    Load("<p id='p'></p>", "[title] { width: 1px } @media (min-width: 1px) { [data-k] { height: 1px } }");
    Solve();
    EXPECT_EQ(Counted([&] {
                  Find("p").SetAttribute("lang", "en");
                  Solve();
              }).elementsMatched,
              0u);
    Find("p").SetAttribute("title", "");
    Find("p").SetAttribute("data-k", "1");
    EXPECT_EQ(Computed("p", "width"), "1px");
    EXPECT_EQ(Computed("p", "height"), "1px");
}

// --- The layout tree follows `display`.

TEST_F(Engine, DisplayNoneLeavesTheLayoutAndComesBackWhole) {
    Load(
        "<div id='top'><p id='in'><i id='deep'>text</i></p><b id='off' style='display: none'><u "
        "id='u'></u></b></div>");
    Solve();
    document_->UpdateLayoutStyles(false);
    EXPECT_TRUE(Find("deep").GetFirstChild()->Is(dom::kInLayoutTree));
    EXPECT_FALSE(Find("off").Is(dom::kInLayoutTree));
    Find("top").SetAttribute("style", "display: none");
    Solve();
    for (const char* id : {"top", "in", "deep"})
        EXPECT_FALSE(Find(id).Is(dom::kInLayoutTree)) << id;
    Find("in").SetAttribute("style", "width: 5px");
    EXPECT_EQ(Computed("in", "width"), "5px");  // solved all the same
    Find("top").SetAttribute("style", "");
    Solve();
    for (const char* id : {"top", "in", "deep"})
        EXPECT_TRUE(Find(id).Is(dom::kInLayoutTree)) << id;
    EXPECT_TRUE(Find("deep").GetFirstChild()->Is(dom::kInLayoutTree));
    EXPECT_FALSE(Find("u").Is(dom::kInLayoutTree));
}

TEST_F(Engine, WhatIsInsertedEntersTheLayoutInTheSameSolve) {
    Load("<div id='top'></div>");
    Solve();
    document_->UpdateLayoutStyles(false);
    qsl::RefPtr<dom::Element> outer = document_->CreateElement("div");
    qsl::RefPtr<dom::Element> inner = document_->CreateElement("p");
    inner->AppendChild(document_->CreateTextNode("x"));
    outer->AppendChild(inner);
    Find("top").AppendChild(outer);
    Solve();
    EXPECT_TRUE(inner->GetFirstChild()->Is(dom::kInLayoutTree));
    EXPECT_EQ(document_->UpdateLayoutStyles(false), layout::LayoutWork::Layout);
}

// --- html and body

TEST_F(Engine, TheCanvasTakesTheOverflowOfBody) {
    Load("", "html { background: transparent } body { background: red } .o { overflow-x: hidden }");
    const dom::Element& html = *document_->GetHtmlElement();
    EXPECT_EQ(Computed(html, "overflow-x"), "visible");
    Body().SetAttribute("class", "o");
    EXPECT_EQ(Computed(html, "overflow-x"), "hidden");
    EXPECT_EQ(Computed(html, "overflow-y"), "auto");
    EXPECT_EQ(Computed(Body(), "overflow-x"), "visible");
    Body().SetAttribute("class", "");
    EXPECT_EQ(Computed(html, "overflow-y"), "visible");
}

// --- Fonts

class CountingFonts final : public layout::IFontResolver {
  public:
    void ResolveTypefaces(const FontFamily& families, FontStyle, uint8_t weight,
                          const layout::NodeLinkPtr& waiter, layout::TypefaceList& out) override {
        ++calls;
        if (!ready) waiters.push_back(waiter);
        for (size_t i = 0; i < families.size(); ++i)
            out.push_back(ready ? weight : kNoTypeface);
        out.push_back(100);
    }
    void AddFontFace(const FontFace&) override { ++faces; }

    int calls = 0;
    int faces = 0;
    bool ready = true;
    std::vector<layout::NodeLinkPtr> waiters;
};

TEST_F(Engine, FamiliesAreResolvedWhereTheyAreDeclared) {
    CountingFonts fonts;
    host_->fonts = &fonts;
    Load("<div id='d' class='f'><p id='p'>text</p></div>",
         ".f { font-family: A, B } .b { font-weight: bold } @font-face { font-family: A; src: url(a.ttf) }");
    EXPECT_EQ(fonts.faces, 1);
    Solve();
    const auto& faces = Find("p").GetFirstChild()->GetLaidOutStyle().text->typefaces;
    ASSERT_EQ(faces.size(), 3u);
    EXPECT_EQ(faces[0], 4u);
    EXPECT_EQ(faces[2], 100u);
    const int calls = fonts.calls;
    Find("p").SetAttribute("style", "color: red");
    Solve();
    EXPECT_EQ(fonts.calls, calls);
    Find("p").SetAttribute("style", "font-weight: bold");
    Solve();
    EXPECT_EQ(Find("p").GetFirstChild()->GetLaidOutStyle().text->typefaces[0], 7u);
    Drop();
}

struct Arrived final : layout::DOMTaskData {};

TEST_F(Engine, AFontThatArrivesReachesAllWhoShareTheStyle) {
    CountingFonts fonts;
    fonts.ready = false;
    host_->fonts = &fonts;
    Load("<div class='f'>a</div><div class='f'>b<i id='i'>c</i></div>", ".f { font-family: A }");
    Solve();
    const dom::Node& text = *Find("i").GetFirstChild();
    EXPECT_EQ(text.GetLaidOutStyle().text->typefaces[0], kNoTypeface);
    fonts.ready = true;
    for (const layout::NodeLinkPtr& waiter : fonts.waiters)
        waiter->Receive(layout::DOMTaskKind::FontArrived, Arrived());
    Solve();
    for (const dom::Node* node = &Body(); node; node = node->GetNextInTree(&Body())) {
        if (node->IsText()) {
            EXPECT_EQ(node->GetLaidOutStyle().text->typefaces[0], 4u);
        }
    }
    fonts.waiters.clear();
    Drop();
}

// --- Animations and transitions, as their side will leave them

TEST_F(Engine, TransitionsShowFromTheSecondSolveOn) {
    Load("<p id='p'></p>", "p { width: 10px }");
    dom::Element& p = Find("p");
    p.transitionProperties = qsl::AdoptRef(New<TransitionProperties, MemoryTag::CSS>());
    p.transitionProperties->activeCount[IndexOf(PropertyId::Width)] = 1;
    p.transitionProperties->totalActive = 1;
    p.transitionProperties->present.width = Extent::Pixels(3);
    EXPECT_EQ(Computed(p, "width"), "10px");
    EXPECT_TRUE(p.transitionProperties->changed.Contains(PropertyId::Width));
    p.transitionProperties->changed.Clear();
    p.SetAttribute("style", "width: 20px");
    EXPECT_EQ(Computed(p, "width"), "3px");
    EXPECT_TRUE(p.transitionProperties->changed.Contains(PropertyId::Width));
    EXPECT_TRUE(p.transitionProperties->targets.width == Extent::Pixels(20));
    // The fast path takes what the animation side writes, and an animation outranks the cascade.
    p.animatedProperties = qsl::AdoptRef(New<AnimatedProperties, MemoryTag::CSS>());
    p.animatedProperties->activeCount[IndexOf(PropertyId::Opacity)] = 1;
    p.animatedProperties->totalActive = 1;
    p.animatedProperties->present.opacity = {0.5f};
    p.animatedProperties->dirty.Add(PropertyId::Opacity);
    document_->MarkNodeDirty(p);
    const StyleCounters work = Counted([&] { Solve(); });
    EXPECT_EQ(work.propertiesApplied, 1u);
    EXPECT_EQ(Computed(p, "opacity"), "0.5");
}

TEST_F(Engine, AnAnimatedFontSizeReachesWhatFollowsIt) {
    Load("<div id='d' class='em'><p id='p'></p></div>", ".em { letter-spacing: 0.5em }");
    Solve();
    dom::Element& element = Find("d");
    element.animatedProperties = qsl::AdoptRef(New<AnimatedProperties, MemoryTag::CSS>());
    element.animatedProperties->activeCount[IndexOf(PropertyId::FontSize)] = 1;
    element.animatedProperties->totalActive = 1;
    element.animatedProperties->present.fontSize = Length::Pixels(40);
    element.animatedProperties->dirty.Add(PropertyId::FontSize);
    document_->MarkNodeDirty(element);
    EXPECT_EQ(Computed("d", "font-size"), "40px");
    EXPECT_EQ(Computed("p", "font-size"), "40px");
    EXPECT_EQ(Computed("p", "letter-spacing"), "20px");
}

// --- Limits

TEST_F(Engine, DeepPagesAreSolvedWithoutRecursion) {
    Load("");
    qsl::RefPtr<dom::Element> at = Append(Body(), "div");
    for (int i = 0; i < 3000; ++i)
        at = Append(*at, "div");
    at->SetAttribute("style", "color: inherit");
    Body().SetAttribute("style", "color: #ff0000");
    EXPECT_EQ(Computed(*at, "color"), "rgba(255, 0, 0, 1.000000)");
}

// --- Memory: these records are in every element.

static_assert(sizeof(LayoutStyleRefs) <= 72);
static_assert(sizeof(PropertySet) == 16);

}  // namespace
}  // namespace qorvex::css::test
