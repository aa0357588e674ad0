#include "core/memory/string_pool.h"

#include <algorithm>
#include <cstring>

#include "core/limits.h"
#include "core/memory/atoms.h"

namespace qorvex {
namespace {

constexpr uint32_t kFirstBuckets = 512;

constexpr const AtomEntry* kConstantEntries[] = {
#define QORVEX_ATOM_POINTER(name, text) atoms::name.entry(),
    QORVEX_ATOMS(QORVEX_ATOM_POINTER)
#undef QORVEX_ATOM_POINTER
};

constexpr size_t kConstants = std::size(kConstantEntries);

}  // namespace

StringPool::StringPool() : atoms_(kFirstBuckets) {
    auto* nodes = reinterpret_cast<ChainedAtomSet::Node*>(
        Bump(kConstants * sizeof(ChainedAtomSet::Node), alignof(ChainedAtomSet::Node)));
    for (const AtomEntry* entry : kConstantEntries) {
        const uint64_t hash = HashInterned({entry->text, entry->length});
        atoms_.Insert(::new (nodes++) ChainedAtomSet::Node{nullptr, static_cast<uint32_t>(hash), 0, entry});
    }
    kept_ = MarkHere();
}

StringPool::~StringPool() {
    for (Block& block : blocks_)
        GetAllocator()->Deallocate(block.memory, MemoryTag::General);
}

Atom StringPool::Intern(std::string_view text, bool copy) {
    if (text.empty()) return Atom();
    const uint64_t hash = HashInterned(text);
    qsl::MutexLock lock(mutex_);
    if (const AtomEntry* known = atoms_.Find(text, hash)) return Atom(known);

    struct Record {
        ChainedAtomSet::Node node;
        AtomEntry entry;
    };
    std::byte* memory = Bump(sizeof(Record) + (copy ? text.size() + 1 : 0), alignof(Record));
    const char* stored = text.data();
    if (copy) {
        char* copied = reinterpret_cast<char*>(memory + sizeof(Record));
        std::memcpy(copied, text.data(), text.size());
        copied[text.size()] = '\0';
        stored = copied;
    }
    auto* record = ::new (memory) Record{{nullptr, static_cast<uint32_t>(hash), 0, nullptr},
                                         {stored, static_cast<uint32_t>(text.size())}};
    record->node.entry = &record->entry;
    atoms_.Insert(&record->node);
    return Atom(&record->entry);
}

Atom StringPool::Find(std::string_view text) const {
    if (text.empty()) return Atom();
    const uint64_t hash = HashInterned(text);
    qsl::MutexLock lock(mutex_);
    return Atom(atoms_.Find(text, hash));
}

size_t StringPool::size() const {
    qsl::MutexLock lock(mutex_);
    return atoms_.size();
}

StringPool::Mark StringPool::MarkHere() const {
    return {atoms_.size(), blocks_.size(), blocks_.empty() ? 0 : blocks_.back().used};
}

void StringPool::KeepSoFar() {
    qsl::MutexLock lock(mutex_);
    kept_ = MarkHere();
}

void StringPool::ReleaseOthers() {
    qsl::MutexLock lock(mutex_);
    atoms_.Truncate(kept_.atoms);
    while (blocks_.size() > kept_.blocks)
        GetAllocator()->Deallocate(blocks_.take_back().memory, MemoryTag::General);
    blocks_.back().used = kept_.usedOfLast;
}

std::byte* StringPool::Bump(size_t size, size_t alignment) {
    if (!blocks_.empty()) {
        Block& block = blocks_.back();
        const size_t start = (block.used + alignment - 1) & ~(alignment - 1);
        if (start + size <= block.capacity) {
            block.used = start + size;
            return block.memory + start;
        }
    }
    const size_t capacity = std::max(limits::kStringPoolBlockBytes, size * 2);
    auto* memory = static_cast<std::byte*>(GetAllocator()->Allocate(capacity, MemoryTag::General));
    blocks_.push_back({memory, size, capacity});
    return memory;
}

}  // namespace qorvex
