// Chained hash set of interned strings. Chains, because entries never go one by one and lookups of one string
// must not slow down however many others share its bucket's neighbourhood; nodes stand wherever the owner
// puts them.
#pragma once

#include <cstdint>
#include <string_view>

#include "core/memory/atom.h"
#include "core/memory/containers.h"

namespace qorvex {

/// CityHash64 of the text, mixed further so that the low bits may serve as the bucket.
uint64_t HashInterned(std::string_view text);

class ChainedAtomSet {
  public:
    struct Node {
        Node* next;
        uint32_t hash;    // its low bits
        uint32_t number;  // of those put in before; Insert sets it
        const AtomEntry* entry;
    };

    explicit ChainedAtomSet(uint32_t buckets) : buckets_(buckets) {}

    const AtomEntry* Find(std::string_view text, uint64_t hash) const;
    /// The node is the caller's memory and stays in the set. Grows so that there are no more entries than
    /// buckets.
    void Insert(Node* node);
    size_t size() const { return size_; }
    /// Takes out all but the first `count` that were put in.
    void Truncate(size_t count);

  private:
    uint32_t BucketOf(uint64_t hash) const { return static_cast<uint32_t>(hash) & (buckets_.size() - 1); }

    Vector<Node*> buckets_;
    size_t size_ = 0;
};

}  // namespace qorvex
