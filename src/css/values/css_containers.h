// Containers of the style system: all memory under the CSS tag.
#pragma once

#include "core/memory/containers.h"

namespace qorvex::css {

using CssString = TaggedString<MemoryTag::CSS>;

template <class T>
using CssVector = Vector<T, MemoryTag::CSS>;

template <class T, uint32_t N>
using CssSmallVector = SmallVector<T, N, MemoryTag::CSS>;

template <class K, class V>
using CssHashMap = HashMap<K, V, MemoryTag::CSS>;

// A list-valued record. The tag makes lists with equal items different value types, each with its own parser.
template <class Item, class Tag>
struct ValueList {
    CssVector<Item> items;

    bool empty() const { return items.empty(); }
    size_t size() const { return items.size(); }
    const Item& operator[](size_t index) const { return items[index]; }
    Item& operator[](size_t index) { return items[index]; }
    const Item* begin() const { return items.begin(); }
    const Item* end() const { return items.end(); }
    Item* begin() { return items.begin(); }
    Item* end() { return items.end(); }
    friend bool operator==(const ValueList&, const ValueList&) = default;
};

}  // namespace qorvex::css
