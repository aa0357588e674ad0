// Map on one flat table (see robin_hood_table.h for the invariants). `get` returns a pointer to the value or
// null; `find` returns an iterator to {first, second}, of which `first` must not be changed. A map that holds
// nothing allocates nothing. String keys are looked up by std::string_view.
#pragma once

#include <initializer_list>
#include <tuple>

#include "qsl/robin_hood_table.h"

namespace qsl {

template <class K, class V>
struct MapEntry {
    K first;
    V second;

    template <class Key, class... Args>
    explicit MapEntry(std::piecewise_construct_t, Key&& key, Args&&... args)
        : first(std::forward<Key>(key)), second(Make(std::forward<Args>(args)...)) {}

  private:
    template <class... Args>
    static V Make(Args&&... args) {
        if constexpr (std::is_constructible_v<V, Args...>)
            return V(std::forward<Args>(args)...);
        else
            return V{std::forward<Args>(args)...};
    }
};

template <class K, class V>
struct MapPolicy {
    static const K& Key(const MapEntry<K, V>& entry) { return entry.first; }
};

template <class K, class V, class Hash = DefaultHash<K>, class Alloc = std::allocator<std::byte>>
class HashMap : public RobinHoodTable<MapEntry<K, V>, MapPolicy<K, V>, Hash, Alloc> {
    using Base = RobinHoodTable<MapEntry<K, V>, MapPolicy<K, V>, Hash, Alloc>;

  public:
    using TriviallyRelocatable = HashMap;
    using key_type = K;
    using mapped_type = V;
    using value_type = MapEntry<K, V>;
    using typename Base::const_iterator;
    using typename Base::iterator;
    using typename Base::Lookup;

    HashMap() = default;
    HashMap(std::initializer_list<std::pair<K, V>> entries) {
        this->reserve(entries.size());
        for (const auto& [key, value] : entries)
            insert(key, value);
    }

    /// The value of the key, or null.
    V* get(Lookup key) {
        auto* slot = this->FindSlot(key);
        return slot ? &slot->entry()->second : nullptr;
    }
    const V* get(Lookup key) const { return const_cast<HashMap*>(this)->get(key); }

    /// The value of the key, or what is given for a missing one.
    V get_or(Lookup key, V missing) const {
        const V* value = get(key);
        return value ? *value : std::move(missing);
    }

    /// Makes the value from `args` unless the key is there; the second result tells which.
    template <class Key, class... Args>
    std::pair<iterator, bool> try_emplace(Key&& key, Args&&... args) {
        return this->FindOrEmplace(Base::LookupOf(key), std::piecewise_construct, std::forward<Key>(key),
                                   std::forward<Args>(args)...);
    }
    template <class Key, class... Args>
    std::pair<iterator, bool> emplace(Key&& key, Args&&... args) {
        return try_emplace(std::forward<Key>(key), std::forward<Args>(args)...);
    }
    std::pair<iterator, bool> insert(const K& key, V value) { return try_emplace(key, std::move(value)); }

    template <class Key, class Value>
    std::pair<iterator, bool> insert_or_assign(Key&& key, Value&& value) {
        auto result = try_emplace(std::forward<Key>(key));
        result.first->second = std::forward<Value>(value);
        return result;
    }

    template <class Key>
    V& operator[](Key&& key) {
        return try_emplace(std::forward<Key>(key)).first->second;
    }

    /// Takes the value out of the map; `missing` when the key was not there.
    V take(Lookup key, V missing = V()) {
        auto found = this->find(key);
        if (found == this->end()) return missing;
        V value = std::move(found->second);
        Base::erase(const_iterator(found));
        return value;
    }
};

}  // namespace qsl
