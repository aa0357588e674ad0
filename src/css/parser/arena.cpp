#include "css/parser/arena.h"

#include <cstring>

#include "core/memory/allocator.h"

namespace qorvex::css {

ParserArena::~ParserArena() {
    while (last_) {
        Chunk* previous = last_->previous;
        GetAllocator()->Deallocate(last_, MemoryTag::CSS);
        last_ = previous;
    }
}

void ParserArena::AddChunk(size_t atLeast) {
    size_t size = sizeof(Chunk) + std::max(chunkSize_, atLeast);
    Chunk* chunk = static_cast<Chunk*>(GetAllocator()->Allocate(size, MemoryTag::CSS));
    chunk->previous = last_;
    last_ = chunk;
    next_ = reinterpret_cast<uintptr_t>(chunk + 1);
    end_ = reinterpret_cast<uintptr_t>(chunk) + size;
    reserved_ += size;
}

void* ParserArena::AllocateSlow(size_t size, size_t alignment) {
    AddChunk(size + alignment);
    return Allocate(size, alignment);
}

std::string_view ParserArena::Copy(std::string_view text) {
    if (text.empty()) return {};
    char* copy = static_cast<char*>(Allocate(text.size(), 1));
    std::memcpy(copy, text.data(), text.size());
    return {copy, text.size()};
}

void ParserArena::AppendText(std::string_view piece) {
    if (textSize_ == 0) textStart_ = next_;
    if (next_ == 0 || next_ + piece.size() > end_) {
        // The text moves to a chunk with room for twice its size, so that growing it stays linear.
        uintptr_t old = textStart_;
        AddChunk(2 * (textSize_ + piece.size()));
        if (textSize_ > 0)
            std::memcpy(reinterpret_cast<void*>(next_), reinterpret_cast<void*>(old), textSize_);
        textStart_ = next_;
        next_ += textSize_;
    }
    if (!piece.empty()) std::memcpy(reinterpret_cast<void*>(next_), piece.data(), piece.size());
    next_ += piece.size();
    textSize_ += piece.size();
}

std::string_view ParserArena::FinishText() {
    return {reinterpret_cast<const char*>(textStart_), textSize_};
}

}  // namespace qorvex::css
