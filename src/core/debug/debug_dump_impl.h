#pragma once

#include <qorvex/debug_dump.h>

#include <string_view>

#include "core/memory/containers.h"

namespace qorvex {

class DebugDumpImpl final : public DebugDump {
  public:
    explicit DebugDumpImpl(std::string_view text) : text_(text) {}
    ~DebugDumpImpl() override = default;
    const char* GetText() const override { return text_.c_str(); }
    size_t GetLength() const override { return text_.size(); }
    void Destroy() override { Delete<MemoryTag::DebugDump>(this); }

  private:
    TaggedString<MemoryTag::DebugDump> text_;
};

}  // namespace qorvex
