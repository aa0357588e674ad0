// How the containers ask for memory. They take std-style allocators without state, so that a container is no
// larger for having one and any two of the same type may exchange their memory.
#pragma once

#include <cstddef>
#include <memory>
#include <type_traits>

namespace qsl {

template <class Alloc, class T>
using Rebind = typename std::allocator_traits<Alloc>::template rebind_alloc<T>;

template <class T, class Alloc>
[[nodiscard]] T* AllocateArray(size_t count) {
    static_assert(std::is_empty_v<Alloc>, "containers take allocators without state");
    return Rebind<Alloc, T>().allocate(count);
}

template <class T, class Alloc>
void DeallocateArray(T* memory, size_t count) {
    Rebind<Alloc, T>().deallocate(memory, count);
}

/// An allocator that can grow a block in place offers `reallocate(memory, old_count, new_count)`.
template <class Alloc, class T>
concept CanReallocate = requires(Rebind<Alloc, T> a, T* memory, size_t count) {
    { a.reallocate(memory, count, count) } -> std::same_as<T*>;
};

}  // namespace qsl
