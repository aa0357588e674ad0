// Where lines go when the client gives no handler: a file in the working directory and the standard streams.
#pragma once

#include <cstdio>
#include <mutex>

#include <qorvex/logging.h>

#include "core/limits.h"
#include "core/logging/fixed_stream.h"

namespace qorvex {

class DefaultLogHandler final : public Logging::ILogHandler {
  public:
    DefaultLogHandler();
    ~DefaultLogHandler() override;

    void WriteLog(Logging::Severity severity, const char* text, unsigned length) override;

  private:
    std::mutex mutex_;
    FixedStream<limits::kDefaultLogBytes> stream_;
    std::FILE* file_;
    bool standard_streams_ = true;
};

}  // namespace qorvex
