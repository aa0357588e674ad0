#include "fresco/core/process.h"

#include <cstdarg>
#include <cstdio>
#include <mutex>

#include <fresco/library.h>
#include "fresco/commands/buffer_pool.h"
#include "fresco/core/heap.h"
#include "fresco/core/log.h"
#include "fresco/images/animation.h"

namespace fresco {
namespace {

class MallocAllocator final : public IAllocator {
  public:
    void* Allocate(size_t size, size_t alignment) override {
        if (alignment <= alignof(std::max_align_t)) return std::malloc(size);
        return std::aligned_alloc(alignment, (size + alignment - 1) / alignment * alignment);
    }
    void Deallocate(void* block, size_t) override { std::free(block); }
};

struct Process {
    MallocAllocator mallocAllocator;
    std::atomic<IAllocator*> allocator{nullptr};
    std::atomic<Logging::ILogHandler*> log{nullptr};
    std::atomic<uint32_t> severity{Logging::Info};
    std::atomic<uint32_t> nextImage{1};
    std::atomic<uint32_t> nextSurface{1};
    std::atomic<bool> debugNames{false};
    std::mutex startMutex;
    int starts = 0;
};

Process& GetProcess() {
    static Process process;
    return process;
}

}  // namespace

void* HeapAllocate(size_t size, size_t alignment) {
    Process& process = GetProcess();
    IAllocator* allocator = process.allocator.load(std::memory_order_acquire);
    return (allocator ? allocator : &process.mallocAllocator)->Allocate(size ? size : 1, alignment);
}

void HeapFree(void* block, size_t alignment) {
    if (!block) return;
    Process& process = GetProcess();
    IAllocator* allocator = process.allocator.load(std::memory_order_acquire);
    (allocator ? allocator : &process.mallocAllocator)->Deallocate(block, alignment);
}

void HeapExhausted(size_t size) {
    Log(Logging::Error, "The client's allocator has no memory left for %zu bytes", size);
    std::abort();
}

void Log(Logging::Severity severity, const char* format, ...) {
    Process& process = GetProcess();
    Logging::ILogHandler* handler = process.log.load(std::memory_order_acquire);
    if (!handler || severity < process.severity.load(std::memory_order_relaxed)) return;
    char text[512];
    va_list arguments;
    va_start(arguments, format);
    const int length = std::vsnprintf(text, sizeof(text), format, arguments);
    va_end(arguments);
    if (length > 0) handler->WriteLog(severity, text, std::min<size_t>(size_t(length), sizeof(text) - 1));
}

void AssertFailure(const char* text) {
    Log(Logging::Assert, "Assert failure: %s", text);
}

bool DebugNamesEnabled() {
    return GetProcess().debugNames.load(std::memory_order_relaxed);
}

void Library::Start(IAllocator* allocator, Logging::ILogHandler* log, uint32_t severity) {
    Process& process = GetProcess();
    std::lock_guard lock(process.startMutex);
    if (process.starts++ > 0) return;
    DrainBufferPool();
    CloseAnimations();
    process.severity.store(severity, std::memory_order_relaxed);
    process.log.store(log, std::memory_order_release);
    process.allocator.store(allocator, std::memory_order_release);
}

void Library::Stop() {
    Process& process = GetProcess();
    std::lock_guard lock(process.startMutex);
    if (process.starts == 0 || --process.starts > 0) return;
    DrainBufferPool();
    CloseAnimations();
    process.allocator.store(nullptr, std::memory_order_release);
    process.log.store(nullptr, std::memory_order_release);
}

ImageId Library::GetImageName() {
    return GetProcess().nextImage.fetch_add(1, std::memory_order_relaxed);
}

SurfaceId Library::GetSurfaceName() {
    return GetProcess().nextSurface.fetch_add(1, std::memory_order_relaxed);
}

void Library::EnableDebugNames(bool enable) {
    GetProcess().debugNames.store(enable, std::memory_order_relaxed);
}

}  // namespace fresco
