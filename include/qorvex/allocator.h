/// The client's memory. Every block that the engine uses comes from one `IAllocator`, and each request names
/// the subsystem that it is for.
#pragma once

#include <cstddef>
#include <cstdint>

namespace qorvex {

/// What a block is for. A block is released with the tag that it was allocated with.
enum class MemoryTag : uint32_t {
    General = 2,        ///< Library, systems, views, bookkeeping of caches, per-thread records, event chunks.
    Logging = 3,        ///< Logger, default log handler, log streams.
    Resources = 4,      ///< Resource jobs and requests.
    DOM = 5,            ///< Nodes, events, listeners, objects that scripts see.
    LayoutData = 7,     ///< Frame records, strings of the layout side.
    LayoutNodes = 8,    ///< Pooled layout objects.
    CSS = 9,            ///< Style tables.
    Tasks = 10,         ///< Tasks and their queues; aligned operations, alignment 8.
    Rendering = 11,     ///< Frames, lists of decoded images, adapters for the rendering library.
    ParserArena = 13,   ///< The arena of the HTML parser.
    Temporary = 14,     ///< Blocks of temporary memory.
    DebugDump = 16,     ///< Text of dumps.
    ScriptEngine = 17,  ///< Everything that the script engine allocates.
    Inspector = 19,     ///< Inspector server.
    Media = 24,         ///< Media player and decoders.
};

/// Tags are below this number.
inline constexpr unsigned kMemoryTagLimit = 26;

/// Implemented by the client, called from every thread that runs the engine. The operations must not fail:
/// the engine does not look for null. A block goes back through the operation that matches the one it came
/// from (plain with plain, aligned with aligned).
class IAllocator {
  public:
    /// At least `size` bytes, aligned for any fundamental type.
    virtual void* Allocate(size_t size, MemoryTag tag) = 0;
    /// Grows or shrinks a plain block and keeps its content. `ptr` may be null.
    virtual void* Reallocate(void* ptr, size_t newSize, MemoryTag tag) = 0;
    /// Releases a plain block. `ptr` may be null.
    virtual void Deallocate(void* ptr, MemoryTag tag) = 0;
    /// `alignment` is a power of two.
    virtual void* AlignedAllocate(size_t size, size_t alignment, MemoryTag tag) = 0;
    /// Releases an aligned block. `ptr` may be null.
    virtual void AlignedDeallocate(void* ptr, MemoryTag tag) = 0;
    /// Grows or shrinks an aligned block and keeps its content. `ptr` may be null.
    virtual void* AlignedReallocate(void* ptr, size_t newSize, size_t oldSize, size_t alignment,
                                    MemoryTag tag) = 0;
    /// Works on pages of address space for a script engine that manages its own: reserves (`operation` 0),
    /// commits (1), decommits (2) or releases (3) `size` bytes at `address` and returns the address, or null
    /// when that is not offered. Nothing but the script engine's allocator calls it.
    virtual void* VirtualMemory(void* address, size_t size, unsigned operation, MemoryTag tag) {
        (void)address, (void)size, (void)operation, (void)tag;
        return nullptr;
    }
    virtual ~IAllocator() = default;
};

}  // namespace qorvex
