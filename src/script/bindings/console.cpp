#include "script/bindings/console.h"

#include <cstdio>

#include "core/logging/log.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/window.h"
#include "script/bindings/window_host.h"
#include "script/member_callbacks.h"

namespace qorvex::dom {

void Console::StartTimer(std::string_view label) {
    if (timers_.contains(label)) {
        LogWarning("Timer \"", label, "\" already exists.");
        return;
    }
    timers_.insert_or_assign(String(label), std::chrono::steady_clock::now());
}

void Console::EndTimer(std::string_view label) {
    const auto* start = timers_.get(label);
    if (!start) {
        LogWarning("Timer \"", label, "\" doesn't exists.");
        return;
    }
    const auto elapsed =
        std::chrono::duration_cast<std::chrono::microseconds>(std::chrono::steady_clock::now() - *start);
    char text[32];
    std::snprintf(text, sizeof text, "%g", static_cast<double>(elapsed.count()) / 1000.0);
    LogInfo(label, ": ", text, "ms");
    timers_.erase(label);
}

}  // namespace qorvex::dom

namespace qorvex::script {

template <>
dom::Console* NativeOf<dom::Console>(JSContextRef context, JSObjectRef) {
    const ScriptingContext* page = GetScriptingContext(context);
    return page && page->window ? &page->window->console() : nullptr;
}

namespace {

using dom::Console;

// Every argument as text, a blank behind each. What a conversion throws goes to the caller of console.log.
bool JoinArguments(const ScriptCall& call, size_t first, String& line) {
    for (size_t i = first; i < call.arguments.size(); ++i) {
        ScriptText text;
        if (!text.Read(call.context, call.arguments[i], call.exception)) return false;
        line.append(text.view());
        line.append(" ");
    }
    return true;
}

// The host may want the page's lines apart from the engine's own.
void Emit(JSContextRef context, Logging::Severity severity, std::string_view line) {
    const ScriptingContext* page = GetScriptingContext(context);
    const bool taken = page && page->window && page->window->host().OnConsoleLine(severity, line);
    if (!taken) Log(severity, line);
}

template <Logging::Severity kSeverity>
void WriteLine(Console&, ScriptCall& call) {
    String line;
    if (JoinArguments(call, 0, line)) Emit(call.context, kSeverity, line);
}

void Assert(Console&, ScriptCall& call, bool condition) {
    String line;
    if (!condition && JoinArguments(call, 1, line)) Emit(call.context, Logging::Assert, line);
}

void Time(Console& console, ScriptCall& call, std::string_view label) {
    if (call.arguments.size() == 1) {
        console.StartTimer(label);
    } else {
        LogWarning("console.time() called with more than one argument");
    }
}

void TimeEnd(Console& console, ScriptCall& call, std::string_view label) {
    if (call.arguments.size() == 1) {
        console.EndTimer(label);
    } else {
        LogWarning("console.timeEnd() called with more than one argument");
    }
}

using Bind = Binding<Console>;
constexpr MethodDescription kMethods[] = {
    Bind::Method<"assert", &Assert>(),
    Bind::Method<"debug", &WriteLine<Logging::Debug>>(),
    Bind::Method<"error", &WriteLine<Logging::Error>>(),
    Bind::Method<"info", &WriteLine<Logging::Info>>(),
    Bind::Method<"log", &WriteLine<Logging::Info>>(),
    Bind::Method<"time", &Time>(),
    Bind::Method<"timeEnd", &TimeEnd>(),
    Bind::Method<"warn", &WriteLine<Logging::Warning>>(),
};

}  // namespace

const ClassDescription kConsoleClass = {
    .script_class = ScriptClass::Console, .methods = kMethods, .has_global_name = false};

}  // namespace qorvex::script
