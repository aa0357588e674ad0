// The process-wide root of the engine.
//
// Order of life: Library::Initialize, then systems and their views; at the end destroy every view, destroy
// every system, StopWorkers, Uninitialize. The thread that calls Initialize is the main thread: all System
// and View operations and Uninitialize run on it. ExecuteWork runs on any client thread. The engine starts no
// thread.
#pragma once

#include <qorvex/export.h>
#include <qorvex/work.h>

#include <cstddef>
#include <cstdint>

namespace fresco {
class IAllocator;
class IRenderingLibrary;
namespace Logging {
class ILogHandler;
}
}  // namespace fresco

namespace qorvex {

class IAllocator;
class IFileSystemReader;
class System;
struct SystemSettings;
namespace Logging {
class ILogHandler;
}

// Configuration when the client has started the rendering library itself. All pointers are borrowed and must
// outlive the library; DefaultFontFamily is copied.
struct LibraryParamsWithExternalRenderingLibrary {
    // Required. Every allocation of the engine goes through it, from any thread.
    IAllocator* Allocator = nullptr;
    // Lowest severity (0 Trace ... 5 Assert) that reaches the log handler; 6 silences the log.
    std::uint32_t LoggingSeverity = 2;
    // Null: lines go to the file "qorvex_default.log" in the working directory and to the standard streams.
    Logging::ILogHandler* LogHandler = nullptr;
    // Handed unchanged to the rendering library. Null is allowed.
    IFileSystemReader* FileSystemReader = nullptr;
    // True: layout work is announced through OnWorkAvailable and every view lays out off the main thread.
    bool UseDedicatedLayoutThread = false;
    // True: small objects come from per-thread free lists instead of single allocations.
    bool UseObjectPools = true;
    // Called when a task lands for worker threads. Null: nobody is told, and the client must poll
    // ExecuteWork.
    OnWorkAvailableCallback OnWorkAvailable = nullptr;
    void* OnWorkAvailableUserData = nullptr;
    // Family of last resort. Null means "Droid Sans".
    const char* DefaultFontFamily = nullptr;
};

// Configuration when the engine starts the rendering library.
struct LibraryParams : LibraryParamsWithExternalRenderingLibrary {
    // Passed on to the rendering library, whose documentation tells what they mean.
    float RenderingLibraryFloatParam = 2.5f;
    std::uint32_t RenderingLibraryRegionParams[2] = {0, 0};
    // Switches, found by plain substring search, then passed on to the rendering library. Null is allowed.
    //   --dont-snap-to-integer-coords-before-transform  paint at fractional positions
    //   --disable-font-data-preloading                  do not rasterise glyphs ahead of recording
    //   --paint-helpers=N                               up to N threads inside ExecuteWork(Resources) help to
    //                                                   paint large frames (at most 15; none without it)
    const char* AdditionalOptions = nullptr;
    std::uint64_t RenderingLibraryExtraParam = 0;
};

class Library {
  public:
    // Starts the library, once per process. Null on failure, with an Error line in the log.
    QORVEX_API static Library* Initialize(const LibraryParams& params);

    // The same with a rendering library that the client started and later destroys itself. Fails with null
    // when the rendering library is of another build than this engine expects.
    QORVEX_API static Library* InitializeWithRenderingLibrary(
        const LibraryParamsWithExternalRenderingLibrary& params, fresco::IRenderingLibrary* renderingLibrary);

    // The user agent of views that set none. A static string.
    QORVEX_API static const char* GetDefaultUserAgent();

    // Announces what the calling thread will be used for. Both work types are accepted and have no effect.
    QORVEX_API static void HintThreadUsage(WorkType type);

    // Percent-decodes length bytes of in. The decoded size, terminating zero included, is always written to
    // *outLength; the text is written to out when out is not null. Any thread, between Initialize and
    // Uninitialize.
    QORVEX_API static void DecodeURLString(const char* in, unsigned length, char* out, unsigned* outLength);

  protected:
    virtual ~Library() = default;

  public:
    // Main thread. The result is owned by the caller and released with System::Destroy.
    virtual System* CreateSystem(const SystemSettings& settings) = 0;

    // Main thread. Every thread inside ExecuteWork returns, and later calls return at once. Call it when all
    // systems are destroyed; frames that are still on the layout side are dropped.
    virtual void StopWorkers() = 0;

    // Main thread, last call; the object is gone afterwards. Stops the workers first, with an Error line,
    // when StopWorkers was forgotten; systems, views and renderers that were forgotten are destroyed, with an
    // Error line. No other thread may be in the engine, but for those that are on their way out of
    // ExecuteWork. Refused inside an operation of a view. With shutdownScriptEngine the script engine's
    // process-wide state goes too, and the library cannot be initialised again in this process.
    virtual void Uninitialize(bool shutdownScriptEngine) = 0;

    // Optional interfaces by id (<qorvex/feature_interfaces.h>); null for an id that is not known. The
    // objects belong to the library.
    virtual void* GetFeatureInterface(unsigned id) = 0;

    // Any client thread, but not from inside OnWorkAvailable. Runs tasks of the given type on the calling
    // thread. Layout work is taken from the one family; resource work from all families.
    virtual void ExecuteWork(WorkType type, WorkExecutionMode mode, unsigned taskFamily) = 0;

    // Hands three words to the rendering library, unseen by the engine.
    virtual void ForwardToRenderingLibrary(std::uint64_t first, std::uint64_t second,
                                           std::uint64_t third) = 0;
};

// For a client that starts the rendering library itself: wraps the engine's allocator and log handler in the
// objects that the rendering library takes. Both wrappers are allocated from allocator, and must be destroyed
// with the second function after the rendering library has gone. allocator and logHandler must outlive them.
QORVEX_API void AdaptRenderingAllocatorAndLoggerFromQorvex(IAllocator* allocator,
                                                           Logging::ILogHandler* logHandler,
                                                           fresco::IAllocator** outAllocator,
                                                           fresco::Logging::ILogHandler** outLogHandler);
QORVEX_API void DestroyAdaptedRenderingAllocatorAndLogger(IAllocator* allocator,
                                                          fresco::IAllocator* adaptedAllocator,
                                                          fresco::Logging::ILogHandler* adaptedLogHandler);

}  // namespace qorvex
