// The two kinds of work that client threads do for the engine, and how long a call stays.
#pragma once

#include <cstdint>

namespace qorvex {

enum class WorkType : std::uint32_t {
    Resources = 0,  // parsing, decoding, font data; any number of threads, any order
    Layout = 1,     // the layout side of one view's frame; one thread at a time per view
};

enum class WorkExecutionMode : std::uint32_t {
    RunUntilEmpty = 0,    // return as soon as nothing is queued
    RunUntilStopped = 1,  // wait for more work until Library::StopWorkers
};

// Stands for "all task families" in OnWorkAvailable and Library::ExecuteWork.
constexpr std::uint32_t kAllTaskFamilies = 0xFFFFFFFFu;

// Tells the client that a task has landed. It runs on the thread that pushed the task, while an engine lock
// is held: note the fact (wake a thread, enqueue a job) and return. Calling back into the engine from here is
// refused with an error line.
using OnWorkAvailableCallback = void (*)(void* userData, WorkType type, std::uint32_t taskFamily);

}  // namespace qorvex
