// Gamepads of a system; they come with input routing.
#include "core/api_call.h"
#include "core/system_impl.h"
#include "core/unavailable.h"

namespace qorvex {

void SystemImpl::AddGamepad(unsigned, const char*, unsigned, unsigned, unsigned) {
    const MainThreadCall call("System");
    if (!call) return;
    LogUnavailable("System::AddGamepad");
}

void SystemImpl::RemoveGamepad(unsigned) {
    const MainThreadCall call("System");
    if (!call) return;
    LogUnavailable("System::RemoveGamepad");
}

void SystemImpl::UpdateGamepadState(const GamepadState&) {
    const MainThreadCall call("System");
    if (!call) return;
    LogUnavailable("System::UpdateGamepadState");
}

void SystemImpl::UpdateGamepadStateExtended(const GamepadStateExtended&) {
    const MainThreadCall call("System");
    if (!call) return;
    LogUnavailable("System::UpdateGamepadStateExtended");
}

}  // namespace qorvex
