// Moving objects by copying their bytes. A type says that it may be moved so with
//     using TriviallyRelocatable = ThisType;
// Naming the type itself keeps a derived class from inheriting a promise that its own members may break.
#pragma once

#include <cstring>
#include <memory>
#include <new>
#include <type_traits>
#include <utility>

namespace qsl {

namespace detail {
template <class T>
concept SaysRelocatable = std::is_same_v<typename T::TriviallyRelocatable, T>;
}  // namespace detail

/// Constructs in raw memory; plain aggregates are filled member by member.
template <class T, class... Args>
T* ConstructAt(void* memory, Args&&... args) {
    if constexpr (std::is_constructible_v<T, Args...>)
        return ::new (memory) T(std::forward<Args>(args)...);
    else
        return ::new (memory) T{std::forward<Args>(args)...};
}

template <class T>
inline constexpr bool kTriviallyRelocatable = std::is_trivially_copyable_v<T> || detail::SaysRelocatable<T>;

/// Moves `count` objects to raw memory that does not overlap; the source is raw memory afterwards.
template <class T>
void RelocateDisjoint(T* from, size_t count, T* to) {
    if constexpr (kTriviallyRelocatable<T>) {
        if (count) std::memcpy(static_cast<void*>(to), static_cast<const void*>(from), count * sizeof(T));
    } else {
        std::uninitialized_move_n(from, count, to);
        std::destroy_n(from, count);
    }
}

/// Opens or closes a gap inside one array: moves `count` objects from `from` to `to`; what lies between the
/// two is raw memory before (closing) or afterwards (opening).
template <class T>
void RelocateOverlapping(T* from, size_t count, T* to) {
    if constexpr (kTriviallyRelocatable<T>) {
        if (count) std::memmove(static_cast<void*>(to), static_cast<const void*>(from), count * sizeof(T));
    } else if (to < from) {
        for (size_t i = 0; i < count; ++i) {
            std::construct_at(to + i, std::move(from[i]));
            std::destroy_at(from + i);
        }
    } else {
        for (size_t i = count; i-- > 0;) {
            std::construct_at(to + i, std::move(from[i]));
            std::destroy_at(from + i);
        }
    }
}

}  // namespace qsl
