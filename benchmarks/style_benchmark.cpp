// Style solving against the least that anybody could do: copying the results, touching the nodes.
#include <benchmark/benchmark.h>

#include <cstring>
#include <vector>

#include "benchmarks/style_page.h"
#include "css/style/element_matching.h"

namespace {

using namespace qorvex;
using bench::StylePage;

constexpr int kElements = 10000;
constexpr int kPanels = 50;  // ten rules each

// --- A whole page, all rules matched and all properties looked at.

constexpr double kFullTarget = 12;

void StyleFull(benchmark::State& state) {
    StylePage page(bench::PanelMarkup(kElements, kPanels), bench::PanelSheet(kPanels));
    const uint64_t before = bench::CountAllocations();
    for (auto _ : state) {
        page.document().RequestFullStyleSolve();
        page.Solve();
    }
    const css::StyleCounters& counters = page.engine().GetCounters();
    state.counters["allocations"] = static_cast<double>(bench::CountAllocations() - before);
    state.counters["shared"] =
        static_cast<double>(counters.stylesShared) / static_cast<double>(counters.elementsSolved);
    state.counters["items"] = static_cast<double>(page.CountElements());
    state.counters["target"] = kFullTarget;
}
BENCHMARK(StyleFull)->Name("style_full");

// One copy of all style groups of each element, to one place: neither side misses the cache more than a solve
// does.
void CopyGroups(benchmark::State& state) {
    StylePage page(bench::PanelMarkup(kElements, kPanels), bench::PanelSheet(kPanels));
    std::vector<const css::LayoutStyleRefs*> styles;
    page.document().ForEachElement([&](dom::Element& element) { styles.push_back(&element.GetStyle()); });
    struct Copy {
        alignas(16) std::byte layout[sizeof(css::LayoutStyle)];
        std::byte visual[sizeof(css::VisualStyle)];
        std::byte text[sizeof(css::TextLayoutStyle)];
        std::byte transform[sizeof(css::TransformStyle)];
        std::byte animation[sizeof(css::AnimationStyle)];
        std::byte transition[sizeof(css::TransitionStyle)];
    } copy;
    for (auto _ : state) {
        for (const css::LayoutStyleRefs* style : styles) {
            std::memcpy(copy.layout, static_cast<const void*>(style->layout.get()), sizeof copy.layout);
            std::memcpy(copy.visual, static_cast<const void*>(style->visual.get()), sizeof copy.visual);
            std::memcpy(copy.text, static_cast<const void*>(style->text.get()), sizeof copy.text);
            std::memcpy(copy.transform, static_cast<const void*>(style->transform.get()),
                        sizeof copy.transform);
            std::memcpy(copy.animation, static_cast<const void*>(style->animation.get()),
                        sizeof copy.animation);
            std::memcpy(copy.transition, static_cast<const void*>(style->transition.get()),
                        sizeof copy.transition);
            benchmark::DoNotOptimize(copy);
            benchmark::ClobberMemory();
        }
    }
    state.counters["bytes"] = sizeof copy;
    state.counters["items"] = static_cast<double>(styles.size());
}
BENCHMARK(CopyGroups)->Name("style_full_baseline");

// --- One class toggled on one element, in a large and in a small page.

void StyleOne(benchmark::State& state, int elements) {
    StylePage page(bench::PanelMarkup(elements, kPanels), bench::PanelSheet(kPanels));
    const Atom label = page.strings().Intern("active");
    dom::Element& panel = *page.document().QuerySelector(".slot1");
    const auto toggle = [&] {
        if (panel.HasClass(label)) {
            panel.RemoveClass("active");
        } else {
            panel.AddClass("active");
        }
        page.Solve();
    };
    for (int i = 0; i < 4; ++i)
        toggle();
    const uint64_t before = bench::CountAllocations();
    for (auto _ : state)
        toggle();
    state.counters["allocations"] = static_cast<double>(bench::CountAllocations() - before);
    state.counters["target"] = 1.2;
}
BENCHMARK_CAPTURE(StyleOne, large, kElements)->Name("style_one");
BENCHMARK_CAPTURE(StyleOne, small, 100)->Name("style_one_baseline");

// --- An inherited colour changes on the root.

// Most of a page says nothing about colour; the titles and labels of the panels do.
void StyleInherited(benchmark::State& state) {
    StylePage page(bench::PanelMarkup(kElements, kPanels), bench::PanelSheet(kPanels));
    dom::Element& root = *page.document().GetHtmlElement();
    bool on = false;
    const auto change = [&] {
        on = !on;
        root.EnsureInlineStyle().Set(
            css::Declaration::Make<css::PropertyId::Color>(on ? css::Color::White() : css::Color::Black()));
        page.document().MarkSelectorDirty(root);
        page.document().MarkNodeDirty(root);
        page.Solve();
    };
    for (int i = 0; i < 4; ++i)
        change();
    const uint64_t before = bench::CountAllocations();
    for (auto _ : state)
        change();
    state.counters["allocations"] = static_cast<double>(bench::CountAllocations() - before);
    state.counters["target"] = 10;
}
BENCHMARK(StyleInherited)->Name("style_inherited");

void TouchNodes(benchmark::State& state) {
    StylePage page(bench::PanelMarkup(kElements, kPanels), bench::PanelSheet(kPanels));
    dom::Node& root = *page.document().GetHtmlElement();
    std::vector<dom::Node*> queue;
    for (auto _ : state) {
        queue.clear();
        queue.push_back(&root);
        for (size_t i = 0; i < queue.size(); ++i) {
            dom::Node& node = *queue[i];
            node.textTransformFlag = 0;
            for (const auto& child : node.GetChildren())
                queue.push_back(child.get());
        }
        benchmark::DoNotOptimize(queue.data());
    }
}
BENCHMARK(TouchNodes)->Name("style_inherited_baseline");

// --- Matching, where nine rules of ten are none of the element's business.

constexpr int kMatchedRules = 500;

// Rules that no map of single selectors finds. Of ten, nine ask for another id, tag or class; the tenth has
// to be looked at, and every second of those matches.
std::string RefusedSheet() {
    std::string sheet;
    for (int i = 0; i < kMatchedRules; ++i) {
        const std::string n = std::to_string(i);
        switch (i % 10) {
            case 0:
                sheet += i % 20 == 0 ? "section .item" : ".other" + n + " .item";
                break;
            case 1:
            case 2:
                sheet += "#id" + n + ":hover";
                break;
            case 3:
            case 4:
                sheet += ".panel" + n + " h2";
                break;
            case 5:
                sheet += "#id" + n + " > p";
                break;
            default:
                sheet += ".panel" + n + ":hover .part" + n;
                break;
        }
        sheet += " { left: " + n + "px }\n";
    }
    return sheet;
}

void Match(benchmark::State& state) {
    StylePage page("<section><div><div id='me' class='item'></div></div></section>", RefusedSheet());
    dom::Element& element = *page.document().GetElementById("me");
    css::StyleCounters counters;
    css::ElementMatcher matcher(counters);
    const css::PseudoState pseudo(page.document());
    css::MatchContext context(pseudo);
    for (auto _ : state) {
        matcher.MatchElementStyle(element, page.engine().GetDefaultRules(), page.engine().GetAuthorRules(),
                                  context);
        benchmark::DoNotOptimize(element.GetMatchState());
    }
    state.counters["target"] = 3;
}
BENCHMARK(Match)->Name("match");

void WalkRules(benchmark::State& state) {
    StylePage page("<div id='me'></div>", RefusedSheet());
    const css::RuleIndex& index = page.engine().GetAuthorRules();
    std::vector<css::IndexedRule> rules;
    for (const uint64_t id : index.GetAllRuleIds())
        rules.push_back(*index.FindRule(id));
    const Atom wanted = page.strings().Intern("me");
    for (auto _ : state) {
        uint32_t found = 0;
        for (const css::IndexedRule& rule : rules)
            found += rule.selector.key.simple[0].name == wanted;
        benchmark::DoNotOptimize(found);
    }
    state.counters["rules"] = static_cast<double>(rules.size());
}
BENCHMARK(WalkRules)->Name("match_baseline");

}  // namespace
