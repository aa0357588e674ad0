// The one place that knows what the installed JavaScriptCore lacks or hides.
//
// The engine wants four start-up calls (static data, an allocator hook, threads, main thread). The stock
// package exports only the last of them: its heap takes memory from the system itself, and
// GetScriptEngineMemory is how that memory is still counted. The calls below that no header declares are
// exported by the library and are declared in engine_seam.cpp alone. All of them belong to the thread that
// runs script.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <cstddef>

namespace qorvex::script {

// Once a process, before any other call of this room: makes the calling thread the engine's main thread.
// Later calls do nothing.
void StartScriptEngine();
// The stock engine cannot be taken down; it stays until the process ends, and a second start is free.
void StopScriptEngine();

// One non-blocking turn of the main loop that the engine hangs its timers on: collection, finalisation
// registries and the like. Once a frame; without it they never run.
void PumpScriptEngine();

// Collects at once, finalisers included. For tests, memory pressure and orderly ends: it walks the whole
// heap.
void CollectGarbageNow(JSContextRef context);

struct ScriptEngineMemory {
    size_t heap_size = 0;      // live objects, bytes
    size_t heap_capacity = 0;  // reserved for objects, bytes
    size_t extra = 0;          // reported beside the heap, bytes
    size_t object_count = 0;
    size_t protected_count = 0;
};
[[nodiscard]] ScriptEngineMemory GetScriptEngineMemory(JSContextRef context);

// Ends any entry into script of this group that runs longer, by an exception that script cannot catch; the
// context stays usable. Each stop is logged. Zero or less switches the limit off.
void SetScriptTimeLimit(JSContextGroupRef group, double seconds);

}  // namespace qorvex::script
