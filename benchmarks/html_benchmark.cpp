// From the bytes of a page to its nodes, against what the HTML parser alone takes for the same text.
#include <benchmark/benchmark.h>
#include <gumbo.h>

#include <cstdlib>
#include <string>

#include "css/style/style_engine.h"
#include "dom/document.h"
#include "dom/html_elements.h"
#include "dom/parsed_html.h"
#include "script/make_handle.h"
#include "tests/support/idle_page.h"

namespace {

using namespace qorvex;

// What a game's screens are made of: nested boxes with classes, ids, data attributes and short texts.
std::string Page() {
    std::string page = "<!DOCTYPE html><html><head><title>Inventory</title></head><body>\n";
    for (int i = 0; i < 400; ++i) {
        const std::string n = std::to_string(i);
        page += "<div class=\"slot item rarity-" + std::to_string(i % 5) + "\" id=\"slot" + n +
                "\" data-index=\"" + n + "\">\n  <img class=\"icon\" src=\"icons/" + std::to_string(i % 40) +
                ".png\">\n  <div class=\"label\"><span class=\"name\">Sword of the morning " + n +
                "</span><span class=\"count\">x" + std::to_string(i % 9) +
                "</span></div>\n  <p>A blade that was forged in the light of <b>two</b> suns &amp; one "
                "moon.<br>It weighs " +
                n + " stones.</p>\n  <ul><li>Damage 12</li><li>Speed 3</li></ul>\n</div>\n";
    }
    return page + "</body></html>";
}

void HTMLToDOM(benchmark::State& state) {
    const std::string page = Page();
    css::CreateDefaultStyles();
    {
        test::IdleHost host;
        const auto rules = MakeRef<css::DefaultRules>(host.GetStringPool());
        size_t nodes = 0;
        for (auto _ : state) {
            dom::DocumentParams params;
            params.host = &host;
            params.url.Parse("file:///page.html");
            params.style_engine = MakeUnique<css::StyleEngine, MemoryTag::DOM>(host.GetStringPool(), rules);
            params.loader = MakeUnique<test::IdleLoader, MemoryTag::DOM>();
            qsl::RefPtr<dom::Document> document = script::MakeHandle<dom::HTMLDocument>(std::move(params));
            // The bytes are lent, as a resource's buffer is.
            if (!document->BuildRoot(dom::ParseHTML(page, [] {}))) std::abort();
            document->IterateDOMBuilding();
            state.PauseTiming();
            nodes = document->GetBodyElement()->GetChildElementCount();
            document = nullptr;
            state.ResumeTiming();
        }
        if (nodes != 400) std::abort();
    }
    css::DestroyDefaultStyles();
    state.counters["target"] = 1.6;
}
BENCHMARK(HTMLToDOM)->Name("html_to_dom");

void ParserAlone(benchmark::State& state) {
    const std::string page = Page();
    for (auto _ : state) {
        GumboOutput* output = gumbo_parse_with_options(&kGumboDefaultOptions, page.data(), page.size());
        benchmark::DoNotOptimize(output);
        state.PauseTiming();
        gumbo_destroy_output(&kGumboDefaultOptions, output);
        state.ResumeTiming();
    }
}
BENCHMARK(ParserAlone)->Name("html_to_dom_baseline");

}  // namespace
