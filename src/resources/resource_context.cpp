#include "resources/resource_context.h"

#include "core/logging/log.h"

namespace qorvex {

void ResourceContext::CompleteURL(ResourceRequestDescription& description) const {
    if (!description.url.IsRelative() || description.url.IsEmpty()) {
        description.absolute_url = description.url;
    } else if (base_url_.IsEmpty()) {
        AssertFailure("Unable to generate absolute URL for resource load!");
        description.absolute_url = description.url;
    } else {
        description.absolute_url = description.url.Merge(base_url_);
    }
}

TaskPtr ResourceContext::MakeResourceRequest(ResourceRequestDescription description,
                                             ResourceJobCallback on_finished, ResourceJobCallback on_progress,
                                             bool binary, uint32_t* id) {
    CompleteURL(description);
    const uint32_t request_id = next_id_.fetch_add(1);
    if (id) *id = request_id;
    ResourceJobPtr job = MakeRef<ResourceRequestJob>(*this, description, request_id, binary);
    job->SetCallbacks(std::move(on_finished), std::move(on_progress));
    if (requests_on_workers_)
        return MakeTask("LoadResource", [job = std::move(job)](TaskFamilyHandle) { job->Dispatch(); });
    job->Dispatch();
    return MakeTask("Empty", [](TaskFamilyHandle) {});
}

TaskPtr ResourceContext::MakeStreamRequest(ResourceRequestDescription description,
                                           ResourceStreamRequestJob::Callback on_finished) {
    CompleteURL(description);
    description.method = RequestMethod::Get;
    auto job = MakeRef<ResourceStreamRequestJob>(*this, description, std::move(on_finished));
    if (requests_on_workers_)
        return MakeTask("LoadResourceStream", [job = std::move(job)](TaskFamilyHandle) { job->Dispatch(); });
    job->Dispatch();
    return MakeTask("Empty", [](TaskFamilyHandle) {});
}

void ResourceContext::Abort(uint32_t id) {
    if (!requests_on_workers_ && handler_) handler_->OnAbortResourceRequest(id);
}

ResourceRequestDescription DescribeGet(const URL& url) {
    ResourceRequestDescription description;
    description.url = url;
    description.method = RequestMethod::Get;
    return description;
}

}  // namespace qorvex
