// The flat map against std::unordered_map, with pointer-like keys as the engine has them.
#include <benchmark/benchmark.h>

#include <memory>
#include <unordered_map>
#include <vector>

#include "core/memory/containers.h"

namespace {

constexpr size_t kCount = 4096;
constexpr double kTarget = 0.5;

std::vector<uint64_t> Keys() {
    std::vector<uint64_t> keys;
    uint64_t state = 1;
    for (size_t i = 0; i < kCount; ++i) {
        state = state * 6364136223846793005u + 1442695040888963407u;
        keys.push_back((state >> 20) & ~uint64_t{7});
    }
    return keys;
}

template <class Map>
void Insert(benchmark::State& state) {
    const std::vector<uint64_t> keys = Keys();
    for (auto _ : state) {
        Map map;
        for (const uint64_t key : keys)
            map[key] = 1;
        benchmark::DoNotOptimize(map);
    }
    state.counters["target"] = kTarget;
}

template <class Map>
void Lookup(benchmark::State& state) {
    const std::vector<uint64_t> keys = Keys();
    Map map;
    for (const uint64_t key : keys)
        map[key] = 1;
    for (auto _ : state) {
        uint32_t sum = 0;
        // Every second question is for a key that is not there.
        for (const uint64_t key : keys) {
            sum += map.find(key) != map.end();
            sum += map.find(key + 8) != map.end();
        }
        benchmark::DoNotOptimize(sum);
    }
    state.counters["target"] = kTarget;
}

using Flat = qorvex::HashMap<uint64_t, uint32_t>;
using Standard = std::unordered_map<uint64_t, uint32_t>;

BENCHMARK(Insert<Flat>)->Name("map_insert");
BENCHMARK(Insert<Standard>)->Name("map_insert_baseline");
BENCHMARK(Lookup<Flat>)->Name("map_lookup");
BENCHMARK(Lookup<Standard>)->Name("map_lookup_baseline");

}  // namespace
