#include "print_log_handler.h"

#include <algorithm>
#include <string>

namespace qorvex::host {

void PrintLogHandler::WriteLog(Logging::Severity severity, const char* text, unsigned length) {
    static constexpr const char* kNames[] = {"trace", "debug", "info", "warning", "error", "assert"};
    const std::uint32_t row = std::min<std::uint32_t>(severity, std::size(kNames) - 1);
    counts_[row].fetch_add(1, std::memory_order_relaxed);
    // The length counts the terminator.
    std::string line(text, length > 0 ? length - 1 : 0);
    // One message, one line: a script's stack has line feeds, and a page must not be able to forge lines.
    std::replace_if(
        line.begin(), line.end(), [](unsigned char c) { return c < ' ' || c == 0x7F; }, ' ');
    const std::lock_guard lock(mutex_);
    std::fprintf(stream_, "%s: %s\n", kNames[row], line.c_str());
}

std::uint64_t PrintLogHandler::CountFrom(std::uint32_t severity) const {
    std::uint64_t sum = 0;
    for (std::size_t i = severity; i < counts_.size(); ++i)
        sum += counts_[i].load(std::memory_order_relaxed);
    return sum;
}

}  // namespace qorvex::host
