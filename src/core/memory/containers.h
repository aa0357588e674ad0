// The engine's strings and containers: those of qsl with the tagged allocator behind them.
#pragma once

#include "core/memory/allocator.h"
#include "core/memory/ref_counted.h"
#include "core/memory/temp_vector.h"
#include "qsl/compact_vector.h"
#include "qsl/function.h"
#include "qsl/hash_map.h"
#include "qsl/hash_set.h"
#include "qsl/node_set.h"
#include "qsl/small_vector.h"
#include "qsl/string.h"
#include "qsl/vector.h"

namespace qorvex {

template <MemoryTag Tag>
using TaggedString = qsl::container::basic_string<TaggedStdAllocator<char, Tag>>;
using String = TaggedString<MemoryTag::General>;

template <class T, MemoryTag Tag = MemoryTag::General>
using Vector = qsl::Vector<T, TaggedStdAllocator<T, Tag>>;
template <class T, MemoryTag Tag = MemoryTag::General>
using CompactVector = qsl::CompactVector<T, TaggedStdAllocator<T, Tag>>;
template <class T, uint32_t N, MemoryTag Tag = MemoryTag::General>
using SmallVector = qsl::SmallVector<T, N, TaggedStdAllocator<T, Tag>>;

template <class K, class V, MemoryTag Tag = MemoryTag::General, class Hash = qsl::DefaultHash<K>>
using HashMap = qsl::HashMap<K, V, Hash, TaggedStdAllocator<std::byte, Tag>>;
template <class K, MemoryTag Tag = MemoryTag::General, class Hash = qsl::DefaultHash<K>>
using HashSet = qsl::HashSet<K, Hash, TaggedStdAllocator<std::byte, Tag>>;
/// `Pointer` is a pointer type.
template <class Pointer, MemoryTag Tag = MemoryTag::General>
using NodeSet = qsl::NodeSet<Pointer, TaggedStdAllocator<std::byte, Tag>>;

template <class Signature, MemoryTag Tag = MemoryTag::General>
using Function = qsl::function<Signature, TaggedStdAllocator<std::byte, Tag>>;

}  // namespace qorvex
