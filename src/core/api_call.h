// How public operations begin and end. Each opens a thread scope; those of systems and views refuse to run on
// any other thread than the main one, where they would race with it.
#pragma once

#include "core/main_thread.h"
#include "core/memory/thread_scope.h"
#include "core/tasks/task_system.h"

namespace qorvex {

// False on a wrong thread, which it has logged: the operation returns its neutral value.
class MainThreadCall {
  public:
    explicit MainThreadCall(const char* object, const char* operation = __builtin_FUNCTION())
        : allowed_(CheckMainThread(object, operation)) {}
    MainThreadCall(const MainThreadCall&) = delete;
    MainThreadCall& operator=(const MainThreadCall&) = delete;
    explicit operator bool() const { return allowed_; }

  private:
    ThreadScope scope_;
    const bool allowed_;
};

// An operation of a view. On exit it runs the tasks that must not run inside the operation that caused them
// (channel AfterAPICall). Operations nest when a listener calls back: then the outermost one runs them.
class APICall : public MainThreadCall {
  public:
    APICall(TaskFamilyHandle family, uint32_t& depth, const char* operation = __builtin_FUNCTION())
        : MainThreadCall("View", operation), family_(family), depth_(depth) {
        if (*this) ++depth_;
    }
    ~APICall() {
        if (!*this) return;
        if (depth_ == 1) family_.system->Run(TaskChannels::AfterAPICall, false, nullptr, family_.family);
        --depth_;
    }

  private:
    TaskFamilyHandle family_;
    uint32_t& depth_;
};

}  // namespace qorvex
