#include "resources/resource_request_job.h"

#include "core/limits.h"
#include "core/logging/log.h"
#include "resources/resource_context.h"

namespace qorvex {

ResourceRequestJob::ResourceRequestJob(ResourceContext& context,
                                       const ResourceRequestDescription& description, uint32_t id,
                                       bool binary)
    : AsyncResourceRequest(description, id),
      context_(&context),
      response_url_(description.absolute_url),
      binary_(binary) {
    context_->CountOpenRequest();
}

ResourceRequestJob::~ResourceRequestJob() {
    Discount();
}

void ResourceRequestJob::Discount() {
    if (counted_.exchange(false)) context_->DiscountOpenRequest();
}

void ResourceRequestJob::SetCallbacks(ResourceJobCallback on_finished, ResourceJobCallback on_progress) {
    on_finished_ = std::move(on_finished);
    on_progress_ = std::move(on_progress);
}

void ResourceRequestJob::Dispatch() {
    LogDebug("Trying to load resource ", GetAbsoluteURL());
    ApplyMapping(context_->GetMappings());
    if (IAsyncResourceHandler* handler = context_->GetHandler())
        handler->OnResourceRequest(this, &context_->GetResponses().Open(*this));
    else
        Finish(IAsyncResourceResponse::Status::Failure);
}

void* ResourceRequestJob::GetSpace(size_t size) {
    if (payload_ == PayloadKind::UserImage) {
        AssertFailure(
            "RecieveUserImage already called. You can use either GetSpace or RecieveUserImage, but not "
            "both!");
        return nullptr;
    }
    if (size == 0 && binary_) {
        buffer_.reset();
        payload_ = PayloadKind::None;
        return nullptr;
    }
    if (size > limits::kMaxResourceBytes) {
        LogWarning("ResourceRequestJob | Refused ", size, " bytes for ", GetAbsoluteURL());
        return nullptr;
    }
    if (!buffer_) buffer_ = MakeRef<ResourceBuffer>(!binary_);
    payload_ = PayloadKind::Bytes;
    return buffer_->Resize(size);
}

void ResourceRequestJob::RecieveUserImage(const UserImageData& image) {
    if (payload_ == PayloadKind::Bytes) {
        AssertFailure(
            "GetSpace already called. You can use either GetSpace or RecieveUserImage, but not both!");
        return;
    }
    user_image_ = image;
    payload_ = PayloadKind::UserImage;
}

void ResourceRequestJob::SignalDataReceived() {
    if (on_progress_) on_progress_(*this);
}

void ResourceRequestJob::SetResponseURL(const char* url) {
    if (url) response_url_.Parse(url, 0);
}

void ResourceRequestJob::SetHeader(const char* name, const char* value) {
    if (!name || !value) return;
    for (Header& header : headers_) {
        if (header.name != std::string_view(name)) continue;
        header.value = std::string_view(value);
        return;
    }
    headers_.push_back(Header{Text(std::string_view(name)), Text(std::string_view(value))});
}

void ResourceRequestJob::Finish(IAsyncResourceResponse::Status status) {
    status_ = status;
    on_finished_(*this);
    if (status == IAsyncResourceResponse::Status::Success)
        LogDebug("ResourceRequestJob | Loaded resource: ", GetAbsoluteURL());
    else
        LogWarning("ResourceRequestJob | Failed loading resource: ", GetAbsoluteURL());
    on_finished_ = nullptr;
    on_progress_ = nullptr;
    Discount();
}

bool ResourceRequestJob::Succeeded() const {
    // A transport success with an error status is still no script, sheet or page.
    return status_ == IAsyncResourceResponse::Status::Success && (!status_code_ || *status_code_ < 400);
}

std::span<const uint8_t> ResourceRequestJob::GetData() const {
    return buffer_ ? buffer_->Bytes() : std::span<const uint8_t>();
}

}  // namespace qorvex
