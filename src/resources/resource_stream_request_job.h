// A request for data that is read piece by piece: font files and media.
#pragma once

#include <atomic>

#include "resources/resource_request.h"

namespace qorvex {

class ResourceContext;

class ResourceStreamRequestJob final
    : public AsyncResourceRequest,
      public IAsyncResourceStreamResponse,
      public AtomicRefCounted<ResourceStreamRequestJob, MemoryTag::Resources> {
  public:
    // Gets the reader, which the callee closes when it is done; null after a failure. Any thread.
    using Callback = Function<void(ISyncStreamReader* reader)>;

    ResourceStreamRequestJob(ResourceContext& context, const ResourceRequestDescription& description,
                             Callback on_finished);
    ~ResourceStreamRequestJob() override;

    void Dispatch();

    void SetStreamReader(ISyncStreamReader* reader) override { reader_ = reader; }
    void Finish(Status status) override;

  private:
    void Discount();

    std::atomic<bool> finished_{false};
    std::atomic<bool> counted_{true};
    RefPtr<ResourceContext> context_;
    Callback on_finished_;
    ISyncStreamReader* reader_ = nullptr;
};

}  // namespace qorvex
