// The engine's log: one line per call, put together from pieces in a stream of fixed size, so that logging
// allocates nothing. Callable from any thread; a line below the threshold costs one load and a compare.
#pragma once

#include <atomic>
#include <concepts>
#include <cstdint>
#include <span>
#include <string_view>

#include <qorvex/logging.h>

namespace qorvex {

/// One part of a log line.
struct LogPiece {
    enum class Kind : uint8_t { Text, Signed, Unsigned, Real };

    LogPiece(std::string_view value) : kind(Kind::Text), text(value) {}
    LogPiece(const char* value) : LogPiece(value ? std::string_view(value) : std::string_view("(null)")) {}
    LogPiece(bool value) : LogPiece(value ? std::string_view("true") : std::string_view("false")) {}
    LogPiece(double value) : kind(Kind::Real), real(value) {}
    LogPiece(std::signed_integral auto value)
        : kind(Kind::Signed), number(static_cast<uint64_t>(int64_t{value})) {}
    LogPiece(std::unsigned_integral auto value) : kind(Kind::Unsigned), number(value) {}
    template <class Text>
    requires requires(const Text& value) {
        { value.view() } -> std::convertible_to<std::string_view>;
    }
    LogPiece(const Text& value) : LogPiece(std::string_view(value.view())) {}
    /// A character is text, not a number.
    LogPiece(const char& value) : LogPiece(std::string_view(&value, 1)) {}

    Kind kind;
    union {
        std::string_view text;
        uint64_t number;
        double real;
    };
};

namespace detail {
/// Of the logger; above every severity while there is none.
extern constinit std::atomic<Logging::Severity> g_log_threshold;
}  // namespace detail

inline bool IsLogged(Logging::Severity severity) {
    return severity >= detail::g_log_threshold.load(std::memory_order_relaxed);
}
void WriteLogLine(Logging::Severity severity, std::span<const LogPiece> pieces);

template <class... Pieces>
void Log(Logging::Severity severity, const Pieces&... pieces) {
    if (!IsLogged(severity)) [[likely]]
        return;
    const LogPiece line[] = {LogPiece(pieces)...};
    WriteLogLine(severity, line);
}

template <class... Pieces>
void LogTrace(const Pieces&... pieces) {
    Log(Logging::Trace, pieces...);
}
template <class... Pieces>
void LogDebug(const Pieces&... pieces) {
    Log(Logging::Debug, pieces...);
}
template <class... Pieces>
void LogInfo(const Pieces&... pieces) {
    Log(Logging::Info, pieces...);
}
template <class... Pieces>
void LogWarning(const Pieces&... pieces) {
    Log(Logging::Warning, pieces...);
}
template <class... Pieces>
void LogError(const Pieces&... pieces) {
    Log(Logging::Error, pieces...);
}

/// A fault of the engine itself: one line "Assert failure: " and the text. The caller then returns its
/// neutral value; nothing is stopped.
void AssertFailure(std::string_view text);

}  // namespace qorvex
