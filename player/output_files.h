#pragma once

#include <qorvex/frame_stats.h>

#include <string>
#include <vector>

#include "options.h"

namespace player {

class Session;

// Writes every file that the options ask for. False with one line when one cannot be written.
[[nodiscard]] bool WriteOutputs(Session& session, const Options& options, const std::string& capture,
                                const std::vector<qorvex::FrameStats>& stats, std::string& error);

}  // namespace player
