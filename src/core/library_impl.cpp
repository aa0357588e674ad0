#include "core/library_impl.h"

#include <fresco/library.h>
#include <qorvex/file_system.h>

#include <thread>

#include "core/debug/thread_counting_allocator.h"
#include "core/logging/log.h"
#include "core/logging/logger.h"
#include "core/main_thread.h"
#include "core/memory/family_names.h"
#include "core/memory/pool.h"
#include "core/system_impl.h"
#include "css/values/layout_style_refs.h"
#include "script/bindings/bound_classes.h"
#include "script/engine_seam.h"

// The build tells which revision it was made from.
#ifndef QORVEX_REVISION
#define QORVEX_REVISION "0000000000000000000000000000000000000000"
#endif

namespace qorvex {

namespace {

constexpr const char* kRevision = QORVEX_REVISION;
constexpr uint32_t kLibraryFamily = 0;
constexpr const char* kDefaultFontFamily = "Droid Sans";

LibraryImpl* g_library = nullptr;

bool HasOption(const char* options, std::string_view option) {
    return options && std::string_view(options).find(option) != std::string_view::npos;
}

}  // namespace

LibraryImpl* GetLibrary() {
    return g_library;
}

Library* LibraryImpl::Create(const LibraryParams& params, fresco::IRenderingLibrary* external) {
    if (!params.Allocator) return nullptr;
    SetAllocator(params.Allocator);
    ThreadCountingAllocator* counting = nullptr;
    if (HasOption(params.AdditionalOptions, kCountAllocationsOption)) {
        counting = New<ThreadCountingAllocator, MemoryTag::General>(*params.Allocator);
        SetAllocator(counting);
    }
    auto* library = New<LibraryImpl, MemoryTag::General>();
    library->counting_allocator_ = counting;
    if (!library->Start(params, external)) {
        library->Fail();
        return nullptr;
    }
    LogInfo("QORVEX library initialized!");
    return library;
}

bool LibraryImpl::Start(const LibraryParams& params, fresco::IRenderingLibrary* external) {
    SetMainThread();
    SetPoolsEnabled(params.UseObjectPools);
    ThreadScope scope;
    TempMark mark;
    StartLogging(static_cast<Logging::Severity>(params.LoggingSeverity), params.LogHandler);
    if (external && std::string_view(external->GetBuildIdentifier()) != fresco::kBuildIdentifier.text) {
        LogError("Invalid Rendering Library version provided!");
        return false;
    }
    LogInfo("Initializing QORVEX ver. ", QORVEX_VERSION_TEXT);
    LogTrace("QORVEX revision ", kRevision);
    ReadOptions(params.AdditionalOptions);
    g_library = this;
    script::StartScriptEngine();
    default_font_family_ =
        std::string_view(params.DefaultFontFamily ? params.DefaultFontFamily : kDefaultFontFamily);
    StartFamilyNames(default_font_family_);
    css::CreateDefaultStyles();

    LogTrace("Initializing task system...");
    use_dedicated_layout_thread_ = params.UseDedicatedLayoutThread;
    TaskSystemSettings settings;
    settings.use_dedicated_layout_thread = params.UseDedicatedLayoutThread;
    settings.on_work_available = params.OnWorkAvailable;
    settings.user_data = params.OnWorkAvailableUserData;
    tasks_ = MakeUnique<TaskSystem, MemoryTag::General>(settings);
    responses_ = MakeUnique<ClientResponsePool, MemoryTag::Resources>();

    TakeFamily();  // kLibraryFamily; the first system gets family 1
    script::CreateScriptClasses();

    LogTrace("Initializing Fresco...");
    if (!StartRendering(params, external)) return false;
    if (!external) StartPaintHelpers(params.AdditionalOptions);
    OpenThreadScope();  // for the life of the library: the main thread keeps its temporary memory
    main_scope_open_ = true;
    return true;
}

void LibraryImpl::ReadOptions(const char* options) {
    snap_to_pixels_ = !HasOption(options, "--dont-snap-to-integer-coords-before-transform");
    preload_font_data_ = !HasOption(options, "--disable-font-data-preloading");
}

bool LibraryImpl::StartRendering(const LibraryParams& params, fresco::IRenderingLibrary* external) {
    adapted_log_ = MakeUnique<FrescoLogHandler, MemoryTag::Rendering>(params.LogHandler);
    adapted_allocator_ = MakeUnique<FrescoAllocator, MemoryTag::Rendering>(*params.Allocator);
    rendering_ = external;
    rendering_is_external_ = external != nullptr;
    if (external) {
        // Command buffers and decoded images are made inside this library, wherever they are drawn.
        fresco::Library::Start(adapted_allocator_.get(), adapted_log_.get(), params.LoggingSeverity);
    } else {
        fresco::RenderingLibraryParams rendering;
        rendering.allocator = adapted_allocator_.get();
        rendering.logHandler = adapted_log_.get();
        rendering.loggingSeverity = params.LoggingSeverity;
        rendering.floatParam = params.RenderingLibraryFloatParam;
        rendering.regionParams[0] = params.RenderingLibraryRegionParams[0];
        rendering.regionParams[1] = params.RenderingLibraryRegionParams[1];
        rendering.additionalOptions = params.AdditionalOptions;
        rendering.extraParam = params.RenderingLibraryExtraParam;
        rendering_ = fresco::IRenderingLibrary::Initialize(rendering);
    }
    if (!rendering_) {
        LogError("Unable to start the rendering library!");
        return false;
    }
    rendering_->SetFileManipulator(params.FileSystemReader);
    return true;
}

// A client that starts the rendering library itself gives it helpers itself.
void LibraryImpl::StartPaintHelpers(const char* options) {
    constexpr std::string_view kOption = "--paint-helpers=";
    if (!HasOption(options, kOption)) return;
    const std::string_view text(options);
    const unsigned long count = std::strtoul(options + text.find(kOption) + kOption.size(), nullptr, 10);
    if (count == 0) return;
    paint_helpers_ = MakeUnique<PaintHelpers, MemoryTag::Rendering>(
        *tasks_, kLibraryFamily, static_cast<uint32_t>(std::min(count, 15ul)));
    rendering_->SetPaintHelpers(paint_helpers_.get());
}

// Undoes what of Start had been done.
void LibraryImpl::Fail() {
    timers_.CancelAll();
    if (tasks_) {
        tasks_->Stop();
        tasks_.reset();
        script::ReleaseScriptClasses();
    }
    if (g_library) {
        css::DestroyDefaultStyles();
        StopFamilyNames();
    }
    FreePoolChunks();
    EndLogging();
    FreeIdleThreadRecords();
    Free();
}

// The last of the library. The allocator's own block goes back to the client directly.
void LibraryImpl::Free() {
    g_library = nullptr;
    ThreadCountingAllocator* counting = counting_allocator_;
    Delete<MemoryTag::General>(this);
    if (counting) {
        SetAllocator(&counting->GetClient());
        Delete<MemoryTag::General>(counting);
    }
    SetAllocator(nullptr);
}

System* LibraryImpl::CreateSystem(const SystemSettings& settings) {
    ThreadScope scope;
    if (!CheckMainThread("Library", "CreateSystem")) return nullptr;
    systems_.push_back(New<SystemImpl, MemoryTag::General>(*this, settings, TakeFamily()));
    return systems_[systems_.size() - 1];
}

void LibraryImpl::OnSystemDestroyed(SystemImpl* system) {
    systems_.erase_if([&](SystemImpl* other) { return other == system; });
}

void LibraryImpl::DestroyForgottenSystems() {
    while (!systems_.empty()) {
        LogError("Library::Uninitialize called before its systems were destroyed");
        systems_[systems_.size() - 1]->Destroy();
    }
}

void LibraryImpl::StopWorkers() {
    ThreadScope scope;
    LogTrace("Uninitializing task system...");
    tasks_->Stop();
    // Frames that wait for a layout thread wait in vain now, and so does a Paint that waits for them.
    if (!IsMainThread()) return;
    for (SystemImpl* system : systems_)
        system->OnWorkersStopped();
}

void LibraryImpl::Uninitialize(bool shutdown_script_engine) {
    if (!CheckMainThread("Library", "Uninitialize")) return;
    for (const SystemImpl* system : systems_) {
        if (!system->IsInsideOperation()) continue;
        LogError("Library::Uninitialize must not be called from inside an operation of a view");
        return;
    }
    {
        ThreadScope scope;
        if (tasks_->IsRunning()) {
            LogError("You must call StopWorkers before Uninitialize!");
            tasks_->Stop();
        }
        DestroyForgottenSystems();
        renderers_.DestroyForgotten();
        // Threads that StopWorkers has sent home may still be on their way out.
        while (threads_at_work_.load(std::memory_order_acquire) != 0)
            std::this_thread::yield();
        // With it go the requests that the client never finished.
        responses_.reset();
        tasks_.reset();
        if (rendering_is_external_) {
            fresco::Library::Stop();
        } else {
            LogTrace("Uninitializing Fresco...");
            rendering_->SetPaintHelpers(nullptr);
            rendering_->Destroy();
        }
        paint_helpers_.reset();
        rendering_ = nullptr;
        script::ReleaseScriptClasses();
        LogInfo("Uninitializing QORVEX library!");
        StopFamilyNames();
        css::DestroyDefaultStyles();
        CloseThreadScope();  // the one that Start left open
    }
    FreePoolChunks();
    EndLogging();
    FreeIdleThreadRecords();
    timers_.CancelAll();
    if (shutdown_script_engine) script::StopScriptEngine();
    Free();
}

void* LibraryImpl::GetFeatureInterface(unsigned id) {
    ThreadScope scope;
    return debug_.Get(id);
}

void LibraryImpl::ExecuteWork(WorkType type, WorkExecutionMode mode, unsigned task_family) {
    threads_at_work_.fetch_add(1, std::memory_order_relaxed);
    {
        ThreadScope scope;
        tasks_->ExecuteWork(type, mode, task_family);
    }
    threads_at_work_.fetch_sub(1, std::memory_order_release);
}

void LibraryImpl::ForwardToRenderingLibrary(uint64_t first, uint64_t second, uint64_t third) {
    ThreadScope scope;
    rendering_->Forward(first, second, third);
}

}  // namespace qorvex
