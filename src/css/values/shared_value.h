// Base of the records that several styles share across threads: counted atomically, born with a count of 1,
// freed under the CSS tag. Holders point to const: a shared record never changes.
#pragma once

#include <atomic>
#include <cstdint>
#include <utility>

#include "core/memory/containers.h"
#include "qsl/ref_ptr.h"

namespace qorvex::css {

template <class Derived>
class SharedValue {
  public:
    SharedValue() = default;
    SharedValue(const SharedValue&) {}  // a copy is a record of its own
    SharedValue& operator=(const SharedValue&) { return *this; }

    void AddRef() const { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() const {
        if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1)
            Delete<MemoryTag::CSS>(static_cast<const Derived*>(this));
    }
    bool IsUnique() const { return count_.load(std::memory_order_acquire) == 1; }
    uint32_t UseCount() const { return count_.load(std::memory_order_relaxed); }

  private:
    mutable std::atomic<uint32_t> count_{1};
};

template <class T, class... Args>
[[nodiscard]] qsl::RefPtr<T> MakeShared(Args&&... args) {
    return qsl::RefPtr<T>::Adopt(New<std::remove_const_t<T>, MemoryTag::CSS>(std::forward<Args>(args)...));
}

}  // namespace qorvex::css
