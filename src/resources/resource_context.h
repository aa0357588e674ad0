// The way to the client's resource handler, one for each system.
//
// Jobs hold the context, because a client may finish a request long after the system has gone.
// Threads: requests are made on the main thread; open work is counted from any thread; the handler, the table
// and the switch are set once before the first request.
#pragma once

#include <atomic>

#include "core/tasks/task_system.h"
#include "resources/client_response.h"
#include "resources/resource_mapping.h"
#include "resources/resource_request_job.h"
#include "resources/resource_stream_request_job.h"

namespace qorvex {

class ResourceContext : public AtomicRefCounted<ResourceContext, MemoryTag::Resources> {
  public:
    // The pool outlives everything that is requested here.
    ResourceContext(IAsyncResourceHandler* handler, ClientResponsePool& responses, bool requests_on_workers)
        : handler_(handler), responses_(responses), requests_on_workers_(requests_on_workers) {}

    IAsyncResourceHandler* GetHandler() const { return handler_; }
    ClientResponsePool& GetResponses() const { return responses_; }
    bool AreRequestsOnWorkers() const { return requests_on_workers_; }
    ResourceMappingTable& GetMappings() { return mappings_; }
    // Main thread: requests are made absolute before they go to a resource thread.
    void SetBaseURL(URL url) { base_url_ = std::move(url); }

    // Makes the request and, with in-place handler calls, hands it to the handler at once. The task is for
    // the caller to push to the resource channel. The callbacks may run on any thread, inside this call too.
    TaskPtr MakeResourceRequest(ResourceRequestDescription description, ResourceJobCallback on_finished,
                                ResourceJobCallback on_progress, bool binary, uint32_t* id);
    TaskPtr MakeStreamRequest(ResourceRequestDescription description,
                              ResourceStreamRequestJob::Callback on_finished);
    // Tells the handler to give up, unless it is called on workers.
    void Abort(uint32_t id);

    // Requests whose answers have not come yet.
    uint32_t GetOpenRequests() const { return open_requests_.load(std::memory_order_acquire); }
    void CountOpenRequest() { open_requests_.fetch_add(1, std::memory_order_relaxed); }
    void DiscountOpenRequest() { open_requests_.fetch_sub(1, std::memory_order_release); }

  private:
    void CompleteURL(ResourceRequestDescription& description) const;

    IAsyncResourceHandler* handler_;
    ClientResponsePool& responses_;
    ResourceMappingTable mappings_;
    URL base_url_;
    std::atomic<uint32_t> next_id_{0};
    std::atomic<uint32_t> open_requests_{0};
    bool requests_on_workers_;
};

// A plain request for the bytes at `url`.
ResourceRequestDescription DescribeGet(const URL& url);

}  // namespace qorvex
