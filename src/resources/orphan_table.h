// What a cache keeps though nobody uses it any more, oldest first, with the two marks between which it is
// cleaned.
//
// Invariants: the list through older and newer holds each entry of the table once, in the order in which they
// came; the bytes are the sum of theirs (64 bits: a few large images pass 32).
#pragma once

#include <qorvex/system.h>

#include <utility>

#include "core/memory/containers.h"
#include "core/url/url.h"

namespace qorvex {

template <class Payload>
class OrphanTable {
  public:
    struct Orphan {
        URL url;
        Payload payload;
        uint64_t bytes = 0;
        uint32_t older = kNone;
        uint32_t newer = kNone;
    };

    size_t GetCount() const { return orphans_.size(); }
    uint64_t GetBytes() const { return bytes_; }
    const HashMap<uint32_t, Orphan, MemoryTag::Resources>& GetAll() const { return orphans_; }

    void Add(uint32_t id, const URL& url, Payload payload, uint64_t bytes) {
        orphans_.insert_or_assign(id, Orphan{url, std::move(payload), bytes, newest_, kNone});
        (newest_ == kNone ? oldest_ : orphans_.get(newest_)->newer) = id;
        newest_ = id;
        bytes_ += bytes;
    }

    // The id is in the table.
    Orphan Take(uint32_t id) {
        Orphan orphan = orphans_.take(id);
        (orphan.older == kNone ? oldest_ : orphans_.get(orphan.older)->newer) = orphan.newer;
        (orphan.newer == kNone ? newest_ : orphans_.get(orphan.newer)->older) = orphan.older;
        bytes_ -= orphan.bytes;
        return orphan;
    }

    // Nothing below the high marks; else from the oldest on until the low marks are reached.
    Vector<Orphan, MemoryTag::Resources> TakeBeyond(const CacheLimits& limits) {
        Vector<Orphan, MemoryTag::Resources> pruned;
        if (!IsAbove(limits.MaxCount, limits.MaxBytes)) return pruned;
        while (oldest_ != kNone && IsAbove(limits.TargetCount, limits.TargetBytes))
            pruned.push_back(Take(oldest_));
        return pruned;
    }

    void Clear() { *this = OrphanTable(); }

  private:
    static constexpr uint32_t kNone = 0xFFFFFFFF;
    bool IsAbove(uint32_t count, uint32_t bytes) const { return bytes_ > bytes || orphans_.size() > count; }

    HashMap<uint32_t, Orphan, MemoryTag::Resources> orphans_;
    uint32_t oldest_ = kNone;
    uint32_t newest_ = kNone;
    uint64_t bytes_ = 0;
};

}  // namespace qorvex
