#include "script/engine_seam.h"

#include <JavaScriptCore/JavaScript.h>
#include <glib.h>

#include <mutex>

#include "core/logging/log.h"

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
}

void CollectGarbageNow(JSContextRef context) {
    JSSynchronousGarbageCollectForDebugging(context);
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
