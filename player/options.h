#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace player {

// Where the view's clock callback takes its time from.
enum class ClockSource { Default, Frame, Real };

// What the command line asks for. README.md tells each option; the defaults are those of a windowed run.
struct Options {
    uint32_t width = 1280;
    uint32_t height = 720;
    std::optional<uint32_t> frames;  // given: headless, exactly that many
    double frame_milliseconds = 1000.0 / 60.0;
    std::string png_file;
    std::string boxes_file;
    std::string script_file;
    std::string events_file;
    std::string capture_file;
    std::string style_selector;
    std::string stats_file;
    ClockSource clock = ClockSource::Default;
    bool synchronous_layout = false;
    uint32_t workers = 2;
    std::optional<uint64_t> unruly_seed;  // given: answers come late, cut, twice or not well
    uint32_t log_severity = 3;            // Warning
    bool strict = false;
    std::vector<std::string> fonts;
    std::string default_font;
    std::vector<std::string> bitmap_fonts;
    bool text_services = true;
    std::string translations_file;
    std::string page;

    // True when the run has a result to write and so needs no window.
    [[nodiscard]] bool WantsOutput() const {
        return !png_file.empty() || !boxes_file.empty() || !capture_file.empty() || !style_selector.empty() ||
               !stats_file.empty();
    }
};

// Reads the command line. On a bad argument returns nothing and puts one line for the user into `error`.
[[nodiscard]] std::optional<Options> ParseOptions(int count, char** arguments, std::string& error);

// The usage text, one line an option.
[[nodiscard]] const char* UsageText();

}  // namespace player
