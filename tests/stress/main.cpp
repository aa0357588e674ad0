// qorvex-stress: random sequences of public calls, against an unruly resource handler, in every thread mode.
// README.md tells the options. Exit code 1, with the line that replays it, for the first sequence that fails.
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "world.h"

namespace {

// One sequence that takes longer hangs, sanitizers and slow machines included.
constexpr unsigned kMostSeconds = 120;

char g_replay[160];  // read by the signal handler

void OnAlarm(int) {
    static constexpr char kText[] = "hangs: ";
    (void)!write(2, kText, sizeof kText - 1);
    (void)!write(2, g_replay, std::strlen(g_replay));
    std::abort();
}

struct Arguments {
    unsigned long sequences = 100;
    unsigned long operations = 60;
    unsigned long long seed = 1;
    int mode = -1;  // all in turn
    bool print = false;
};

int ModeByName(const char* name) {
    for (int mode = 0; mode < stress::kModes; ++mode)
        if (std::strcmp(name, stress::NameOf(static_cast<stress::Mode>(mode))) == 0) return mode;
    return -1;
}

bool Read(int count, char** arguments, Arguments& out) {
    for (int i = 1; i < count; ++i) {
        const std::string name = arguments[i];
        if (name == "--verbose") {
            out.print = true;
            continue;
        }
        const char* value = i + 1 < count ? arguments[++i] : "";
        if (name == "--sequences")
            out.sequences = std::strtoul(value, nullptr, 10);
        else if (name == "--operations")
            out.operations = std::strtoul(value, nullptr, 10);
        else if (name == "--seed")
            out.seed = std::strtoull(value, nullptr, 10);
        else if (name != "--mode" || (out.mode = ModeByName(value)) < 0)
            return false;
    }
    return true;
}

}  // namespace

int main(int count, char** values) {
    Arguments arguments;
    if (!Read(count, values, arguments)) {
        std::fprintf(stderr,
                     "usage: qorvex-stress [--sequences N] [--seed S] [--operations N] [--verbose]\n"
                     "                     [--mode sync|polling|layout|threads|jobs]\n");
        return 2;
    }
    std::signal(SIGALRM, OnAlarm);
    for (unsigned long i = 0; i < arguments.sequences; ++i) {
        const unsigned long long seed = arguments.seed + i;
        const auto mode = static_cast<stress::Mode>(
            arguments.mode >= 0 ? arguments.mode : static_cast<int>(seed % stress::kModes));
        std::snprintf(g_replay, sizeof g_replay,
                      "qorvex-stress --mode %s --seed %llu --sequences 1 --operations %lu\n",
                      stress::NameOf(mode), seed, arguments.operations);
        if (arguments.print) std::fprintf(stderr, "%s", g_replay);
        alarm(kMostSeconds);
        stress::World world(mode, seed, arguments.print);
        world.Run(static_cast<unsigned>(arguments.operations));
        const auto faults = world.Faults();
        if (faults.empty()) continue;
        for (const std::string& fault : faults)
            std::fprintf(stderr, "%s\n", fault.c_str());
        std::fprintf(stderr, "fails: %s", g_replay);
        return 1;
    }
    alarm(0);
    std::printf("%lu sequences of %lu operations\n", arguments.sequences, arguments.operations);
    return 0;
}
