// How the font manager gets the bytes of a font file. Implemented over the system's resource context.
#pragma once

#include <fresco/stream_reader.h>

#include "core/memory/containers.h"
#include "core/tasks/task.h"
#include "core/url/url.h"

namespace qorvex::layout {

class IFontResourceLoader {
  public:
    // Gets a reader, to be closed by the callee, or null after a failure. Any thread, inside the call too.
    using Callback = Function<void(fresco::IStreamReader* reader)>;

    // Asks the client. The task is for the caller to push to the resource channel. DOM thread.
    [[nodiscard]] virtual TaskPtr RequestFont(const URL& url, Callback done) = 0;

  protected:
    ~IFontResourceLoader() = default;
};

}  // namespace qorvex::layout
