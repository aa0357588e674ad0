// addEventListener and its kin, for EventTarget itself and for the window, which names itself in their
// messages.
#pragma once

#include <string_view>

#include "dom/event.h"
#include "dom/event_target.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

void AddListener(dom::EventTarget& target, ScriptCall& call, std::string_view type, JSValueRef listener,
                 JSValueRef options);
void RemoveListener(dom::EventTarget& target, ScriptCall& call, std::string_view type, JSValueRef listener,
                    JSValueRef options);

// Rows of the three methods, each counting its arguments in the name of T.
#define QORVEX_EVENT_TARGET_METHODS(T)                                              \
    Binding<T>::Method<"addEventListener", &AddListener, 2>(),                      \
        Binding<T>::Method<"dispatchEvent", &dom::EventTarget::DispatchEvent, 1>(), \
        Binding<T>::Method<"removeEventListener", &RemoveListener, 2>()

}  // namespace qorvex::script
