#pragma once

#include "options.h"

namespace player {

// Shows the page in a window until it is closed: input goes to the view, only changed frames are shown, F5
// reloads, the title tells the frame's times.
[[nodiscard]] int RunWindow(const Options& options);

}  // namespace player
