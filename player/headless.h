#pragma once

#include "options.h"

namespace player {

// Exit codes of the program.
enum ExitCode { kExitFine = 0, kExitBadInput = 2, kExitStrict = 3 };

// Runs without a window, as fast as the page allows: frame after frame, each a fixed time after the last,
// until the asked number is reached or the page is loaded and quiet. Then writes what the options ask for.
[[nodiscard]] int RunHeadless(const Options& options);

}  // namespace player
