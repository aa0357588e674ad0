// onfoo attributes in the page's text: `<div onclick="...">`.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <string_view>

namespace qorvex::script {

// Whether an attribute of this name holds script: "on" in front, in any case.
[[nodiscard]] bool IsInlineHandlerName(std::string_view name);

// Compiles the value as the body of a function and assigns it to the property of that name of `object`, so
// that the accessor of the event does the rest. A value that does not compile is logged and changes nothing.
void InstallInlineHandler(JSContextRef context, JSObjectRef object, std::string_view name,
                          std::string_view value);

}  // namespace qorvex::script
