// A selector list against a small fixed tree: the queries agree with each other, and the rule index with
// both.
#include <cstdint>

#include "css/parser/convert.h"
#include "css/style/selector_matching.h"
#include "support/engine.h"
#include "support/style_checks.h"

namespace qorvex::fuzz {
namespace {

using Elements = Vector<dom::Element*, MemoryTag::DOM>;

constexpr std::string_view kBody = R"(<div id=main class="a b" lang=en-GB title="x y">
<ul class=a><li id=one>1<li class="b c" data-k=v>2<li data-k="v w" class=c>3</ul>
<p class=b>t<b>u</b><i id=two class=a>v</i></p><my-el class=c type=TEXT><my-el>w</my-el></my-el></div><p id=p>)";

void CheckQueries(StyledPage& page, std::string_view text) {
    dom::Document& document = page.document();
    Elements found;
    page.engine().QuerySelectorAll(document, text, found);
    dom::Element* first = page.engine().QuerySelector(document, text);
    Require((first == nullptr) == found.empty(), "one query finds what the other does not");
    Require(!first || found[0] == first, "the first of all is the first");
    document.ForEachElement([&](dom::Element& element) {
        const bool matches = page.engine().Matches(element, text);
        Require(matches == (std::find(found.begin(), found.end(), &element) != found.end()),
                "an element that matches is found");
        dom::Element* closest = nullptr;
        for (dom::Element* above = element.GetParentElement(); above && !closest;
             above = above->GetParentElement())
            if (!above->Is(dom::kIsDocument) && page.engine().Matches(*above, text)) closest = above;
        Require(page.engine().Closest(element, text) == closest, "the closest is the nearest that matches");
    });
}

// The same selectors as rules.
void CheckRules(StyledPage& page, const css::CssVector<css::ComplexSelector>& selectors) {
    auto block = MakeRef<css::DeclarationBlock>();
    block->declarations.push_back(css::Declaration::Initial(css::PropertyId::Color));
    css::RuleIndex& rules = page.engine().GetAuthorRules();
    css::CssVector<uint64_t> ids;
    for (const css::ComplexSelector& selector : selectors) {
        page.engine().NoteDependencies(selector);
        ids.push_back(rules.AddRule(css::Ruleset(selector, block)));
    }
    page.CheckMatchedRules();
    page.document().RequestFullStyleSolve();
    page.Solve();
    page.document().GetElementById("main")->SetAttribute("class", "c");
    page.document().GetElementById("one")->SetAttribute("data-k", "v");
    page.Solve();
    page.CheckMatchedRules();
    rules.RemoveRules({ids.data(), ids.size()});
    page.document().RequestFullStyleSolve();
    page.Solve();
}

void Run(std::string_view text) {
    StyledPage page(kBody);
    page.Solve();
    CheckQueries(page, text);
    const auto selectors = css::ConvertSelector(*css::ParseSelector(text), page.strings());
    if (selectors && selectors->size() <= 32) CheckRules(page, *selectors);
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const qorvex::fuzz::Input input;
    qorvex::fuzz::Run({reinterpret_cast<const char*>(data), size});
    return 0;
}
