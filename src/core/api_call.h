// What every public operation of a view does around its work: a thread scope on entry; on exit the tasks that
// must not run inside the operation that caused them (channel AfterAPICall). Operations nest when a listener
// calls back: then the outermost one runs them.
#pragma once

#include "core/memory/thread_scope.h"
#include "core/tasks/task_system.h"

namespace qorvex {

class APICall {
  public:
    APICall(TaskFamilyHandle family, uint32_t& depth) : family_(family), depth_(depth) { ++depth_; }
    ~APICall() {
        if (depth_ == 1) family_.system->Run(TaskChannels::AfterAPICall, false, nullptr, family_.family);
        --depth_;
    }
    APICall(const APICall&) = delete;
    APICall& operator=(const APICall&) = delete;

  private:
    ThreadScope scope_;
    TaskFamilyHandle family_;
    uint32_t& depth_;
};

}  // namespace qorvex
