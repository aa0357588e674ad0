// Public operations that this build does not have yet: one Warning that names the operation, and the neutral
// value. They stand in one place per class, so that nothing looks done that is not.
#pragma once

#include "core/logging/log.h"

namespace qorvex {

inline void LogUnavailable(const char* operation) {
    LogWarning(operation, " is not available in this build");
}

}  // namespace qorvex
