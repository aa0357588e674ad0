// A request for data that is read piece by piece: font files and media.
#pragma once

#include <atomic>

#include "resources/resource_request.h"

namespace qorvex {

class ResourceContext;

class ResourceStreamRequestJob final
    : public AsyncResourceRequest,
      public AtomicRefCounted<ResourceStreamRequestJob, MemoryTag::Resources> {
  public:
    using Status = IAsyncResourceStreamResponse::Status;
    // Gets the reader, which the callee closes when it is done; null after a failure. Any thread.
    using Callback = Function<void(ISyncStreamReader* reader)>;

    ResourceStreamRequestJob(ResourceContext& context, const ResourceRequestDescription& description,
                             Callback on_finished);
    ~ResourceStreamRequestJob() override;

    void Dispatch();

    // --- The client's answer, as IAsyncResourceStreamResponse tells it. One thread at a time.
    void SetStreamReader(ISyncStreamReader* reader);
    void Finish(Status status);

  private:
    void Discount();

    std::atomic<bool> counted_{true};
    RefPtr<ResourceContext> context_;
    Callback on_finished_;
    ISyncStreamReader* reader_ = nullptr;
};

}  // namespace qorvex
