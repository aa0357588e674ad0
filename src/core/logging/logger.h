// The process-wide logger: a threshold, the handler, and the streams that lines are put together in. It
// exists from early in the start of the library to late in its end; lines outside that span are dropped.
#pragma once

#include <qorvex/logging.h>

namespace qorvex {

/// Starts logging to the handler, or to a default handler of its own when that is null. A second start says
/// so on standard error and changes nothing; the result tells whether this one started it.
bool StartLogging(Logging::Severity threshold, Logging::ILogHandler* handler);
/// No other thread may log any more.
void EndLogging();

/// The handler that lines go to, null outside the logger's life.
Logging::ILogHandler* GetLogHandler();
Logging::Severity GetLoggingSeverity();

}  // namespace qorvex
