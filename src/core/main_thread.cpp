#include "core/main_thread.h"

#include <thread>

#include "core/logging/log.h"

namespace qorvex {

namespace {
std::thread::id g_main_thread;  // written before the engine runs on any other thread
}

void SetMainThread() {
    g_main_thread = std::this_thread::get_id();
}

bool IsMainThread() {
    return std::this_thread::get_id() == g_main_thread;
}

bool CheckMainThread(const char* object, const char* operation) {
    if (IsMainThread()) return true;
    LogError(object, "::", operation, " must be called on the main thread");
    return false;
}

}  // namespace qorvex
