// Members that exist for script while the subsystem behind them does not yet.
#pragma once

#include "core/logging/log.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

// "<Class>::<Operation> is not available in this build", and null.
template <class T, FixedString kName>
JSValueRef NotAvailable(T&, ScriptCall& call) {
    LogWarning(std::string_view(kName.text), " is not available in this build");
    return JSValueMakeNull(call.context);
}

}  // namespace qorvex::script
