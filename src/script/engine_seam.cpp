#include "script/engine_seam.h"

#include <JavaScriptCore/JavaScript.h>
#include <glib.h>

#include <algorithm>
#include <mutex>

#include "core/logging/log.h"
#include "core/memory/containers.h"

namespace WTF {
void initializeMainThread();
}

extern "C" {
using JSShouldTerminateCallback = bool (*)(JSContextRef context, void* data);
void JSContextGroupSetExecutionTimeLimit(JSContextGroupRef group, double seconds,
                                         JSShouldTerminateCallback callback, void* data);
void JSContextGroupClearExecutionTimeLimit(JSContextGroupRef group);
void JSSynchronousGarbageCollectForDebugging(JSContextRef context);
JSObjectRef JSGetMemoryUsageStatistics(JSContextRef context);

struct JSMarker {
    bool (*IsMarked)(JSMarker*, JSObjectRef);
    void (*Mark)(JSMarker*, JSObjectRef);
};
using JSMarkingConstraint = void (*)(JSMarker*, void* data);
using JSHeapFinalizer = void (*)(JSContextGroupRef, void* data);
void JSContextGroupAddMarkingConstraint(JSContextGroupRef group, JSMarkingConstraint constraint, void* data);
void JSContextGroupAddHeapFinalizer(JSContextGroupRef group, JSHeapFinalizer finalizer, void* data);
OpaqueJSWeak* JSWeakCreate(JSContextGroupRef group, JSObjectRef object);
void JSWeakRelease(JSContextGroupRef group, OpaqueJSWeak* reference);
JSObjectRef JSWeakGetObject(OpaqueJSWeak* reference);
void JSReportExtraMemoryCost(JSContextRef context, size_t bytes);
void JSLock(JSContextRef context);
void JSUnlock(JSContextRef context);
}

namespace qorvex::script {

namespace {

size_t ReadSize(JSContextRef context, JSObjectRef object, const char* name) {
    JSStringRef key = JSStringCreateWithUTF8CString(name);
    const double value =
        JSValueToNumber(context, JSObjectGetProperty(context, object, key, nullptr), nullptr);
    JSStringRelease(key);
    return value > 0 ? static_cast<size_t>(value) : 0;
}

// The engine has no call that takes a constraint away, so it is given a number that is looked up each time.
struct ObserverEntry {
    uintptr_t id;
    IHeapObserver* observer;
};

class ObserverRegistry {
  public:
    uintptr_t Add(IHeapObserver& observer) {
        const std::lock_guard lock(mutex_);
        entries_.push_back({++last_id_, &observer});
        return last_id_;
    }
    void Remove(IHeapObserver& observer) {
        const std::lock_guard lock(mutex_);
        for (size_t i = 0; i < entries_.size(); ++i) {
            if (entries_[i].observer != &observer) continue;
            entries_.erase(entries_.begin() + i);
            break;
        }
        // Nothing stays allocated beyond the last library.
        if (entries_.empty()) entries_ = {};
    }
    // The observer cannot go while `use` runs.
    template <class F>
    void With(uintptr_t id, F&& use) {
        const std::lock_guard lock(mutex_);
        for (const ObserverEntry& entry : entries_) {
            if (entry.id == id) return use(*entry.observer);
        }
    }

  private:
    std::mutex mutex_;
    uintptr_t last_id_ = 0;
    Vector<ObserverEntry> entries_;
};

ObserverRegistry& GetObservers() {
    static ObserverRegistry registry;
    return registry;
}

// Those of this thread, for what only the script thread does.
thread_local Vector<IHeapObserver*> t_observers;

struct EngineMarker final : IHeapObserver::Marker {
    explicit EngineMarker(JSMarker* engine_marker) : marker(engine_marker) {}
    void Mark(JSObjectRef object) override { marker->Mark(marker, object); }
    JSMarker* marker;
};

void OnMarking(JSMarker* marker, void* id) {
    EngineMarker adapter(marker);
    GetObservers().With(reinterpret_cast<uintptr_t>(id),
                        [&](IHeapObserver& observer) { observer.MarkRoots(adapter); });
}

void OnCollection(JSContextGroupRef, void* id) {
    IHeapObserver* found = nullptr;
    GetObservers().With(reinterpret_cast<uintptr_t>(id), [&](IHeapObserver& observer) { found = &observer; });
    // Not under the lock; this is the thread that would remove it.
    if (found) found->OnCollected();
}

bool OnTimeLimit(JSContextRef, void*) {
    LogError("A script ran longer than its time limit and was stopped.");
    return true;
}

}  // namespace

void StartScriptEngine() {
    static std::once_flag started;
    std::call_once(started, [] { WTF::initializeMainThread(); });
}

void StopScriptEngine() {}

void PumpScriptEngine() {
    g_main_context_iteration(nullptr, FALSE);
    SettleScriptHeap();
}

void SettleScriptHeap() {
    for (size_t i = 0; i < t_observers.size(); ++i)
        t_observers[i]->Settle();
}

void CollectGarbageNow(JSContextRef context) {
    SettleScriptHeap();
    JSSynchronousGarbageCollectForDebugging(context);
    SettleScriptHeap();
}

void AddHeapObserver(JSContextGroupRef group, IHeapObserver& observer) {
    t_observers.push_back(&observer);
    auto* id = reinterpret_cast<void*>(GetObservers().Add(observer));
    JSContextGroupAddMarkingConstraint(group, OnMarking, id);
    JSContextGroupAddHeapFinalizer(group, OnCollection, id);
}

void RemoveHeapObserver(IHeapObserver& observer) {
    for (size_t i = 0; i < t_observers.size(); ++i) {
        if (t_observers[i] != &observer) continue;
        t_observers.erase(t_observers.begin() + i);
        break;
    }
    if (t_observers.empty()) t_observers = {};
    GetObservers().Remove(observer);
}

ScriptWeakRef MakeWeakReference(JSContextGroupRef group, JSObjectRef object) {
    return JSWeakCreate(group, object);
}
void ReleaseWeakReference(JSContextGroupRef group, ScriptWeakRef reference) {
    JSWeakRelease(group, reference);
}
JSObjectRef GetWeakObject(ScriptWeakRef reference) {
    return JSWeakGetObject(reference);
}

ScriptEngineLock::ScriptEngineLock(JSContextRef context) : context_(context) {
    JSLock(context_);
}
ScriptEngineLock::~ScriptEngineLock() {
    JSUnlock(context_);
}

void ReportNativeMemory(JSContextRef context, size_t bytes) {
    JSReportExtraMemoryCost(context, bytes);
}

ScriptEngineMemory GetScriptEngineMemory(JSContextRef context) {
    const JSObjectRef statistics = JSGetMemoryUsageStatistics(context);
    if (!statistics) return {};
    return {ReadSize(context, statistics, "heapSize"), ReadSize(context, statistics, "heapCapacity"),
            ReadSize(context, statistics, "extraMemorySize"), ReadSize(context, statistics, "objectCount"),
            ReadSize(context, statistics, "protectedObjectCount")};
}

void SetScriptTimeLimit(JSContextGroupRef group, double seconds) {
    if (seconds > 0) {
        JSContextGroupSetExecutionTimeLimit(group, seconds, OnTimeLimit, nullptr);
    } else {
        JSContextGroupClearExecutionTimeLimit(group);
    }
}

}  // namespace qorvex::script
