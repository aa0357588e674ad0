#include "resources/font_loader.h"

#include <qorvex/file_system.h>

namespace qorvex {

TaskPtr FontLoader::RequestFont(const URL& url, Callback done) {
    return context_.MakeStreamRequest(DescribeGet(url),
                                      [done = std::move(done)](ISyncStreamReader* reader) { done(reader); });
}

}  // namespace qorvex
