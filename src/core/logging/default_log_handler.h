// Where lines go when the client gives no handler: a file in the working directory and the standard streams.
#pragma once

#include <cstdio>

#include <qorvex/logging.h>

#include "core/limits.h"
#include "core/logging/fixed_stream.h"
#include "qsl/mutex.h"

namespace qorvex {

class DefaultLogHandler final : public Logging::ILogHandler {
  public:
    DefaultLogHandler();
    ~DefaultLogHandler() override;

    void WriteLog(Logging::Severity severity, const char* text, unsigned length) override;

  private:
    qsl::Mutex mutex_;
    FixedStream<limits::kDefaultLogBytes> stream_ QSL_GUARDED_BY(mutex_);
    std::FILE* const file_;
    bool standard_streams_ = true;
};

}  // namespace qorvex
