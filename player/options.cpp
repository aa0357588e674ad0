#include "options.h"

#include <charconv>
#include <cstring>
#include <functional>
#include <string_view>

namespace player {
namespace {

template <class Number>
bool ReadNumber(std::string_view text, Number& out) {
    const auto [end, fault] = std::from_chars(text.data(), text.data() + text.size(), out);
    return fault == std::errc() && end == text.data() + text.size();
}

bool ReadSize(std::string_view text, Options& options) {
    const size_t cross = text.find('x');
    return cross != std::string_view::npos && ReadNumber(text.substr(0, cross), options.width) &&
           ReadNumber(text.substr(cross + 1), options.height) && options.width > 0 && options.height > 0 &&
           options.width <= 16384 && options.height <= 16384;
}

bool ReadSeverity(std::string_view text, uint32_t& out) {
    static constexpr std::string_view kNames[] = {"trace", "debug",  "info", "warning",
                                                  "error", "assert", "none"};
    for (uint32_t severity = 0; severity < std::size(kNames); ++severity) {
        if (text == kNames[severity]) {
            out = severity;
            return true;
        }
    }
    return ReadNumber(text, out) && out <= 6;
}

// One row an option: its name, the name of its value ("" for a switch), what it does, and how it is read.
struct OptionRow {
    const char* name;
    const char* value;
    const char* help;
    bool (*read)(std::string_view text, Options& options);
};

bool Store(std::string_view text, std::string& out) {
    out = text;
    return !out.empty();
}

constexpr OptionRow kRows[] = {
    {"--size", "WxH", "size of the view in pixels (1280x720)", ReadSize},
    {"--frames", "N", "run headless for N frames",
     [](std::string_view text, Options& o) {
         uint32_t count = 0;
         if (!ReadNumber(text, count)) return false;
         o.frames = count;
         return true;
     }},
    {"--dt", "MS", "milliseconds between two frames of a headless run (16.6667)",
     [](std::string_view text, Options& o) {
         return ReadNumber(text, o.frame_milliseconds) && o.frame_milliseconds >= 0;
     }},
    {"--png", "FILE", "write the last frame, over white",
     [](std::string_view text, Options& o) { return Store(text, o.png_file); }},
    {"--boxes", "FILE", "write the boxes of all elements as JSON",
     [](std::string_view text, Options& o) { return Store(text, o.boxes_file); }},
    {"--script", "FILE", "evaluate a script after the page has loaded",
     [](std::string_view text, Options& o) { return Store(text, o.script_file); }},
    {"--events", "FILE", "feed input records from a JSON array",
     [](std::string_view text, Options& o) { return Store(text, o.events_file); }},
    {"--capture", "FILE", "write the last frame's commands for fresco-replay",
     [](std::string_view text, Options& o) { return Store(text, o.capture_file); }},
    {"--dump-style", "SELECTOR", "print the computed style of the first match",
     [](std::string_view text, Options& o) { return Store(text, o.style_selector); }},
    {"--stats", "FILE", "write times and counts of each frame as JSON",
     [](std::string_view text, Options& o) { return Store(text, o.stats_file); }},
    {"--clock", "frame|real", "what the page's clock shows",
     [](std::string_view text, Options& o) {
         o.clock = text == "frame" ? ClockSource::Frame : ClockSource::Real;
         return text == "frame" || text == "real";
     }},
    {"--sync-layout", "", "lay out on the main thread",
     [](std::string_view, Options& o) { return o.synchronous_layout = true; }},
    {"--workers", "N", "worker threads for resources (2)",
     [](std::string_view text, Options& o) { return ReadNumber(text, o.workers) && o.workers <= 64; }},
    {"--unruly", "SEED", "spoil the answers to the page's requests: late, failed, cut, in pieces",
     [](std::string_view text, Options& o) {
         uint64_t seed = 0;
         if (!ReadNumber(text, seed)) return false;
         o.unruly_seed = seed;
         return true;
     }},
    {"--log", "LEVEL", "trace, debug, info, warning, error, assert or none (warning)",
     [](std::string_view text, Options& o) { return ReadSeverity(text, o.log_severity); }},
    {"--strict", "", "exit 3 when an Error or Assert line was logged",
     [](std::string_view, Options& o) { return o.strict = true; }},
    {"--font", "FILE", "register a font file under its own names; may be repeated",
     [](std::string_view text, Options& o) {
         o.fonts.emplace_back(text);
         return !text.empty();
     }},
    {"--default-font", "NAME", "family of last resort",
     [](std::string_view text, Options& o) { return Store(text, o.default_font); }},
    {"--bitmap-font", "FILE", "register a BMFont table with the images beside it; may be repeated",
     [](std::string_view text, Options& o) {
         o.bitmap_fonts.emplace_back(text);
         return !text.empty();
     }},
    {"--no-text-services", "", "leave out bidirectional text, line breaks by language and case mapping",
     [](std::string_view, Options& o) {
         o.text_services = false;
         return true;
     }},
    {"--translations", "FILE", "texts for elements with a data-l10n-id, as JSON",
     [](std::string_view text, Options& o) { return Store(text, o.translations_file); }},
};

const OptionRow* FindRow(std::string_view name) {
    for (const OptionRow& row : kRows) {
        if (name == row.name) return &row;
    }
    return nullptr;
}

}  // namespace

std::optional<Options> ParseOptions(int count, char** arguments, std::string& error) {
    Options options;
    for (int i = 1; i < count; ++i) {
        const std::string_view argument = arguments[i];
        if (argument.substr(0, 2) != "--") {
            if (!options.page.empty()) {
                error = "more than one page: " + options.page + " and " + std::string(argument);
                return std::nullopt;
            }
            options.page = argument;
            continue;
        }
        const OptionRow* row = FindRow(argument);
        if (!row) {
            error = "unknown option " + std::string(argument);
            return std::nullopt;
        }
        std::string_view value;
        if (*row->value) {
            if (i + 1 == count) {
                error = std::string(row->name) + " needs a value: " + row->value;
                return std::nullopt;
            }
            value = arguments[++i];
        }
        if (!row->read(value, options)) {
            error = std::string(row->name) + " takes " + row->value + ", not \"" + std::string(value) + "\"";
            return std::nullopt;
        }
    }
    if (options.page.empty()) {
        error = "no page given";
        return std::nullopt;
    }
    return options;
}

const char* UsageText() {
    static const std::string text = [] {
        std::string lines = "usage: qorvex-player [options] PAGE\n";
        for (const OptionRow& row : kRows) {
            std::string left = std::string("  ") + row.name + (*row.value ? " " : "") + row.value;
            left.resize(left.size() < 26 ? 26 : left.size() + 1, ' ');
            lines += left + row.help + "\n";
        }
        return lines;
    }();
    return text.c_str();
}

}  // namespace player
