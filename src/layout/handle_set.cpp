#include "layout/handle_set.h"

namespace qorvex::layout {

bool HandleSet::Insert(LayoutHandle* handle) {
    if (!set_.insert(handle)) return false;
    handle->AddRef();
    return true;
}

bool HandleSet::Erase(LayoutHandle* handle) {
    if (!set_.erase(handle)) return false;
    handle->Release();
    return true;
}

bool HandleSet::Contains(const LayoutHandle* handle) const {
    return set_.contains(handle);
}

uint32_t HandleSet::Size() const {
    return set_.size();
}

void HandleSet::Clear() {
    for (LayoutHandle* handle : set_)
        handle->Release();
    set_.clear();
}

void HandleSet::Swap(HandleSet& other) {
    set_.swap(other.set_);
}

void UpdatedList::Clear() {
    for (const HandlePtr& handle : handles_)
        handle->node().isInUpdated = false;
    handles_.clear();
}

}  // namespace qorvex::layout
