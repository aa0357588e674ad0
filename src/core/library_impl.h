// The one library object of a process: what every system stands on.
//
// Members die in reverse order of their start. Main thread, but for ExecuteWork.
#pragma once

#include <fresco/rendering_library.h>
#include <qorvex/library.h>

#include <atomic>

#include "core/adapters/rendering_adapters.h"
#include "core/debug/debug_interfaces.h"
#include "core/memory/containers.h"
#include "core/memory/thread_scope.h"
#include "core/render/paint_helpers.h"
#include "core/render/renderer_registry.h"
#include "core/tasks/task_system.h"
#include "core/tasks/timer.h"
#include "resources/client_response.h"

namespace qorvex {

class SystemImpl;
class ThreadCountingAllocator;

class LibraryImpl final : public Library {
  public:
    LibraryImpl() = default;
    ~LibraryImpl() override = default;

    // Sets the allocator, makes the library and starts it; null on failure.
    static Library* Create(const LibraryParams& params, fresco::IRenderingLibrary* external);

    System* CreateSystem(const SystemSettings& settings) override;
    void StopWorkers() override;
    void Uninitialize(bool shutdown_script_engine) override;
    void* GetFeatureInterface(unsigned id) override;
    void ExecuteWork(WorkType type, WorkExecutionMode mode, unsigned task_family) override;
    void ForwardToRenderingLibrary(uint64_t first, uint64_t second, uint64_t third) override;

    TaskSystem& GetTasks() { return *tasks_; }
    TimerQueue& GetTimers() { return timers_; }
    fresco::IRenderingLibrary& GetRendering() { return *rendering_; }
    bool IsRenderingLibraryExternal() const { return rendering_is_external_; }
    bool UsesDedicatedLayoutThread() const { return use_dedicated_layout_thread_; }
    bool SnapsToPixels() const { return snap_to_pixels_; }
    bool PreloadsFontData() const { return preload_font_data_; }
    const char* GetDefaultFontFamily() const { return default_font_family_.c_str(); }
    // A family id that no system, view or service has.
    uint32_t TakeFamily() { return next_family_.fetch_add(1); }
    DebugInterfaces& GetDebugInterfaces() { return debug_; }
    ClientResponsePool& GetResponses() { return *responses_; }
    RendererRegistry& GetRenderers() { return renderers_; }
    void OnSystemDestroyed(SystemImpl* system);

  private:
    bool Start(const LibraryParams& params, fresco::IRenderingLibrary* external);
    void StartPaintHelpers(const char* options);
    bool StartRendering(const LibraryParams& params, fresco::IRenderingLibrary* external);
    void ReadOptions(const char* options);
    void DestroyForgottenSystems();
    void Fail();
    void Free();

    TimerQueue timers_;
    UniquePtr<TaskSystem, MemoryTag::General> tasks_;
    UniquePtr<FrescoLogHandler, MemoryTag::Rendering> adapted_log_;
    UniquePtr<FrescoAllocator, MemoryTag::Rendering> adapted_allocator_;
    UniquePtr<PaintHelpers, MemoryTag::Rendering> paint_helpers_;
    bool rendering_is_external_ = false;
    fresco::IRenderingLibrary* rendering_ = nullptr;
    UniquePtr<ClientResponsePool, MemoryTag::Resources> responses_;
    RendererRegistry renderers_;
    Vector<SystemImpl*> systems_;
    // In ExecuteWork.
    std::atomic<uint32_t> threads_at_work_{0};
    DebugInterfaces debug_;
    ThreadCountingAllocator* counting_allocator_ = nullptr;  // null unless asked for
    String default_font_family_;
    std::atomic<uint32_t> next_family_{0};
    bool use_dedicated_layout_thread_ = false;
    bool snap_to_pixels_ = true;
    bool preload_font_data_ = true;
    bool main_scope_open_ = false;
};

// The library of the process; null before Initialize and after Uninitialize.
LibraryImpl* GetLibrary();

}  // namespace qorvex
