// A set of handles that keeps one reference to each. Changed, removed and frame change sets are of this kind.
#pragma once

#include "core/memory/containers.h"
#include "layout/layout_handle.h"

namespace qorvex::layout {

class HandleSet {
  public:
    HandleSet() = default;
    HandleSet(const HandleSet&) = delete;
    HandleSet& operator=(const HandleSet&) = delete;
    ~HandleSet() { Clear(); }

    // False when the handle was there already.
    bool Insert(LayoutHandle* handle);
    bool Erase(LayoutHandle* handle);
    bool Contains(const LayoutHandle* handle) const;
    uint32_t Size() const;
    bool Empty() const { return Size() == 0; }
    // Empties the set; a table that was under a quarter full first shrinks by one step.
    void Clear();
    void Swap(HandleSet& other);

    template <typename F>
    void ForEach(F&& visit) const {
        for (LayoutHandle* handle : set_)
            visit(*handle);
    }

  private:
    NodeSet<LayoutHandle*, MemoryTag::LayoutNodes> set_;
};

}  // namespace qorvex::layout
