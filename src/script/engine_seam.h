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

struct OpaqueJSWeak;

namespace qorvex::script {

// Once a process, before any other call of this room: makes the calling thread the engine's main thread.
// Later calls do nothing.
void StartScriptEngine();
// The stock engine cannot be taken down; it stays until the process ends, and a second start is free.
void StopScriptEngine();

// One non-blocking turn of the main loop that the engine hangs its timers on: collection, finalisation
// registries and the like. Once a frame; without it they never run. Then the thread's heap observers settle.
// A turn takes some system calls, 10 to 30 us.
void PumpScriptEngine();
// The observers alone.
void SettleScriptHeap();

// Collects at once, finalisers included. For tests, memory pressure and orderly ends: it walks the whole
// heap.
void CollectGarbageNow(JSContextRef context);

// What the engine tells a table of script objects that native code keeps alive. Roots cost nothing per object
// that way: JSValueProtect takes a lock and a hash table of its own each time.
class IHeapObserver {
  public:
    class Marker {
      public:
        virtual void Mark(JSObjectRef object) = 0;

      protected:
        ~Marker() = default;
    };

    // The collector marks: name every object to keep. Script stands still, but native code may run and this
    // may be another thread. Called several times a collection.
    virtual void MarkRoots(Marker& marker) = 0;
    // A collection is over: weak references to dead objects read null, their memory is not yet used again. On
    // the script thread, inside the engine: nothing of it may be called but GetWeakObject.
    virtual void OnCollected() = 0;
    // A good moment to do what OnCollected has to leave undone. On the script thread, outside the engine.
    virtual void Settle() = 0;

  protected:
    ~IHeapObserver() = default;
};

// From the group's thread. After RemoveHeapObserver returns no call is under way and none comes, even if the
// group itself lives on.
void AddHeapObserver(JSContextGroupRef group, IHeapObserver& observer);
void RemoveHeapObserver(IHeapObserver& observer);

using ScriptWeakRef = OpaqueJSWeak*;
[[nodiscard]] ScriptWeakRef MakeWeakReference(JSContextGroupRef group, JSObjectRef object);
void ReleaseWeakReference(JSContextGroupRef group, ScriptWeakRef reference);
// Null once the object is dead.
[[nodiscard]] JSObjectRef GetWeakObject(ScriptWeakRef reference);

// Keeps the engine entered: the calls within are cheaper, and no collection ends meanwhile.
class ScriptEngineLock {
  public:
    explicit ScriptEngineLock(JSContextRef context);
    ~ScriptEngineLock();
    ScriptEngineLock(const ScriptEngineLock&) = delete;
    ScriptEngineLock& operator=(const ScriptEngineLock&) = delete;

  private:
    JSContextRef context_;
};

// Native memory that lives as long as script objects do: the engine collects the earlier for it. It may
// collect within this call.
void ReportNativeMemory(JSContextRef context, size_t bytes);

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
