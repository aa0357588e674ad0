// Reading sheets, against the least that a reader of bytes could do: a look at each one.
#include <benchmark/benchmark.h>

#include <array>
#include <string>

#include "benchmarks/style_page.h"
#include "css/parser/convert.h"

namespace {

using namespace qorvex;

constexpr double kParseTarget = 8;

void CssParse(benchmark::State& state) {
    const std::string text = bench::PanelSheet(100);
    for (auto _ : state)
        benchmark::DoNotOptimize(css::ParseStylesheet(text));
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
    state.counters["target"] = kParseTarget;
}
BENCHMARK(CssParse)->Name("css_parse");

// The class of each byte from a table, and how often it changes: what a scanner that knew nothing else would
// do.
void ScanBytes(benchmark::State& state) {
    const std::string text = bench::PanelSheet(100);
    std::array<uint8_t, 256> classes{};
    for (size_t c = 0; c < classes.size(); ++c)
        classes[c] = c <= ' ' ? 0 : c >= '0' && c <= '9' ? 1 : (c | 0x20) >= 'a' && (c | 0x20) <= 'z' ? 2 : 3;
    for (auto _ : state) {
        uint64_t tokens = 0;
        uint8_t last = 0;
        for (const char byte : text) {
            const uint8_t now = classes[static_cast<unsigned char>(byte)];
            tokens += now != last;
            last = now;
        }
        benchmark::DoNotOptimize(tokens);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}
BENCHMARK(ScanBytes)->Name("css_parse_baseline");

// Parsing and conversion to a sheet of values. Without a baseline: it tells where the time of a load goes.
void CssConvert(benchmark::State& state) {
    const std::string text = bench::PanelSheet(100);
    StringPool strings;
    for (auto _ : state)
        benchmark::DoNotOptimize(css::MakeStylesheet(text, "file:///page/sheet.css", strings));
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}
BENCHMARK(CssConvert)->Name("css_convert");

}  // namespace
