// Bump allocator of one parse. Ordinary pages need 10 to 18 times their size, hostile ones 60 and more, so
// the arena starts at a guess and spills into further chunks; nothing is freed before the whole.
#pragma once

#include <cstddef>

namespace qorvex::dom {

class ParseArena {
  public:
    explicit ParseArena(size_t first_chunk_bytes);
    ~ParseArena();
    ParseArena(const ParseArena&) = delete;
    ParseArena& operator=(const ParseArena&) = delete;

    void* Allocate(size_t bytes);
    size_t GetAllocatedBytes() const { return allocated_; }

  private:
    struct Chunk;
    void AddChunk(size_t bytes);

    Chunk* chunks_ = nullptr;
    char* next_ = nullptr;
    char* end_ = nullptr;
    size_t first_chunk_bytes_;
    size_t allocated_ = 0;
};

}  // namespace qorvex::dom
