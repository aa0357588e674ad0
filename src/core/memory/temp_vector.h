// Containers in temporary memory. They must not outlive the TempMark around them, nor grow while an inner one
// is open: what they would grow into is gone when that one closes.
#pragma once

#include "core/memory/temp_allocator.h"
#include "qsl/string.h"
#include "qsl/vector.h"

namespace qorvex {

template <class T>
using TempVector = qsl::Vector<T, TempStdAllocator<T>>;
using TempString = qsl::container::basic_string<TempStdAllocator<char>>;

}  // namespace qorvex
