#pragma once

#include <qorvex/logging.h>

#include <array>
#include <atomic>
#include <cstdint>
#include <cstdio>
#include <mutex>

namespace qorvex::host {

// Prints each line to a stream with its severity in front, and counts what it saw. Any thread.
class PrintLogHandler final : public Logging::ILogHandler {
  public:
    explicit PrintLogHandler(std::FILE* stream = stderr) : stream_(stream) {}

    void WriteLog(Logging::Severity severity, const char* text, unsigned length) override;

    // Lines of this severity or above so far.
    [[nodiscard]] std::uint64_t CountFrom(std::uint32_t severity) const;

  private:
    std::FILE* stream_;
    std::mutex mutex_;
    std::array<std::atomic<std::uint64_t>, 6> counts_{};
};

}  // namespace qorvex::host
