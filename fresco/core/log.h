// Log lines through the client's handler.
#pragma once
#include <fresco/logging.h>

namespace fresco {

[[gnu::format(printf, 2, 3)]] void Log(Logging::Severity severity, const char* format, ...);

#define FRESCO_WARN(...) ::fresco::Log(::fresco::Logging::Warning, __VA_ARGS__)

// A slip of this library's own: reported at the highest severity, and the caller returns its neutral value.
void AssertFailure(const char* text);

}  // namespace fresco
