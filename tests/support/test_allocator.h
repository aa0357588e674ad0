// Allocator for tests: counts blocks and bytes by tag, and notes every release that does not match its
// allocation (wrong tag, wrong operation, unknown block).
#pragma once

#include <atomic>
#include <cstdint>
#include <cstdlib>
#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

#include <qorvex/allocator.h>

namespace qorvex::test {

class TestAllocator final : public IAllocator {
  public:
    void* Allocate(size_t size, MemoryTag tag) override {
        return Note(std::malloc(size ? size : 1), size, 0, tag);
    }
    void* Reallocate(void* ptr, size_t newSize, MemoryTag tag) override {
        if (ptr) Forget(ptr, false, tag);
        return Note(std::realloc(ptr, newSize ? newSize : 1), newSize, 0, tag);
    }
    void Deallocate(void* ptr, MemoryTag tag) override {
        if (!ptr) return;
        Forget(ptr, false, tag);
        std::free(ptr);
    }
    void* AlignedAllocate(size_t size, size_t alignment, MemoryTag tag) override {
        void* memory = nullptr;
        const size_t least = alignment < sizeof(void*) ? sizeof(void*) : alignment;
        if (posix_memalign(&memory, least, size ? size : 1) != 0) std::abort();
        return Note(memory, size, alignment, tag);
    }
    void AlignedDeallocate(void* ptr, MemoryTag tag) override {
        if (!ptr) return;
        Forget(ptr, true, tag);
        std::free(ptr);
    }
    void* AlignedReallocate(void* ptr, size_t newSize, size_t oldSize, size_t alignment,
                            MemoryTag tag) override {
        void* fresh = AlignedAllocate(newSize, alignment, tag);
        if (ptr) {
            __builtin_memcpy(fresh, ptr, oldSize < newSize ? oldSize : newSize);
            AlignedDeallocate(ptr, tag);
        }
        return fresh;
    }

    /// Allocations so far: tests count with it, they never time.
    uint64_t Allocations() const { return allocations_; }
    uint64_t Allocations(MemoryTag tag) const { return by_tag_[Index(tag)].allocations; }
    size_t LiveBlocks() const {
        std::lock_guard lock(mutex_);
        return blocks_.size();
    }
    size_t LiveBlocks(MemoryTag tag) const { return by_tag_[Index(tag)].live; }
    size_t LiveBytes() const { return live_bytes_; }
    size_t PeakBytes() const { return peak_bytes_; }

    /// What went wrong, one line each; empty when all is well.
    std::vector<std::string> Faults() const {
        std::lock_guard lock(mutex_);
        return faults_;
    }
    /// The faults and every block that is still there.
    std::string Report() const {
        std::lock_guard lock(mutex_);
        std::string report;
        for (const std::string& fault : faults_)
            report += fault + "\n";
        for (const auto& [ptr, block] : blocks_)
            report += "leaked " + std::to_string(block.size) + " bytes with tag " +
                      std::to_string(static_cast<unsigned>(block.tag)) + "\n";
        return report;
    }

  private:
    struct Block {
        size_t size;
        bool aligned;
        MemoryTag tag;
    };
    struct TagCount {
        std::atomic<uint64_t> allocations{0};
        std::atomic<size_t> live{0};
    };

    static unsigned Index(MemoryTag tag) { return static_cast<unsigned>(tag) % kMemoryTagLimit; }

    void* Note(void* ptr, size_t size, size_t alignment, MemoryTag tag) {
        ++allocations_;
        ++by_tag_[Index(tag)].allocations;
        ++by_tag_[Index(tag)].live;
        std::lock_guard lock(mutex_);
        if (static_cast<unsigned>(tag) >= kMemoryTagLimit)
            faults_.push_back("allocation with an unknown tag");
        blocks_[ptr] = {size, alignment != 0, tag};
        live_bytes_ += size;
        if (live_bytes_ > peak_bytes_) peak_bytes_ = live_bytes_.load();
        return ptr;
    }

    void Forget(void* ptr, bool aligned, MemoryTag tag) {
        std::lock_guard lock(mutex_);
        auto found = blocks_.find(ptr);
        if (found == blocks_.end()) {
            faults_.push_back("release of an unknown block");
            return;
        }
        const Block& block = found->second;
        if (block.tag != tag)
            faults_.push_back("block of tag " + std::to_string(static_cast<unsigned>(block.tag)) +
                              " released with tag " + std::to_string(static_cast<unsigned>(tag)));
        if (block.aligned != aligned) faults_.push_back("plain and aligned operations mixed");
        --by_tag_[Index(block.tag)].live;
        live_bytes_ -= block.size;
        blocks_.erase(found);
    }

    mutable std::mutex mutex_;
    std::unordered_map<void*, Block> blocks_;
    std::vector<std::string> faults_;
    TagCount by_tag_[kMemoryTagLimit];
    std::atomic<uint64_t> allocations_{0};
    std::atomic<size_t> live_bytes_{0};
    std::atomic<size_t> peak_bytes_{0};
};

}  // namespace qorvex::test
