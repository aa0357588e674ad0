// qorvex-player: shows one page in a window, or runs it headless and writes what came of it.
#include <cstdio>
#include <cstdlib>
#include <string>

#include "headless.h"
#include "options.h"
#include "window.h"

int main(int count, char** arguments) {
    if (count == 2 && std::string(arguments[1]) == "--help") {
        std::fputs(player::UsageText(), stdout);
        return player::kExitFine;
    }
    std::string error;
    const std::optional<player::Options> options = player::ParseOptions(count, arguments, error);
    if (!options) {
        std::fprintf(stderr, "qorvex-player: %s\n", error.c_str());
        if (count < 2) std::fputs(player::UsageText(), stderr);
        return player::kExitBadInput;
    }
    const bool display = std::getenv("DISPLAY") || std::getenv("WAYLAND_DISPLAY");
    const bool headless = options->frames || options->WantsOutput() || !display;
    return headless ? player::RunHeadless(*options) : player::RunWindow(*options);
}
