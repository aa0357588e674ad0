// The open-addressing table under HashMap and HashSet.
//
// A slot is a distance byte and an entry; the byte says how far the entry stands from the slot that its hash
// asks for, -1 for a free slot, kFar for "that far or further". Invariants:
//  - on the way from its own slot to where it stands an entry passes only entries that are at least as far
//    from theirs, so a search ends at the first slot that is nearer to home than the search is (Robin Hood
//    hashing);
//  - the capacity is a power of two and at most half full; no entry is further than `reach_` - 1 from home,
//    and so many slots stand behind the capacity, so that no probe wraps around; a closing slot of distance 0
//    after them ends every search and every walk;
//  - an empty table points to a shared slot table, owns nothing, and is never written to.
// A page may make keys whose hashes are all alike. No capacity parts them: then the reach grows instead, and
// such keys, but no others, cost what they would in a list.
// Entries move when others come and go: pointers and iterators are good until the next insertion or removal.
#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <new>
#include <utility>

#include "qsl/allocation.h"
#include "qsl/hash.h"
#include "qsl/relocate.h"

namespace qsl {

template <class Entry>
struct RobinHoodSlot {
    static constexpr int8_t kFree = -1;
    static constexpr int8_t kFar = 126;

    int8_t distance = kFree;
    alignas(Entry) unsigned char room[sizeof(Entry)];

    Entry* raw() { return reinterpret_cast<Entry*>(room); }
    Entry* entry() { return std::launder(reinterpret_cast<Entry*>(room)); }
};

/// Stands for every empty table of its type: two slots that a search may start at and the closing one.
template <class Entry>
inline constinit RobinHoodSlot<Entry> kEmptySlots[3] = {{-1, {}}, {-1, {}}, {0, {}}};

template <class Entry, bool kConst>
class RobinHoodIterator {
    using Slot = RobinHoodSlot<Entry>;

  public:
    using value_type = Entry;
    using difference_type = ptrdiff_t;
    using reference = std::conditional_t<kConst, const Entry&, Entry&>;
    using pointer = std::conditional_t<kConst, const Entry*, Entry*>;
    using iterator_category = std::forward_iterator_tag;

    RobinHoodIterator() = default;
    explicit RobinHoodIterator(Slot* slot) : slot_(slot) {}
    operator RobinHoodIterator<Entry, true>() const { return RobinHoodIterator<Entry, true>(slot_); }

    reference operator*() const { return *slot_->entry(); }
    pointer operator->() const { return slot_->entry(); }
    RobinHoodIterator& operator++() {
        do
            ++slot_;
        while (slot_->distance < 0);
        return *this;
    }
    RobinHoodIterator operator++(int) {
        RobinHoodIterator before = *this;
        ++*this;
        return before;
    }
    friend bool operator==(RobinHoodIterator a, RobinHoodIterator b) { return a.slot_ == b.slot_; }

    Slot* slot() const { return slot_; }

  private:
    Slot* slot_ = nullptr;
};

/// `Policy` tells where the key of an entry is: `static const K& Key(const Entry&)`.
template <class Entry, class Policy, class Hash, class Alloc>
class RobinHoodTable {
    using Slot = RobinHoodSlot<Entry>;

  public:
    using Lookup = typename Hash::Lookup;
    using iterator = RobinHoodIterator<Entry, false>;
    using const_iterator = RobinHoodIterator<Entry, true>;

    RobinHoodTable() = default;
    RobinHoodTable(const RobinHoodTable& other) {
        reserve(other.size());
        for (const Entry& entry : other)
            EmplaceNew(Hash::Hash(Policy::Key(entry)), entry);
    }
    RobinHoodTable(RobinHoodTable&& other) noexcept { swap(other); }
    ~RobinHoodTable() { Release(); }
    RobinHoodTable& operator=(const RobinHoodTable& other) {
        if (this != &other) {
            RobinHoodTable copy(other);
            swap(copy);
        }
        return *this;
    }
    RobinHoodTable& operator=(RobinHoodTable&& other) noexcept {
        if (this != &other) {
            RobinHoodTable gone(std::move(other));
            swap(gone);
        }
        return *this;
    }

    size_t size() const { return size_; }
    bool empty() const { return size_ == 0; }
    /// Slots that a hash may ask for; 0 as long as nothing was ever put in.
    size_t capacity() const { return size_t{mask_} + (mask_ ? 1 : 0); }

    iterator begin() { return iterator(First()); }
    iterator end() { return iterator(Closing()); }
    const_iterator begin() const { return const_iterator(First()); }
    const_iterator end() const { return const_iterator(Closing()); }

    iterator find(Lookup key) {
        Slot* slot = FindSlot(key);
        return iterator(slot ? slot : Closing());
    }
    const_iterator find(Lookup key) const {
        Slot* slot = FindSlot(key);
        return const_iterator(slot ? slot : Closing());
    }
    bool contains(Lookup key) const { return FindSlot(key) != nullptr; }
    size_t count(Lookup key) const { return contains(key) ? 1 : 0; }

    /// Removes the key; true when it was there.
    bool erase(Lookup key) {
        Slot* slot = FindSlot(key);
        if (slot) EraseSlot(slot);
        return slot != nullptr;
    }

    /// Removes the entry; the result is the next one to look at.
    iterator erase(const_iterator position) {
        Slot* slot = position.slot();
        EraseSlot(slot);
        while (slot->distance < 0)
            ++slot;
        return iterator(slot);
    }

    template <class Predicate>
    size_t erase_if(Predicate&& goes) {
        size_t gone = 0;
        for (iterator it = begin(); it != end();) {
            if (goes(*it)) {
                it = erase(it);
                ++gone;
            } else {
                ++it;
            }
        }
        return gone;
    }

    /// Keeps the memory.
    void clear() {
        if (!size_) return;
        for (Slot* slot = slots_; slot != Closing(); ++slot) {
            if (slot->distance < 0) continue;
            std::destroy_at(slot->entry());
            slot->distance = Slot::kFree;
        }
        size_ = 0;
    }

    void reserve(size_t count) {
        if (count * 2 > capacity() && count) Rehash(std::bit_ceil(count * 2));
    }

    void swap(RobinHoodTable& other) noexcept {
        std::swap(slots_, other.slots_);
        std::swap(size_, other.size_);
        std::swap(mask_, other.mask_);
        std::swap(shift_, other.shift_);
        std::swap(reach_, other.reach_);
    }

  protected:
    template <class Key>
    static Lookup LookupOf(const Key& key) {
        if constexpr (std::is_pointer_v<Lookup> && requires { key.get(); }) {
            return key.get();
        } else {
            static_assert(!std::is_reference_v<Lookup> || std::is_same_v<Lookup, const Key&>,
                          "the looked-up key would be a temporary");
            return static_cast<Lookup>(key);
        }
    }

    /// The entry of the key, made from `args` when it was not there.
    template <class... Args>
    std::pair<iterator, bool> FindOrEmplace(Lookup key, Args&&... args) {
        const uint64_t hash = Hash::Hash(key);
        if (MayHoldFar()) [[unlikely]] {
            Slot* known = FindFar(hash, key);
            if (known) return {iterator(known), false};
            return {EmplaceNew(hash, std::forward<Args>(args)...), true};
        }
        Slot* slot = slots_ + Home(hash);
        int distance = 0;
        for (; slot->distance >= distance; ++slot, ++distance)
            if (Hash::Equal(Policy::Key(*slot->entry()), key)) return {iterator(slot), false};
        if (slot->distance < 0 && static_cast<uint32_t>(distance) < reach_ && (size_ + 1) * 2 <= capacity()) {
            ConstructAt<Entry>(slot->room, std::forward<Args>(args)...);
            slot->distance = static_cast<int8_t>(distance);
            ++size_;
            return {iterator(slot), true};
        }
        return {EmplaceNew(hash, std::forward<Args>(args)...), true};
    }

    Slot* FindSlot(Lookup key) const {
        const uint64_t hash = Hash::Hash(key);
        if (MayHoldFar()) [[unlikely]]
            return FindFar(hash, key);
        Slot* slot = slots_ + Home(hash);
        for (int distance = 0; slot->distance >= distance; ++slot, ++distance)
            if (Hash::Equal(Policy::Key(*slot->entry()), key)) return slot;
        return nullptr;
    }

  private:
    static constexpr size_t kFirstCapacity = 4;
    static constexpr uint32_t kShortestReach = 4;
    /// As long as no entry is far.
    static constexpr uint32_t kLongReach = Slot::kFar;

    size_t Home(uint64_t hash) const { return static_cast<size_t>((hash * kFibonacci) >> shift_); }
    size_t SlotCount() const { return size_t{mask_} + reach_; }
    Slot* Closing() const { return slots_ + SlotCount(); }
    Slot* First() const {
        Slot* slot = slots_;
        while (slot->distance < 0)
            ++slot;
        return slot;
    }

    bool MayHoldFar() const { return reach_ > kLongReach; }

    /// The search for tables that may hold far entries; apart, so that the usual one stays a tight loop.
    [[gnu::noinline]] Slot* FindFar(uint64_t hash, Lookup key) const {
        Slot* slot = slots_ + Home(hash);
        for (uint32_t distance = 0; slot->distance >= AsByte(distance); ++slot, ++distance)
            if (Hash::Equal(Policy::Key(*slot->entry()), key)) return slot;
        return nullptr;
    }

    /// Puts an entry in whose key is known to be absent.
    template <class... Args>
    [[gnu::noinline]] iterator EmplaceNew(uint64_t hash, Args&&... args) {
        Entry entry(std::forward<Args>(args)...);
        if ((size_ + 1) * 2 > capacity()) Rehash(capacity() ? capacity() * 2 : kFirstCapacity);
        Slot* placed;
        while (!(placed = Place(hash, entry)))
            Lengthen();
        ++size_;
        return iterator(placed);
    }

    /// Moves `entry` to its place, pushing nearer entries on; null, with nothing changed, when the last of
    /// them would have to go further than `reach_`.
    Slot* Place(uint64_t hash, Entry& entry) {
        Slot* slot = slots_ + Home(hash);
        uint32_t distance = 0;
        for (; StandsAsFar(slot, distance); ++slot)
            ++distance;
        if (distance >= reach_) return nullptr;
        // The run behind moves on by one slot, which keeps its order and with it the invariant.
        Slot* free = slot;
        while (free->distance >= 0) {
            if (free == Closing() || static_cast<uint32_t>(free->distance) + 1 >= reach_) return nullptr;
            ++free;
        }
        for (; free != slot; --free) {
            std::construct_at(free->raw(), std::move(*free[-1].entry()));
            std::destroy_at(free[-1].entry());
            free->distance = AsByte(static_cast<uint32_t>(free[-1].distance) + 1);
        }
        std::construct_at(slot->raw(), std::move(entry));
        slot->distance = AsByte(distance);
        return slot;
    }

    static int8_t AsByte(uint32_t distance) {
        return distance < uint32_t{Slot::kFar} ? static_cast<int8_t>(distance) : Slot::kFar;
    }

    /// Exact, since an order among far entries that was only nearly right would not outlive an erasure.
    bool StandsAsFar(Slot* slot, uint32_t distance) const {
        if (slot->distance < AsByte(distance)) return false;
        return distance <= uint32_t{Slot::kFar} || DistanceOf(slot) >= distance;
    }

    uint32_t DistanceOf(Slot* slot) const {
        if (slot->distance < Slot::kFar) return static_cast<uint32_t>(slot->distance);
        return static_cast<uint32_t>(slot - (slots_ + Home(Hash::Hash(Policy::Key(*slot->entry())))));
    }

    void EraseSlot(Slot* slot) {
        std::destroy_at(slot->entry());
        // What follows and is not at home moves back by one slot, so no tombstone stays behind.
        for (Slot* next = slot + 1; next != Closing() && next->distance > 0; slot = next++) {
            const uint32_t distance = DistanceOf(next);
            std::construct_at(slot->raw(), std::move(*next->entry()));
            std::destroy_at(next->entry());
            slot->distance = AsByte(distance - 1);
        }
        slot->distance = Slot::kFree;
        --size_;
    }

    /// A probe got longer than the table allows: a larger table shortens it, unless the hashes are simply
    /// alike; then probes become longer before the capacity runs away.
    void Lengthen() {
        if (IsSparse(capacity()))
            RehashTo(capacity(), LongerReach(reach_));
        else
            Rehash(capacity() * 2);
    }
    bool IsSparse(size_t capacity) const { return size_t{size_} * 16 < capacity; }
    static uint32_t LongerReach(uint32_t reach) { return reach < kLongReach ? kLongReach : reach * 4; }

    void Rehash(size_t capacity) {
        if (capacity < kFirstCapacity) capacity = kFirstCapacity;
        const auto bits = static_cast<uint32_t>(std::countr_zero(capacity));
        const uint32_t reach = reach_ >= kLongReach ? reach_ : bits < kShortestReach ? kShortestReach : bits;
        RehashTo(capacity, reach);
    }

    [[gnu::noinline]] void RehashTo(size_t capacity, uint32_t reach) {
        for (;;) {
            RobinHoodTable fresh;
            fresh.mask_ = static_cast<uint32_t>(capacity - 1);
            fresh.shift_ = static_cast<uint8_t>(64 - std::countr_zero(capacity));
            fresh.reach_ = reach;
            fresh.slots_ = AllocateArray<Slot, Alloc>(fresh.SlotCount() + 1);
            for (size_t i = 0; i < fresh.SlotCount(); ++i)
                fresh.slots_[i].distance = Slot::kFree;
            fresh.Closing()->distance = 0;
            swap(fresh);
            if (TakeAll(fresh)) return;
            // Some run was too long: put everything back together, and give it more room.
            fresh.TakeAll(*this);
            swap(fresh);
            if (IsSparse(capacity))
                reach = LongerReach(reach);
            else
                capacity *= 2;
        }
    }

    /// Moves all entries of `other` here; false when one found no place, the rest then stays there.
    bool TakeAll(RobinHoodTable& other) {
        for (Slot* slot = other.slots_; other.size_ && slot != other.Closing(); ++slot) {
            if (slot->distance < 0) continue;
            if (!Place(Hash::Hash(Policy::Key(*slot->entry())), *slot->entry())) return false;
            std::destroy_at(slot->entry());
            slot->distance = Slot::kFree;
            --other.size_;
            ++size_;
        }
        return true;
    }

    void Release() {
        if (!mask_) return;
        clear();
        DeallocateArray<Slot, Alloc>(slots_, SlotCount() + 1);
    }

    Slot* slots_ = kEmptySlots<Entry>;
    uint32_t size_ = 0;
    uint32_t mask_ = 0;
    // With one bit left of the hash an empty table is asked for one of its two free slots.
    uint8_t shift_ = 63;
    uint32_t reach_ = 2;
};

}  // namespace qsl
