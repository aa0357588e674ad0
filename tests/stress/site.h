#pragma once

#include <qorvex/resource_handler.h>

#include <string>

namespace stress {

// Pages, sheets, scripts and a font in memory, answered inside the request, as a client's best handler would.
class Site final : public qorvex::IAsyncResourceHandler {
  public:
    void OnResourceRequest(const qorvex::IAsyncResourceRequest* request,
                           qorvex::IAsyncResourceResponse* response) override;
    void OnResourceStreamRequest(const qorvex::IAsyncResourceRequest* request,
                                 qorvex::IAsyncResourceStreamResponse* response) override;
};

// What the operations choose from: URLs of pages (some missing or malformed), of sheets, and scripts to run
// in a page (some of which throw).
extern const char* const kPages[9];
extern const char* const kSheets[4];
extern const char* const kScripts[12];

}  // namespace stress
