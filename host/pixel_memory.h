#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <new>
#include <span>

#if defined(__linux__)
#include <sys/mman.h>
#endif

namespace qorvex::host {

// Zeroed memory of a picture, in large pages where the system has them: a screen spans a thousand small ones,
// and a third of the time of a fill that finds the caches cold goes to their addresses. Takes up to 2 MB more
// than it is asked for, but not for pictures smaller than that.
class PixelMemory {
  public:
    PixelMemory() = default;
    explicit PixelMemory(std::size_t size) : size_(size) {
        constexpr std::size_t kLargePage = std::size_t{2} << 20;
        const std::size_t alignment = size < kLargePage ? kSmallest : kLargePage;
        const std::size_t capacity = (size + alignment - 1) / alignment * alignment;
        bytes_.reset(
            static_cast<std::uint8_t*>(std::aligned_alloc(alignment, capacity ? capacity : alignment)));
        if (!bytes_) throw std::bad_alloc();
#if defined(__linux__)
        // Advice: without it all is as before.
        if (alignment == kLargePage) (void)madvise(bytes_.get(), capacity, MADV_HUGEPAGE);
#endif
        std::memset(bytes_.get(), 0, size);
    }

    [[nodiscard]] std::uint8_t* data() {
        return bytes_.get();
    }
    [[nodiscard]] std::span<const std::uint8_t> View() const {
        return {bytes_.get(), size_};
    }

  private:
    static constexpr std::size_t kSmallest = 64;
    struct Free {
        void operator()(std::uint8_t* bytes) const { std::free(bytes); }
    };
    std::size_t size_ = 0;
    std::unique_ptr<std::uint8_t, Free> bytes_;
};

}  // namespace qorvex::host
