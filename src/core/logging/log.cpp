#include "core/logging/log.h"

#include <atomic>
#include <cstdio>

#include "core/limits.h"
#include "core/logging/default_log_handler.h"
#include "core/logging/fixed_stream.h"
#include "core/logging/logger.h"
#include "core/memory/allocator.h"
#include "qsl/function.h"

namespace qorvex {
namespace {

using LineStream = FixedStream<limits::kLogLineBytes>;

/// Lock-free stack of the free streams. The head holds the index of the top stream plus one, 0 for none, with
/// a count of pops above it, so that a head which was taken and came back in between is not mistaken for the
/// old.
class StreamStack {
  public:
    StreamStack() {
        for (uint32_t i = 0; i < limits::kLogStreams; ++i)
            Push(i);
    }

    uint32_t Pop() {
        uint64_t head = head_.load(std::memory_order_acquire);
        for (;;) {
            const uint32_t top = static_cast<uint32_t>(head);
            if (top == 0) {
                head = head_.load(std::memory_order_acquire);
                continue;
            }
            const uint64_t pops = (head >> 32) + 1;
            const uint64_t next = pops << 32 | next_[top - 1].load(std::memory_order_relaxed);
            if (head_.compare_exchange_weak(head, next, std::memory_order_acquire)) return top - 1;
        }
    }

    void Push(uint32_t index) {
        uint64_t head = head_.load(std::memory_order_relaxed);
        uint64_t next;
        do {
            next_[index].store(static_cast<uint32_t>(head), std::memory_order_relaxed);
            next = (head & ~uint64_t{0xFFFFFFFF}) | (index + 1);
        } while (
            !head_.compare_exchange_weak(head, next, std::memory_order_release, std::memory_order_relaxed));
    }

    LineStream& operator[](uint32_t index) { return streams_[index]; }

  private:
    std::atomic<uint64_t> head_{0};
    std::atomic<uint32_t> next_[limits::kLogStreams] = {};
    LineStream streams_[limits::kLogStreams];
};

constexpr auto kLogNothing = static_cast<Logging::Severity>(Logging::Assert + 1);

struct Logger {
    bool owns_handler;
    Logging::ILogHandler* handler;
    StreamStack streams;
};

constinit std::atomic<Logger*> g_logger{nullptr};

void WritePiece(LineStream& stream, const LogPiece& piece) {
    switch (piece.kind) {
        case LogPiece::Kind::Text:
            stream << piece.text;
            break;
        case LogPiece::Kind::Signed:
            stream.WriteNumber(static_cast<int64_t>(piece.number));
            break;
        case LogPiece::Kind::Unsigned:
            stream.WriteNumber(piece.number);
            break;
        case LogPiece::Kind::Real:
            stream.WriteNumber(piece.real);
            break;
    }
}

void ReportEmptyFunctionCall() {
    LogError("Exception is thrown ", "call to empty qsl::function");
}

}  // namespace

constinit std::atomic<Logging::Severity> detail::g_log_threshold{kLogNothing};

void WriteLogLine(Logging::Severity severity, std::span<const LogPiece> pieces) {
    Logger* logger = g_logger.load(std::memory_order_acquire);
    if (!logger || !IsLogged(severity)) return;
    const uint32_t index = logger->streams.Pop();
    LineStream& stream = logger->streams[index];
    stream.Reset();
    for (const LogPiece& piece : pieces)
        WritePiece(stream, piece);
    stream.BlankZeros();
    const auto length = static_cast<unsigned>(stream.view().size() + 1);
    logger->handler->WriteLog(severity, stream.Terminated(), length);
    logger->streams.Push(index);
}

void AssertFailure(std::string_view text) {
    // The blank is the one character that each assert gives to stand behind its text.
    Log(Logging::Assert, "Assert failure: ", text, " ");
}

bool StartLogging(Logging::Severity threshold, Logging::ILogHandler* handler) {
    if (g_logger.load(std::memory_order_acquire)) {
        std::fputs("There's already an active logging scope!\n", stderr);
        return false;
    }
    auto* logger = New<Logger, MemoryTag::Logging>();
    logger->owns_handler = !handler;
    logger->handler = handler ? handler : New<DefaultLogHandler, MemoryTag::Logging>();
    g_logger.store(logger, std::memory_order_release);
    detail::g_log_threshold.store(threshold, std::memory_order_relaxed);
    qsl::g_on_empty_function_call = &ReportEmptyFunctionCall;
    return true;
}

void EndLogging() {
    qsl::g_on_empty_function_call = nullptr;
    detail::g_log_threshold.store(kLogNothing, std::memory_order_relaxed);
    Logger* logger = g_logger.exchange(nullptr, std::memory_order_acq_rel);
    if (!logger) return;
    if (logger->owns_handler) Delete<MemoryTag::Logging>(logger->handler);
    Delete<MemoryTag::Logging>(logger);
}

Logging::ILogHandler* GetLogHandler() {
    const Logger* logger = g_logger.load(std::memory_order_acquire);
    return logger ? logger->handler : nullptr;
}

Logging::Severity GetLoggingSeverity() {
    return detail::g_log_threshold.load(std::memory_order_relaxed);
}

}  // namespace qorvex
