#include "dom/parse_arena.h"

#include <cstdint>

#include "core/memory/allocator.h"

namespace qorvex::dom {

struct ParseArena::Chunk {
    Chunk* next;
    size_t size;
};

namespace {
constexpr size_t kAlignment = alignof(std::max_align_t);
constexpr size_t kSpillBytes = 0x40000;  // at least; doubled with what the arena already has
}  // namespace

ParseArena::ParseArena(size_t first_chunk_bytes) : first_chunk_bytes_(first_chunk_bytes) {}

ParseArena::~ParseArena() {
    while (chunks_) {
        Chunk* next = chunks_->next;
        GetAllocator()->Deallocate(chunks_, MemoryTag::ParserArena);
        chunks_ = next;
    }
}

void* ParseArena::Allocate(size_t bytes) {
    bytes = (bytes + kAlignment - 1) & ~(kAlignment - 1);
    if (bytes > static_cast<size_t>(end_ - next_)) AddChunk(bytes);
    void* memory = next_;
    next_ += bytes;
    return memory;
}

void ParseArena::AddChunk(size_t bytes) {
    size_t size = chunks_ ? std::max(kSpillBytes, allocated_ / 2) : first_chunk_bytes_;
    size = std::max(size, bytes) + sizeof(Chunk) + kAlignment;
    auto* chunk = static_cast<Chunk*>(GetAllocator()->Allocate(size, MemoryTag::ParserArena));
    chunk->next = chunks_;
    chunk->size = size;
    chunks_ = chunk;
    allocated_ += size;
    auto start = reinterpret_cast<uintptr_t>(chunk + 1);
    start = (start + kAlignment - 1) & ~(uintptr_t{kAlignment} - 1);
    next_ = reinterpret_cast<char*>(start);
    end_ = reinterpret_cast<char*>(chunk) + size;
}

}  // namespace qorvex::dom
