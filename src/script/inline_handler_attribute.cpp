#include "script/inline_handler_attribute.h"

#include <JavaScriptCore/JavaScript.h>

#include "core/logging/log.h"
#include "core/memory/containers.h"
#include "script/evaluate.h"

namespace qorvex::script {

bool IsInlineHandlerName(std::string_view name) {
    return name.size() > 2 && (name[0] | 0x20) == 'o' && (name[1] | 0x20) == 'n';
}

void InstallInlineHandler(JSContextRef context, JSObjectRef object, std::string_view name,
                          std::string_view value) {
    if (!IsInlineHandlerName(name)) return;
    String source("this.");
    source.append(name);
    source.append(" = function(event) {");
    source.append(value);
    source.append("}");
    JSStringRef body = JSStringCreateWithUTF8CString(source.c_str());
    JSValueRef exception = nullptr;
    const JSObjectRef installer =
        JSObjectMakeFunction(context, nullptr, 0, nullptr, body, nullptr, 1, &exception);
    JSStringRelease(body);
    if (exception || !installer) {
        LogError(name, " attribute value is not a valid function: \"", value, "\"!");
        return;
    }
    CallFunction(context, installer, object, {});
}

}  // namespace qorvex::script
