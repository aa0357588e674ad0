// Names of nodes by handle, for the metadata that a view may emit. DOM thread.
#pragma once

#include "core/memory/containers.h"

#include <string_view>

namespace qorvex::layout {

class LayoutHandle;

class DebugNames {
  public:
    using Name = TaggedString<MemoryTag::LayoutData>;

    void Set(const LayoutHandle* handle, std::string_view name) {
        names_.insert_or_assign(handle, Name(name));
    }
    void Erase(const LayoutHandle* handle) { names_.erase(handle); }
    // Empty when unknown.
    std::string_view Find(const LayoutHandle* handle) const;
    void Clear() { names_.clear(); }

  private:
    HashMap<const LayoutHandle*, Name, MemoryTag::LayoutData> names_;
};

}  // namespace qorvex::layout
