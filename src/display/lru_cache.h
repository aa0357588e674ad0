// Values by the bytes of a record, the least recently used one leaving first. Keys compare whole; the hash
// runs over all of their bytes, so records used as keys have no padding.
#pragma once

#include "core/memory/containers.h"

#include <cstring>
#include <string_view>

namespace qorvex::dsp {

// Writes plain records into a key.
class CacheKey {
  public:
    template <typename T>
    CacheKey& Add(const T& value) {
        static_assert(std::is_trivially_copyable_v<T>);
        bytes_.append(std::string_view(reinterpret_cast<const char*>(&value), sizeof(T)));
        return *this;
    }
    std::string_view view() const { return bytes_.view(); }

  private:
    TempString bytes_;
};

// `Value` is moved to the list that Evict fills.
template <typename Value>
class LruCache {
  public:
    explicit LruCache(uint32_t capacity) : capacity_(capacity) {}

    uint32_t Size() const { return index_.size(); }
    uint32_t Capacity() const { return capacity_; }

    // The value, now the most recently used one, or null. Valid until the next insertion.
    Value* Find(std::string_view key) {
        const uint32_t* found = index_.get(key);
        if (found == nullptr) return nullptr;
        Unlink(*found);
        LinkFirst(*found);
        return &entries_[*found].value;
    }

    // The key must not be there. Evicts as many as the capacity asks for.
    template <typename OnEvicted>
    void Insert(std::string_view key, Value value, OnEvicted&& evicted) {
        while (Size() >= capacity_)
            Evict(last_, evicted);
        uint32_t slot = entries_.size();
        if (free_ != kNone) {
            slot = std::exchange(free_, entries_[free_].next);
        } else {
            entries_.emplace_back();
        }
        entries_[slot].key = Key(key);
        entries_[slot].value = std::move(value);
        index_.insert_or_assign(entries_[slot].key, slot);
        LinkFirst(slot);
    }

    template <typename OnEvicted>
    void SetCapacity(uint32_t capacity, OnEvicted&& evicted) {
        if (capacity == 0) return;
        capacity_ = capacity;
        while (Size() > capacity_)
            Evict(last_, evicted);
    }

    template <typename OnEvicted>
    void Clear(OnEvicted&& evicted) {
        while (last_ != kNone)
            Evict(last_, evicted);
    }

  private:
    using Key = TaggedString<MemoryTag::Rendering>;
    static constexpr uint32_t kNone = 0xFFFFFFFF;

    struct Entry {
        Key key;
        Value value{};
        uint32_t previous = kNone;
        uint32_t next = kNone;  // of free entries: the next free one
    };

    template <typename OnEvicted>
    void Evict(uint32_t slot, OnEvicted& evicted) {
        Unlink(slot);
        Entry& entry = entries_[slot];
        index_.erase(entry.key.view());
        evicted(entry.value);
        entry.value = Value{};
        entry.next = free_;
        free_ = slot;
    }
    void Unlink(uint32_t slot) {
        const Entry& entry = entries_[slot];
        (entry.previous == kNone ? first_ : entries_[entry.previous].next) = entry.next;
        (entry.next == kNone ? last_ : entries_[entry.next].previous) = entry.previous;
    }
    void LinkFirst(uint32_t slot) {
        entries_[slot].previous = kNone;
        entries_[slot].next = first_;
        (first_ == kNone ? last_ : entries_[first_].previous) = slot;
        first_ = slot;
    }

    Vector<Entry, MemoryTag::Rendering> entries_;
    HashMap<Key, uint32_t, MemoryTag::Rendering> index_;
    uint32_t first_ = kNone;
    uint32_t last_ = kNone;
    uint32_t free_ = kNone;
    uint32_t capacity_;
};

}  // namespace qorvex::dsp
