// Log handler for tests: keeps all lines.
#pragma once

#include <mutex>
#include <string>
#include <vector>

#include <qorvex/logging.h>

namespace qorvex::test {

class CapturingLogHandler final : public Logging::ILogHandler {
  public:
    struct Line {
        Logging::Severity severity;
        std::string text;
    };

    void WriteLog(Logging::Severity severity, const char* text, unsigned length) override {
        std::lock_guard lock(mutex_);
        lines_.push_back({severity, std::string(text, length ? length - 1 : 0)});
    }

    std::vector<Line> Lines() const {
        std::lock_guard lock(mutex_);
        return lines_;
    }
    /// Lines that contain the text.
    size_t Count(const std::string& part) const {
        std::lock_guard lock(mutex_);
        size_t count = 0;
        for (const Line& line : lines_)
            count += line.text.find(part) != std::string::npos;
        return count;
    }
    size_t CountSeverity(Logging::Severity severity) const {
        std::lock_guard lock(mutex_);
        size_t count = 0;
        for (const Line& line : lines_)
            count += line.severity == severity;
        return count;
    }
    bool Contains(const std::string& part) const { return Count(part) != 0; }
    void Clear() {
        std::lock_guard lock(mutex_);
        lines_.clear();
    }

  private:
    mutable std::mutex mutex_;
    std::vector<Line> lines_;
};

}  // namespace qorvex::test
