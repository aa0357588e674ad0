// What an idle frame costs, and that it does not grow with the page.
#include <benchmark/benchmark.h>

#include "benchmarks/page.h"

namespace {

using namespace qorvex;

// Frames are painted, so that the ids do not pile up as they would for a client that never draws.
void IdleAdvance(benchmark::State& state, int elements) {
    bench::Page page({.elements = elements});
    if (!page.IsComplete()) return state.SkipWithError("the page is not what was asked for");
    const std::uint64_t before = page.Allocations();
    for (auto _ : state)
        page.Frame();
    state.counters["allocations"] = static_cast<double>(page.Allocations() - before);
    state.counters["target"] = 1.2;
}
BENCHMARK_CAPTURE(IdleAdvance, large, 10000)->Name("idle_advance");
BENCHMARK_CAPTURE(IdleAdvance, small, 100)->Name("idle_advance_baseline");

}  // namespace
