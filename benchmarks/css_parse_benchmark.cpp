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

// Each byte through a table, and no more: what the class of a byte then means is all that a scanner adds.
void ScanBytes(benchmark::State& state) {
    const std::string text = bench::PanelSheet(100);
    std::array<uint8_t, 256> classes{};
    for (size_t c = 0; c < classes.size(); ++c)
        classes[c] = c <= ' ' ? 1 : c >= '0' && c <= '9' ? 2 : (c | 0x20) >= 'a' && (c | 0x20) <= 'z' ? 4 : 8;
    for (auto _ : state) {
        uint64_t sum = 0;
        for (const char byte : text) {
            sum += classes[static_cast<unsigned char>(byte)];
            // Byte by byte: what the compiler makes of it with vectors takes three times as long.
            asm volatile("" : "+r"(sum));
        }
        benchmark::DoNotOptimize(sum);
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
