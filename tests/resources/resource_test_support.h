// The engine's floor without a library: allocator, log and one task family, all on the test's thread.
#pragma once

#include <gtest/gtest.h>
#include <qorvex/resource_handler.h>

#include <string>
#include <vector>

#include "core/frame/client.h"
#include "core/logging/logger.h"
#include "core/memory/allocator.h"
#include "core/memory/object_pool.h"
#include "core/memory/thread_scope.h"
#include "core/tasks/task_system.h"
#include "css/values/layout_style_refs.h"
#include "resources/resource_context.h"

namespace qorvex {

class ResourceTest : public testing::Test {
  protected:
    ResourceTest() {
        SetAllocator(&allocator);
        StartLogging(Logging::Trace, &log);
        OpenThreadScope();
        css::CreateDefaultStyles();
        tasks = New<TaskSystem, MemoryTag::General>(TaskSystemSettings{});
        family = TaskFamilyHandle{1, tasks};
        tasks->OpenChannel(TaskChannels::Main, 1);
        tasks->OpenChannel(TaskChannels::Resources, 1);
        responses = MakeUnique<ClientResponsePool, MemoryTag::Resources>();
        context = MakeRef<ResourceContext>(&files, *responses, false);
    }
    ~ResourceTest() override {
        context.reset();
        responses.reset();
        tasks->DestroyFamily(1);
        Delete<MemoryTag::General>(tasks);
        css::DestroyDefaultStyles();
        FreePoolChunks();
        CloseThreadScope();
        EndLogging();
        FreeIdleThreadRecords();
        EXPECT_EQ(allocator.blocks(), 0);
        EXPECT_EQ(allocator.wrong_tags(), 0u);
        SetAllocator(nullptr);
    }

    // Resource work, then its results on the main channel.
    void RunTasks() {
        tasks->Run(TaskChannels::Resources, false, nullptr, 1);
        tasks->Run(TaskChannels::Main, false, nullptr, 1);
    }
    static URL MakeURL(const char* text) {
        URL url;
        url.Parse(text);
        return url;
    }

    client::Allocator allocator;
    client::Log log;
    client::Files files;
    TaskSystem* tasks = nullptr;
    TaskFamilyHandle family;
    UniquePtr<ClientResponsePool, MemoryTag::Resources> responses;
    RefPtr<ResourceContext> context;
};

}  // namespace qorvex
