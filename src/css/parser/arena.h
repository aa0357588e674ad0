// Bump memory of one parse. Nothing is freed before the arena; what lies in it needs no destructor.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <type_traits>
#include <utility>

namespace qorvex::css {

class ParserArena {
  public:
    explicit ParserArena(size_t chunkSize) : chunkSize_(chunkSize) {}
    ~ParserArena();
    ParserArena(const ParserArena&) = delete;
    ParserArena& operator=(const ParserArena&) = delete;

    template <class T, class... Args>
    [[nodiscard]] T* Make(Args&&... args) {
        static_assert(std::is_trivially_destructible_v<T>, "the arena runs no destructors");
        return new (Allocate(sizeof(T), alignof(T))) T{std::forward<Args>(args)...};
    }
    [[nodiscard]] void* Allocate(size_t size, size_t alignment) {
        uintptr_t start = (next_ + alignment - 1) & ~(uintptr_t{alignment} - 1);
        if (next_ == 0 || start + size > end_) return AllocateSlow(size, alignment);
        next_ = start + size;
        return reinterpret_cast<void*>(start);
    }
    [[nodiscard]] std::string_view Copy(std::string_view text);

    // Text built piece by piece at the end of the arena. One text at a time; nothing else may be allocated
    // until it is finished.
    void BeginText() { textStart_ = 0, textSize_ = 0; }
    void AppendText(std::string_view piece);
    [[nodiscard]] std::string_view FinishText();

    size_t BytesReserved() const { return reserved_; }

  private:
    struct Chunk {
        Chunk* previous;
    };
    void* AllocateSlow(size_t size, size_t alignment);
    void AddChunk(size_t atLeast);

    const size_t chunkSize_;
    Chunk* last_ = nullptr;
    uintptr_t next_ = 0;
    uintptr_t end_ = 0;
    uintptr_t textStart_ = 0;
    size_t textSize_ = 0;
    size_t reserved_ = 0;
};

}  // namespace qorvex::css
