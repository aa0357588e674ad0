// The client's log sink.
#pragma once
#include <cstddef>
#include <cstdint>

namespace fresco {
namespace Logging {

enum Severity : uint32_t { Trace = 0, Debug = 1, Info = 2, Warning = 3, Error = 4, Assert = 5 };

class ILogHandler {
  public:
    virtual ~ILogHandler() = default;
    // Called from any thread with one line of UTF-8, not terminated by a new line. `text[length]` is 0.
    virtual void WriteLog(Severity severity, const char* text, size_t length) = 0;
};

}  // namespace Logging
}  // namespace fresco
