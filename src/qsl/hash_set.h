// Set on one flat table (see robin_hood_table.h for the invariants). String keys are looked up by view.
#pragma once

#include <initializer_list>

#include "qsl/robin_hood_table.h"

namespace qsl {

template <class K>
struct SetPolicy {
    static const K& Key(const K& entry) { return entry; }
};

template <class K, class Hash = DefaultHash<K>, class Alloc = std::allocator<std::byte>>
class HashSet : public RobinHoodTable<K, SetPolicy<K>, Hash, Alloc> {
    using Base = RobinHoodTable<K, SetPolicy<K>, Hash, Alloc>;

  public:
    using TriviallyRelocatable = HashSet;
    using key_type = K;
    using value_type = K;
    using typename Base::iterator;
    using typename Base::Lookup;

    HashSet() = default;
    HashSet(std::initializer_list<K> keys) {
        this->reserve(keys.size());
        for (const K& key : keys)
            insert(key);
    }

    /// The second result is true when the key was not there before.
    template <class Key>
    std::pair<iterator, bool> insert(Key&& key) {
        return this->FindOrEmplace(Base::LookupOf(key), std::forward<Key>(key));
    }
};

}  // namespace qsl
