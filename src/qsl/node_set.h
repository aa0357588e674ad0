// Set of object addresses for the per-frame change lists: linear probing in a table of prime size, no
// tombstones. It is filled, walked and cleared once a frame, so clear() is where it gives memory back: the
// table shrinks by one prime when it was less than a quarter full. Clearing an empty set allocates nothing.
//
// Invariant: less than 0.7 of the slots are taken; between an address's own slot and where it stands there is
// no free slot. Walking order depends on the addresses: whatever must be repeatable sorts what it collects.
#pragma once

#include <algorithm>
#include <iterator>

#include "qsl/hash.h"
#include "qsl/vector.h"

namespace qsl {

inline constexpr uint32_t kNodeSetPrimes[] = {
    5,       11,       23,       47,       97,        199,       409,       823,        1741,       3469,
    6949,    14033,    28411,    57557,    116731,    236897,    480881,    976369,     1982627,    4026031,
    8175383, 16601593, 33712729, 68460391, 139022417, 282312799, 573292817, 1164186217, 2364114217,
};

// Slots that a set keeps however long it stays empty.
inline constexpr uint32_t kNodeSetKeptSlots = 199;

template <class Pointer, class Alloc = std::allocator<std::byte>>
class NodeSet;

template <class T, class Alloc>
class NodeSet<T*, Alloc> {
  public:
    class iterator {
      public:
        using value_type = T*;
        using difference_type = ptrdiff_t;
        using reference = T*;
        using pointer = T* const*;
        using iterator_category = std::forward_iterator_tag;

        iterator() = default;
        iterator(T* const* slot, T* const* end) : slot_(slot), end_(end) { SkipFree(); }
        T* operator*() const { return *slot_; }
        iterator& operator++() {
            ++slot_;
            SkipFree();
            return *this;
        }
        iterator operator++(int) {
            iterator before = *this;
            ++*this;
            return before;
        }
        friend bool operator==(const iterator& a, const iterator& b) { return a.slot_ == b.slot_; }

      private:
        void SkipFree() {
            while (slot_ != end_ && !*slot_)
                ++slot_;
        }
        T* const* slot_ = nullptr;
        T* const* end_ = nullptr;
    };
    using const_iterator = iterator;

    NodeSet() = default;
    NodeSet(const NodeSet&) = default;
    NodeSet(NodeSet&& other) noexcept { swap(other); }
    NodeSet& operator=(const NodeSet&) = default;
    NodeSet& operator=(NodeSet&& other) noexcept {
        NodeSet gone(std::move(other));
        swap(gone);
        return *this;
    }

    uint32_t size() const { return size_; }
    bool empty() const { return size_ == 0; }
    uint32_t capacity() const { return slots_.size(); }
    iterator begin() const { return size_ ? iterator(slots_.begin(), slots_.end()) : end(); }
    iterator end() const { return iterator(slots_.end(), slots_.end()); }

    bool contains(const T* node) const { return size_ && slots_[IndexOf(node)] == node; }

    /// True when the node was not there before. Null is no member.
    bool insert(T* node) {
        if (!node) return false;
        if (slots_.empty()) Resize(kNodeSetPrimes[0]);
        uint32_t index = IndexOf(node);
        if (slots_[index] == node) return false;
        if (uint64_t{size_ + 1} * 10 >= uint64_t{capacity()} * 7) {
            Resize(*std::upper_bound(std::begin(kNodeSetPrimes), std::end(kNodeSetPrimes) - 1, capacity()));
            index = IndexOf(node);
        }
        slots_[index] = node;
        ++size_;
        return true;
    }

    bool erase(const T* node) {
        if (!contains(node)) return false;
        uint32_t hole = IndexOf(node);
        // Close the gap: whatever behind it would no longer be reached from its own slot moves into it.
        for (uint32_t next = Following(hole); slots_[next]; next = Following(next)) {
            const uint32_t home = HomeOf(slots_[next]);
            const bool reached = hole < next ? home > hole && home <= next : home > hole || home <= next;
            if (reached) continue;
            slots_[hole] = slots_[next];
            hole = next;
        }
        slots_[hole] = nullptr;
        --size_;
        return true;
    }

    void clear() {
        if (!size_) return GiveBack();
        const bool roomy = uint64_t{size_} * 4 < capacity();
        size_ = 0;
        if (roomy && capacity() > kNodeSetPrimes[0]) {
            slots_.truncate(PrimeBelow(capacity()));
            slots_.shrink_to_fit();
        }
        std::fill(slots_.begin(), slots_.end(), nullptr);
    }

    void swap(NodeSet& other) noexcept {
        slots_.swap(other.slots_);
        std::swap(size_, other.size_);
    }

  private:
    static uint32_t PrimeBelow(uint32_t prime) {
        return std::lower_bound(std::begin(kNodeSetPrimes), std::end(kNodeSetPrimes), prime)[-1];
    }

    /// A smaller block would have to be allocated: the table becomes smaller inside its block, and the block
    /// goes as a whole with the last step, when the set has been empty for a while.
    void GiveBack() {
        if (capacity() <= kNodeSetKeptSlots) return;
        slots_.truncate(PrimeBelow(capacity()));
        if (capacity() <= kNodeSetKeptSlots) slots_ = {};
    }

    uint32_t HomeOf(const T* node) const { return static_cast<uint32_t>(HashPointer(node) % capacity()); }
    uint32_t Following(uint32_t index) const { return index + 1 == capacity() ? 0 : index + 1; }

    /// Where the node stands, or the free slot where it would.
    uint32_t IndexOf(const T* node) const {
        uint32_t index = HomeOf(node);
        while (slots_[index] && slots_[index] != node)
            index = Following(index);
        return index;
    }

    void Resize(uint32_t capacity) {
        Vector<T*, Rebind<Alloc, T*>> old;
        old.swap(slots_);
        slots_.resize(capacity);
        for (T* node : old)
            if (node) slots_[IndexOf(node)] = node;
    }

    Vector<T*, Rebind<Alloc, T*>> slots_;
    uint32_t size_ = 0;
};

}  // namespace qsl
