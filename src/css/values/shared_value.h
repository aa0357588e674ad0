// Base of the records that several styles share across threads: counted atomically, born with a count of 1,
// freed under the CSS tag. Holders point to const: a shared record never changes.
#pragma once

#include "core/memory/ref_counted.h"

namespace qorvex::css {

template <class Derived>
using SharedValue = AtomicRefCounted<Derived, MemoryTag::CSS>;

}  // namespace qorvex::css
