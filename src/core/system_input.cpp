// Gamepads of a system; they come with input routing.
#include "core/memory/thread_scope.h"
#include "core/system_impl.h"
#include "core/unavailable.h"

namespace qorvex {

void SystemImpl::AddGamepad(unsigned, const char*, unsigned, unsigned, unsigned) {
    ThreadScope scope;
    LogUnavailable("System::AddGamepad");
}

void SystemImpl::RemoveGamepad(unsigned) {
    ThreadScope scope;
    LogUnavailable("System::RemoveGamepad");
}

void SystemImpl::UpdateGamepadState(const GamepadState&) {
    ThreadScope scope;
    LogUnavailable("System::UpdateGamepadState");
}

void SystemImpl::UpdateGamepadStateExtended(const GamepadStateExtended&) {
    ThreadScope scope;
    LogUnavailable("System::UpdateGamepadStateExtended");
}

}  // namespace qorvex
