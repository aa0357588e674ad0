#include "script/evaluate.h"

#include <JavaScriptCore/JavaScript.h>

#include "core/logging/log.h"
#include "qsl/utf8.h"
#include "script/native_private.h"
#include "script/script_text.h"
#include "script/scripting_context.h"

namespace qorvex::script {

namespace {

// The text with U+FFFD in the place of what is no UTF-8.
String Repaired(std::string_view text) {
    String repaired;
    for (size_t at = 0; at < text.size();) {
        const size_t start = at;
        const bool bad = qsl::NextCodePoint(text, at) == qsl::kReplacementCharacter;
        repaired.append(bad ? qsl::kReplacementText : text.substr(start, at - start));
    }
    return repaired;
}

// The C API takes zero-terminated text, which a view need not be.
JSStringRef MakeStringOfUTF8(std::string_view text) {
    constexpr size_t kStackBytes = 512;
    if (text.size() < kStackBytes) {
        char copy[kStackBytes];
        if (!text.empty()) std::memcpy(copy, text.data(), text.size());
        copy[text.size()] = '\0';
        return JSStringCreateWithUTF8CString(copy);
    }
    return JSStringCreateWithUTF8CString(String(text).c_str());
}

JSStringRef MakeString(std::string_view text) {
    const JSStringRef string = MakeStringOfUTF8(text);
    if (text.empty() || text[0] == '\0' || JSStringGetLength(string) != 0) return string;
    // One bad byte, and the engine takes nothing: a script saved in another encoding would vanish unheard.
    JSStringRelease(string);
    return MakeStringOfUTF8(Repaired(text));
}

// A property as text; a missing one is empty, and so is everything of a value that is no object.
void ReadProperty(JSContextRef context, JSObjectRef object, std::string_view name, ScriptText& out) {
    const JSValueRef value = object ? GetProperty(context, object, name) : nullptr;
    if (!value || JSValueIsUndefined(context, value) || JSValueIsNull(context, value)) return;
    out.Read(context, value, nullptr);
}

}  // namespace

void EvaluateScript(const ScriptingContext& context, std::string_view source, std::string_view url) {
    JSStringRef source_text = MakeString(source);
    JSStringRef url_text = url.empty() ? nullptr : MakeString(url);
    JSValueRef exception = nullptr;
    JSEvaluateScript(context.context, source_text, nullptr, url_text, 0, &exception);
    JSStringRelease(source_text);
    if (url_text) JSStringRelease(url_text);
    if (!exception) return;

    ScriptText text, stack;
    text.Read(context.context, exception, nullptr);
    ReadProperty(context.context, JSValueToObject(context.context, exception, nullptr), "stack", stack);
    LogError("Scripting error: ", text.view(), " at: ", stack.view());
}

void ReportException(JSContextRef context, JSValueRef exception) {
    if (!exception) {
        AssertFailure("Unable to report an exception where there is no such.");
        return;
    }
    const JSObjectRef object = JSValueToObject(context, exception, nullptr);
    ScriptText text, stack, line, column;
    ReadProperty(context, object, "stack", stack);
    ReadProperty(context, object, "line", line);
    ReadProperty(context, object, "column", column);
    text.Read(context, exception, nullptr);

    String message(text.view());
    if (!stack.view().empty()) {
        message.append("\nAt ln: ");
        message.append(line.view());
        message.append(", col: ");
        message.append(column.view());
        message.append(".");
    }
    if (!line.view().empty() && !column.view().empty()) {
        message.append("\nStack info: \n");
        message.append(stack.view());
    }
    LogError(message.view());
}

JSValueRef CallFunction(JSContextRef context, JSObjectRef function, JSObjectRef this_object,
                        std::span<const JSValueRef> arguments) {
    JSValueRef exception = nullptr;
    const JSValueRef result = JSObjectCallAsFunction(context, function, this_object, arguments.size(),
                                                     arguments.data(), &exception);
    if (!exception) return result;
    ReportException(context, exception);
    return nullptr;
}

String SerializeToJSON(JSContextRef context, JSValueRef value) {
    if (!value) value = JSValueMakeNull(context);
    JSValueRef exception = nullptr;
    JSStringRef json = JSValueCreateJSONString(context, value, 0, &exception);
    // Functions and undefined have no JSON text and raise no exception either.
    if (!json) return String();
    ScriptText text;
    if (!exception) text.Read(json);
    JSStringRelease(json);
    return String(text.view());
}

String ToNativeString(JSContextRef context, JSValueRef value, JSValueRef* exception) {
    ScriptText text;
    text.Read(context, value, exception);
    return String(text.view());
}

JSValueRef ToScriptString(JSContextRef context, std::string_view text) {
    JSStringRef string = MakeString(text);
    const JSValueRef value = JSValueMakeString(context, string);
    JSStringRelease(string);
    return value;
}

JSValueRef GetProperty(JSContextRef context, JSObjectRef object, std::string_view name) {
    JSStringRef key = MakeString(name);
    JSValueRef exception = nullptr;
    const JSValueRef value = JSObjectGetProperty(context, object, key, &exception);
    JSStringRelease(key);
    return exception ? nullptr : value;
}

void SetProperty(JSContextRef context, JSObjectRef object, std::string_view name, JSValueRef value,
                 JSPropertyAttributes attributes) {
    JSStringRef key = MakeString(name);
    JSObjectSetProperty(context, object, key, value, attributes, nullptr);
    JSStringRelease(key);
}

}  // namespace qorvex::script
