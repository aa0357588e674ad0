// Running script text, calling script functions and reporting what they throw.
#pragma once

#include <JavaScriptCore/JSObjectRef.h>

#include <span>
#include <string_view>

#include "core/memory/containers.h"

namespace qorvex::script {

struct ScriptingContext;

// Runs UTF-8 text; `url` may be empty. The result is dropped. An exception is logged as
// "Scripting error: ... at: ..." and goes no further; what the script did until then stays.
void EvaluateScript(const ScriptingContext& context, std::string_view source, std::string_view url);

// Logs an exception with its line, column and stack at error level. A null exception is an assertion.
void ReportException(JSContextRef context, JSValueRef exception);

// Calls `function`; what it throws goes to ReportException and the result is null.
JSValueRef CallFunction(JSContextRef context, JSObjectRef function, JSObjectRef this_object,
                        std::span<const JSValueRef> arguments);

// The JSON text of a value, a null pointer standing for null; empty on an exception, after which the caller
// logs "Failed to serialize Object to JSON".
[[nodiscard]] String SerializeToJSON(JSContextRef context, JSValueRef value);

// String(value) as UTF-8; empty when the conversion throws, with the exception handed out if asked for.
[[nodiscard]] String ToNativeString(JSContextRef context, JSValueRef value, JSValueRef* exception = nullptr);

// UTF-8 text as a script string. Text ends at its first NUL.
[[nodiscard]] JSValueRef ToScriptString(JSContextRef context, std::string_view text);

// Property of an object by name.
[[nodiscard]] JSValueRef GetProperty(JSContextRef context, JSObjectRef object, std::string_view name);
void SetProperty(JSContextRef context, JSObjectRef object, std::string_view name, JSValueRef value,
                 JSPropertyAttributes attributes);

}  // namespace qorvex::script
