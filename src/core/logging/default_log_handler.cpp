#include "core/logging/default_log_handler.h"

#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <ctime>

namespace qorvex {
namespace {

constexpr char kSeverityLetters[] = "TDIWAE";

long CurrentThreadId() {
    return static_cast<long>(syscall(SYS_gettid));
}

}  // namespace

DefaultLogHandler::DefaultLogHandler() : file_(std::fopen("qorvex_default.log", "w")) {
    if (!file_) std::fputs("Unable to create log file in supposedly writable folder!\n", stderr);
}

DefaultLogHandler::~DefaultLogHandler() {
    if (file_) std::fclose(file_);
}

void DefaultLogHandler::WriteLog(Logging::Severity severity, const char* text, unsigned length) {
    qsl::MutexLock lock(mutex_);
    stream_.Reset();
    stream_.WriteNumber(CurrentThreadId());
    stream_ << " Time: ";
    stream_.WriteNumber(static_cast<int64_t>(std::time(nullptr)));
    stream_ << ' ' << kSeverityLetters[std::min<uint32_t>(severity, 5)] << " | ";
    // A page must not be able to forge lines, nor a script's stack break one.
    stream_.WriteOnOneLine(std::string_view(text, length ? length - 1 : 0));
    stream_ << '\n';

    const std::string_view line = stream_.view();
    if (file_) {
        std::fwrite(line.data(), 1, line.size(), file_);
        std::fflush(file_);
    }
    if (standard_streams_) {
        std::FILE* out = severity < Logging::Error ? stdout : stderr;
        std::fwrite(line.data(), 1, line.size(), out);
        std::fflush(out);
    }
}

}  // namespace qorvex
