#include "script/member_callbacks.h"

#include <cstdio>

namespace qorvex::script {

JSValueRef RaiseArgumentCountError(const ScriptCall& call, const char* operation, const char* class_name,
                                   size_t required) {
    char message[256];
    std::snprintf(message, sizeof message,
                  "Failed to execute '%s' on '%s': %d arguments required, but only %d present", operation,
                  class_name, static_cast<int>(required), static_cast<int>(call.arguments.size()));
    call.Raise(message);
    return JSValueMakeUndefined(call.context);
}

}  // namespace qorvex::script
