// Memory of this library: everything goes through the client's allocator, which Library::Start sets.
// Containers use StdAllocator; for them the end of memory is the end of the process, as for any std container
// without exceptions. What a page can make large (layers, surfaces, masks, images) is a PixelBuffer, which
// fails softly.
#pragma once
#include <cstddef>
#include <new>
#include <unordered_map>
#include <utility>
#include <vector>

namespace fresco {

void* HeapAllocate(size_t size, size_t alignment);
void HeapFree(void* block, size_t alignment);
[[noreturn]] void HeapExhausted(size_t size);

template <class T>
struct StdAllocator {
    using value_type = T;
    StdAllocator() = default;
    template <class U>
    StdAllocator(const StdAllocator<U>&) {}  // NOLINT: the standard asks for an implicit conversion
    T* allocate(size_t count) {
        void* block = HeapAllocate(count * sizeof(T), alignof(T));
        if (!block) HeapExhausted(count * sizeof(T));
        return static_cast<T*>(block);
    }
    void deallocate(T* block, size_t) { HeapFree(block, alignof(T)); }
    template <class U>
    bool operator==(const StdAllocator<U>&) const {
        return true;
    }
};

template <class T>
using Vector = std::vector<T, StdAllocator<T>>;
template <class K, class V, class Hash = std::hash<K>>
using HashMap = std::unordered_map<K, V, Hash, std::equal_to<K>, StdAllocator<std::pair<const K, V>>>;

template <class T, class... Args>
[[nodiscard]] T* HeapNew(Args&&... args) {
    void* block = HeapAllocate(sizeof(T), alignof(T));
    return block ? new (block) T(std::forward<Args>(args)...) : nullptr;
}

template <class T>
void HeapDelete(T* object) {
    if (!object) return;
    object->~T();
    HeapFree(object, alignof(T));
}

template <class T>
struct HeapDeleter {
    void operator()(T* object) const { HeapDelete(object); }
};

}  // namespace fresco
