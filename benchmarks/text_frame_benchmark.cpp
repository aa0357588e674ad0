// Frames of a page of labels: what one changed label costs among many, and what a page costs in which nothing
// changes.
#include <benchmark/benchmark.h>

#include <string>

#include "benchmarks/page.h"

namespace {

constexpr int kPanels = 10;
constexpr int kRows = 10;
constexpr int kLabels = 10;

// Panels of rows of labels, as a game's screens are; the label that changes stands in the last row.
std::string Markup(int panels, int rows, int labels) {
    std::string page =
        "<style>body{font-size:6px}.p{position:absolute;width:300px;height:70px}"
        ".r{display:flex;flex-direction:row;height:7px}.l{width:28px}</style><body>";
    for (int panel = 0; panel < panels; ++panel) {
        // Side by side in the view: what lies over the label would be painted with it.
        page += "<div class=p style='left:" + std::to_string(panel % 2 * 310) +
                "px;top:" + std::to_string(panel / 2 * 72) + "px'>";
        for (int row = 0; row < rows; ++row) {
            page += "<div class=r>";
            for (int label = 0; label < labels; ++label)
                page += "<div class=l>12</div>";
            page += "</div>";
        }
        page += "</div>";
    }
    return page +
           "<script>var l=document.querySelectorAll('.l');var last=l[l.length-1].firstChild;var n=0;"
           "</script></body>";
}

void ChangeOne(benchmark::State& state, int panels, int rows, int labels) {
    bench::Page page({.markup = Markup(panels, rows, labels)});
    if (!page.IsComplete()) return state.SkipWithError("the page is not what was asked for");
    for (auto _ : state) {
        page.Run("last.data=String(10+n++%90)");
        page.Frame();
    }
    state.counters["target"] = 1.3;
}
BENCHMARK_CAPTURE(ChangeOne, many, kPanels, kRows, kLabels)->Name("text_change");
BENCHMARK_CAPTURE(ChangeOne, alone, 1, 1, 1)->Name("text_change_baseline");

void Idle(benchmark::State& state, int panels, int rows, int labels) {
    bench::Page page({.markup = Markup(panels, rows, labels)});
    if (!page.IsComplete()) return state.SkipWithError("the page is not what was asked for");
    const std::uint64_t before = page.Allocations();
    for (auto _ : state)
        page.Frame();
    state.counters["allocations"] = static_cast<double>(page.Allocations() - before);
    state.counters["target"] = 1.2;
}
BENCHMARK_CAPTURE(Idle, many, kPanels, kRows, kLabels)->Name("text_idle");
BENCHMARK_CAPTURE(Idle, alone, 1, 1, 1)->Name("text_idle_baseline");

}  // namespace
