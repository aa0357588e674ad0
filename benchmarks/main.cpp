// The engine's rooms allocate through the process-wide allocator: it must stand before any benchmark runs.
#include <benchmark/benchmark.h>

#include "benchmarks/first_frame_benchmark.h"
#include "core/memory/allocator.h"
#include "core/memory/thread_scope.h"
#include "host/counting_allocator.h"

int main(int count, char** arguments) {
    if (count > 1) qorvex::bench::RunFirstFrameChild(arguments[1]);
    static qorvex::host::CountingAllocator allocator;
    qorvex::SetAllocator(&allocator);
    const qorvex::ThreadScope scope;
    benchmark::Initialize(&count, arguments);
    if (benchmark::ReportUnrecognizedArguments(count, arguments)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
