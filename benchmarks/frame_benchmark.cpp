// Whole frames through the public interfaces: what an idle frame costs, and that it does not grow with the
// page.
#include <benchmark/benchmark.h>

#include "benchmarks/loaded_page.h"

namespace {

using namespace qorvex;

std::string Markup(int elements) {
    std::string page =
        "<style>body{display:flex;flex-wrap:wrap}.b{width:4px;height:4px;background-color:#123456}</"
        "style><body>";
    for (int i = 0; i < elements; ++i)
        page += "<div class=b></div>";
    return page;
}

// Frames are painted, so that the ids do not pile up as they would for a client that never draws.
void IdleAdvance(benchmark::State& state, int elements) {
    bench::LoadedPage page(Markup(elements));
    const std::uint64_t before = page.Allocations();
    for (auto _ : state)
        page.Frame();
    state.counters["allocations"] = static_cast<double>(page.Allocations() - before);
    state.counters["target"] = 1.2;
}
BENCHMARK_CAPTURE(IdleAdvance, large, 10000)->Name("idle_advance");
BENCHMARK_CAPTURE(IdleAdvance, small, 100)->Name("idle_advance_baseline");

}  // namespace
