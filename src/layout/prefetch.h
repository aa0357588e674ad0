// Asks for memory ahead of walks over a large page, which wait for little else: ten thousand boxes are more
// than the near caches hold.
#pragma once

#include "layout/layout_handle.h"

#include <cstddef>

namespace qorvex::layout {

// How many nodes ahead a walk asks for.
inline constexpr uint32_t kNodesAhead = 6;

inline void PrefetchBytes(const void* begin, size_t size) {
    constexpr size_t kCacheLine = 64;
    const auto* memory = static_cast<const char*>(begin);
    for (size_t at = 0; at < size; at += kCacheLine)
        __builtin_prefetch(memory + at);
    __builtin_prefetch(memory + size - 1);
}

// With the part that boxes have behind it.
inline void PrefetchNode(const LayoutHandle& handle) {
    PrefetchBytes(&handle.node(), sizeof(LayoutNode) + sizeof(BoxNode));
}

// The node, and what the handle itself holds.
inline void PrefetchHandle(const LayoutHandle& handle) {
    __builtin_prefetch(&handle);
    PrefetchNode(handle);
}

// What the recording reads of every node, from its visuals to a box's children.
inline void PrefetchPaint(const LayoutHandle& handle) {
    constexpr size_t kPaintBytes = 128;
    PrefetchBytes(&handle.node().visuals, kPaintBytes);
}

// What writing a node's style touches beside the node, whose own memory has arrived. Yoga's nodes begin with
// their style.
inline void PrefetchStyle(const LayoutHandle& handle) {
    constexpr size_t kYogaStyleBytes = 216;
    const LayoutNode& node = handle.node();
    if (node.flex != nullptr) PrefetchBytes(node.flex, kYogaStyleBytes);
    __builtin_prefetch(node.display.get());
}

}  // namespace qorvex::layout
