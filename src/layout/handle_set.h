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

// The handles to which the layout side gave something new, in the order in which it found them, each once and
// with one reference. A mark in the node, which no two frames' lists need at once, says who is in: most of a
// page may be.
class UpdatedList {
  public:
    UpdatedList() = default;
    UpdatedList(const UpdatedList&) = delete;
    UpdatedList& operator=(const UpdatedList&) = delete;
    ~UpdatedList() { Clear(); }

    void Add(LayoutHandle& handle) {
        if (handle.node().isInUpdated) return;
        handle.node().isInUpdated = true;
        handles_.push_back(HandlePtr(&handle));
    }
    void Clear();

    template <typename F>
    void ForEach(F&& visit) const {
        for (const HandlePtr& handle : handles_)
            visit(*handle);
    }

  private:
    Vector<HandlePtr, MemoryTag::LayoutNodes> handles_;
};

}  // namespace qorvex::layout
