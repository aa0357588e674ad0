#include "resources/resource_stream_request_job.h"

#include <qorvex/file_system.h>

#include "core/logging/log.h"
#include "resources/resource_context.h"

namespace qorvex {

namespace {
constexpr uint32_t kStreamRequestId = 0xFFFFFFFFu;
}

ResourceStreamRequestJob::ResourceStreamRequestJob(ResourceContext& context,
                                                   const ResourceRequestDescription& description,
                                                   Callback on_finished)
    : AsyncResourceRequest(description, kStreamRequestId),
      context_(&context),
      on_finished_(std::move(on_finished)) {
    context_->CountOpenRequest();
}

ResourceStreamRequestJob::~ResourceStreamRequestJob() {
    SetStreamReader(nullptr);
    Discount();
}

// A reader that is given belongs to the engine, whatever becomes of it.
void ResourceStreamRequestJob::SetStreamReader(ISyncStreamReader* reader) {
    if (reader_ && reader_ != reader) reader_->Close();
    reader_ = reader;
}

void ResourceStreamRequestJob::Discount() {
    if (counted_.exchange(false)) context_->DiscountOpenRequest();
}

void ResourceStreamRequestJob::Dispatch() {
    LogDebug("Trying to load resource stream ", GetAbsoluteURL());
    if (IAsyncResourceHandler* handler = context_->GetHandler())
        handler->OnResourceStreamRequest(this, &context_->GetResponses().Open(*this));
    else
        Finish(Status::Failure);
}

void ResourceStreamRequestJob::Finish(Status status) {
    ISyncStreamReader* reader = std::exchange(reader_, nullptr);
    if (reader && status != Status::Success) {
        reader->Close();
        reader = nullptr;
    }
    const bool taken = static_cast<bool>(on_finished_);
    on_finished_(reader);
    if (reader && !taken) reader->Close();
    if (status == Status::Success)
        LogDebug("ResourceRequestJob | Loaded resource stream: ", GetAbsoluteURL());
    else
        LogWarning("ResourceRequestJob | Failed loading resource stream: ", GetAbsoluteURL());
    on_finished_ = nullptr;
    Discount();
}

}  // namespace qorvex
