/// The client's log sink.
#pragma once

#include <cstdint>

namespace qorvex {
namespace Logging {

/// Lines below the severity that the library was started with are dropped; 6 silences the log.
enum Severity : uint32_t {
    Trace = 0,
    Debug = 1,
    Info = 2,
    Warning = 3,
    Error = 4,
    Assert = 5,
};

/// Implemented by the client. May be called from any thread that runs the engine, from several at once.
class ILogHandler {
  public:
    virtual ~ILogHandler() = default;
    /// `text`: up to 1023 characters and a zero that `length` counts, valid during the call. What scripts log
    /// or throw may have line feeds; a handler of lines replaces them. The handler must not call the engine.
    virtual void WriteLog(Severity severity, const char* text, unsigned length) {
        (void)severity, (void)text, (void)length;
    }
};

}  // namespace Logging
}  // namespace qorvex
