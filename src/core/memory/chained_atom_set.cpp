#include "core/memory/chained_atom_set.h"

#include "qsl/city_hash.h"

namespace qorvex {

uint64_t HashInterned(std::string_view text) {
    uint64_t h = qsl::CityHash64(text);
    h = (h << 21) + ~h;
    h = (h ^ (h >> 24)) * 265;
    h = (h ^ (h >> 14)) * 21;
    return (h ^ (h >> 28)) * 0x80000001ULL;
}

const AtomEntry* ChainedAtomSet::Find(std::string_view text, uint64_t hash) const {
    for (const Node* node = buckets_[BucketOf(hash)]; node; node = node->next) {
        if (node->hash == static_cast<uint32_t>(hash) &&
            std::string_view(node->entry->text, node->entry->length) == text)
            return node->entry;
    }
    return nullptr;
}

void ChainedAtomSet::Insert(Node* node) {
    if (size_ == buckets_.size()) {
        Vector<Node*> old(buckets_.size() * 2);
        old.swap(buckets_);
        for (Node* chain : old) {
            while (chain) {
                Node* moved = std::exchange(chain, chain->next);
                Node*& bucket = buckets_[BucketOf(moved->hash)];
                moved->next = std::exchange(bucket, moved);
            }
        }
    }
    Node*& bucket = buckets_[BucketOf(node->hash)];
    node->next = std::exchange(bucket, node);
    node->number = static_cast<uint32_t>(size_++);
}

void ChainedAtomSet::Truncate(size_t count) {
    if (count >= size_) return;
    for (Node*& bucket : buckets_) {
        for (Node** link = &bucket; *link;) {
            if ((*link)->number >= count)
                *link = (*link)->next;
            else
                link = &(*link)->next;
        }
    }
    size_ = count;
}

}  // namespace qorvex
