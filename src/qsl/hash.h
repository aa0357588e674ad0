// Hashes and key handling of the flat maps. DefaultHash<K> tells three things: the type by which a key is
// looked up (a string by its view, an owning pointer by its plain one, so that no key is built to ask for
// one), its hash, and when a stored key equals a looked-up one. The tables multiply by the Fibonacci constant
// and keep the high bits, so a hash here only has to be distinct, not well spread.
#pragma once

#include <cstdint>
#include <string_view>
#include <type_traits>
#include <utility>

#include "qsl/city_hash.h"
#include "qsl/string.h"

namespace qsl {

inline constexpr uint64_t kFibonacci = 0x9E3779B97F4A7C15ULL;

/// Pointers are multiples of 8; folding them keeps the low bits busy for tables that use a remainder.
inline uint64_t HashPointer(const void* pointer) {
    const auto p = reinterpret_cast<uintptr_t>(pointer);
    return (p >> 3) + p;
}

inline uint64_t HashPair(uint64_t a, uint64_t b) {
    return ((a >> 3) + a) ^ ((b >> 3) + b);
}

template <class K>
struct DefaultHash;

template <class K>
requires(std::is_integral_v<K> || std::is_enum_v<K>) struct DefaultHash<K> {
    using Lookup = K;
    static uint64_t Hash(K key) { return static_cast<uint64_t>(key); }
    static bool Equal(K a, K b) { return a == b; }
};

template <class T>
struct DefaultHash<T*> {
    using Lookup = const T*;
    static uint64_t Hash(const T* key) { return HashPointer(key); }
    static bool Equal(const T* a, const T* b) { return a == b; }
};

/// Types that carry their own hash: `uint64_t HashValue() const` and operator==.
template <class K>
requires requires(const K& key) {
    { key.HashValue() } -> std::convertible_to<uint64_t>;
}
struct DefaultHash<K> {
    using Lookup = const K&;
    static uint64_t Hash(const K& key) { return key.HashValue(); }
    static bool Equal(const K& a, const K& b) { return a == b; }
};

template <class A, class B>
struct DefaultHash<std::pair<A, B>> {
    using Lookup = const std::pair<A, B>&;
    static uint64_t Hash(Lookup key) {
        return HashPair(DefaultHash<A>::Hash(key.first), DefaultHash<B>::Hash(key.second));
    }
    static bool Equal(Lookup a, Lookup b) { return a == b; }
};

template <>
struct DefaultHash<std::string_view> {
    using Lookup = std::string_view;
    static uint64_t Hash(std::string_view key) { return CityHash64(key); }
    static bool Equal(std::string_view a, std::string_view b) { return a == b; }
};

template <class Alloc>
struct DefaultHash<container::basic_string<Alloc>> : DefaultHash<std::string_view> {};

}  // namespace qsl
