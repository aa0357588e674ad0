// Text made for developers by View::DumpDOM and View::DumpStackingContexts.
#pragma once

#include <cstddef>

namespace qorvex {

// Owned by the caller, released with Destroy on the main thread. Implemented by the engine.
class DebugDump {
  public:
    virtual const char* GetText() const = 0;    // UTF-8, zero-terminated, lives as long as the dump
    virtual std::size_t GetLength() const = 0;  // without the terminator
    virtual void Destroy() = 0;

  protected:
    virtual ~DebugDump() = default;
};

}  // namespace qorvex
