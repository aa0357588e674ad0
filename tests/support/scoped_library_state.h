// What the engine's code needs around it in a unit test: an allocator, a log and a thread scope. At its end
// it checks that every block went back with its tag. Make it the first member of a fixture, or derive the
// fixture from QorvexTest.
#pragma once

#include <gtest/gtest.h>

#include "core/logging/logger.h"
#include "core/memory/allocator.h"
#include "core/memory/object_pool.h"
#include "core/memory/thread_scope.h"
#include "support/capturing_log_handler.h"
#include "support/test_allocator.h"

namespace qorvex::test {

class ScopedLibraryState {
  public:
    explicit ScopedLibraryState(Logging::Severity threshold = Logging::Trace) {
        SetAllocator(&allocator);
        StartLogging(threshold, &log);
        OpenThreadScope();
    }
    ~ScopedLibraryState() {
        FreePoolChunks();
        CloseThreadScope();
        EndLogging();
        FreeIdleThreadRecords();
        EXPECT_EQ(allocator.Report(), "");
        SetAllocator(nullptr);
    }
    ScopedLibraryState(const ScopedLibraryState&) = delete;
    ScopedLibraryState& operator=(const ScopedLibraryState&) = delete;

    TestAllocator allocator;
    CapturingLogHandler log;
};

class QorvexTest : public ::testing::Test {
  protected:
    ScopedLibraryState library_;
    TestAllocator& allocator_ = library_.allocator;
    CapturingLogHandler& log_ = library_.log;
};

}  // namespace qorvex::test
