#include "support/engine.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "core/logging/logger.h"
#include "core/memory/allocator.h"
#include "core/memory/object_pool.h"
#include "core/memory/thread_scope.h"

namespace qorvex::fuzz {

namespace {

[[noreturn]] void Fail(const char* what) {
    std::fprintf(stderr, "FINDING: %s\n", what);
    std::abort();
}

/// Notes tag, size and kind in front of each block: cheaper than a table, and a target runs thousands of
/// inputs a second.
class CheckingAllocator final : public IAllocator {
  public:
    void* Allocate(size_t size, MemoryTag tag) override { return Make(size, kHeader, kPlain, tag); }
    void* Reallocate(void* ptr, size_t newSize, MemoryTag tag) override {
        void* fresh = Allocate(newSize, tag);
        if (ptr) {
            std::memcpy(fresh, ptr, std::min(newSize, HeaderOf(ptr).size));
            Deallocate(ptr, tag);
        }
        return fresh;
    }
    void Deallocate(void* ptr, MemoryTag tag) override { Release(ptr, kPlain, tag); }
    void* AlignedAllocate(size_t size, size_t alignment, MemoryTag tag) override {
        return Make(size, std::max(alignment, kHeader), kAligned, tag);
    }
    void AlignedDeallocate(void* ptr, MemoryTag tag) override { Release(ptr, kAligned, tag); }
    void* AlignedReallocate(void* ptr, size_t newSize, size_t oldSize, size_t alignment,
                            MemoryTag tag) override {
        void* fresh = AlignedAllocate(newSize, alignment, tag);
        if (ptr) {
            std::memcpy(fresh, ptr, std::min(newSize, oldSize));
            AlignedDeallocate(ptr, tag);
        }
        return fresh;
    }

    size_t live_blocks = 0;

    /// The newest blocks, of an input that left them behind.
    void ReportNewest(size_t count) const {
        const Header* header = &newest_;
        while (count-- > 0 && (header = header->older) != &newest_)
            std::fprintf(stderr, "left: %zu bytes of tag %u\n", header->size,
                         static_cast<unsigned>(header->tag));
    }

  private:
    static constexpr size_t kHeader = 64;
    static constexpr uint32_t kPlain = 0x504C4149;
    static constexpr uint32_t kAligned = 0x414C4947;
    struct Header {
        void* start;
        size_t size;
        uint32_t kind;
        MemoryTag tag;
        Header* newer;
        Header* older;
    };
    static_assert(sizeof(Header) <= kHeader);

    static Header& HeaderOf(void* ptr) {
        return *reinterpret_cast<Header*>(static_cast<char*>(ptr) - sizeof(Header));
    }

    // `room` bytes stand in front of the block, which keeps its alignment.
    void* Make(size_t size, size_t room, uint32_t kind, MemoryTag tag) {
        void* start = nullptr;
        if (posix_memalign(&start, std::max(room, alignof(std::max_align_t)), size + room) != 0)
            Fail("out of memory");
        void* block = static_cast<char*>(start) + room;
        Header& header = *::new (&HeaderOf(block)) Header{start, size, kind, tag, nullptr, nullptr};
        // Temporary memory stays with its thread from input to input.
        if (tag == MemoryTag::Temporary) return block;
        header.newer = &newest_;
        header.older = newest_.older;
        header.older->newer = newest_.older = &header;
        ++live_blocks;
        return block;
    }

    void Release(void* ptr, uint32_t kind, MemoryTag tag) {
        if (!ptr) return;
        const Header header = HeaderOf(ptr);
        if (header.kind != kind) Fail("a release that does not fit its allocation");
        if (header.tag != tag) Fail("a release with another tag than its allocation");
        if (tag != MemoryTag::Temporary) {
            header.older->newer = header.newer;
            header.newer->older = header.older;
            --live_blocks;
        }
        std::free(header.start);
    }

    // Ends of a ring.
    Header newest_{nullptr, 0, 0, MemoryTag::General, &newest_, &newest_};
};

class FuzzLog final : public Logging::ILogHandler {
  public:
    void WriteLog(Logging::Severity severity, const char* text, unsigned length) override {
        if (length == 0 || length > 1024 || std::strlen(text) + 1 != length) Fail("a bad log line");
        if (severity == Logging::Assert) OnAssertion(std::string_view(text, length - 1));
        static const bool shown = std::getenv("QORVEX_FUZZ_LOG") != nullptr;
        if (shown) std::fprintf(stderr, "log %u %s\n", static_cast<unsigned>(severity), text);
    }

    std::vector<std::string_view> expected_assertions;

  private:
    void OnAssertion(std::string_view text) {
        constexpr std::string_view kPrefix = "Assert failure: ";
        if (text.starts_with(kPrefix)) text.remove_prefix(kPrefix.size());
        for (const std::string_view expected : expected_assertions)
            if (text.starts_with(expected)) return;
        Fail(text.data());
    }
};

struct Engine {
    Engine() {
        SetAllocator(&allocator);
        SetPoolsEnabled(false);
        // Lines are put together and thrown away: formatting them is part of what is tested.
        StartLogging(Logging::Trace, &log);
        OpenThreadScope();
    }
    CheckingAllocator allocator;
    FuzzLog log;
};

Engine& TheEngine() {
    static Engine* engine = new Engine;
    return *engine;
}

}  // namespace

Input::Input(std::vector<std::string_view> expected_assertions) {
    Engine& engine = TheEngine();
    engine.log.expected_assertions = std::move(expected_assertions);
    blocks_before_ = engine.allocator.live_blocks;
}

Input::~Input() {
    const CheckingAllocator& allocator = TheEngine().allocator;
    if (allocator.live_blocks == blocks_before_) return;
    allocator.ReportNewest(std::min<size_t>(allocator.live_blocks - blocks_before_, 20));
    Fail("an input left memory behind");
}

void Require(bool condition, const char* what) {
    if (!condition) Fail(what);
}

void RequireSame(std::string_view one, std::string_view other, const char* what) {
    if (one == other) return;
    std::fprintf(stderr, "one:   [%.*s]\nother: [%.*s]\n", static_cast<int>(one.size()), one.data(),
                 static_cast<int>(other.size()), other.data());
    Fail(what);
}

}  // namespace qorvex::fuzz
