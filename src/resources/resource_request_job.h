// One request on its way: what the client reads, and what its answer is written to.
//
// Invariants: the client holds one reference from the dispatch until Finish, through a ClientResponse, which
// sees to it that Finish comes once; the job counts as open work from its making until OnFinished has
// returned, so that whatever the answer leads to is queued before the job is discounted.
#pragma once

#include <atomic>
#include <optional>

#include "dom/resource_loader.h"
#include "resources/resource_buffer.h"
#include "resources/resource_request.h"

namespace qorvex {

class ResourceContext;
class ResourceRequestJob;

using ResourceJobPtr = RefPtr<ResourceRequestJob>;
using ResourceJobCallback = Function<void(ResourceRequestJob&)>;

class ResourceRequestJob final : public AsyncResourceRequest,
                                 public dom::ILoadedResource,
                                 public AtomicRefCounted<ResourceRequestJob, MemoryTag::Resources> {
  public:
    using Text = ResourceRequestDescription::Text;
    using Header = ResourceRequestDescription::Header;
    enum class PayloadKind : uint8_t { None = 0, Bytes = 1, UserImage = 2 };

    ResourceRequestJob(ResourceContext& context, const ResourceRequestDescription& description, uint32_t id,
                       bool binary);
    ~ResourceRequestJob() override;

    void SetCallbacks(ResourceJobCallback on_finished, ResourceJobCallback on_progress);
    // Hands the job to the client's handler; on the main thread, or on a resource thread.
    void Dispatch();

    // --- The client's answer, as IAsyncResourceResponse tells it. One thread at a time.
    void* GetSpace(size_t size);
    void RecieveUserImage(const UserImageData& image);
    void SignalDataReceived();
    void SetStatus(uint16_t status) { status_code_ = status; }
    void SetResponseURL(const char* url);
    void SetHeader(const char* name, const char* value);
    void Finish(IAsyncResourceResponse::Status status);

    // --- dom::ILoadedResource
    bool Succeeded() const override;
    std::span<const uint8_t> GetData() const override;
    const URL& GetResponseURL() const override { return response_url_; }

    IAsyncResourceResponse::Status GetStatus() const { return status_; }
    std::optional<uint16_t> GetStatusCode() const { return status_code_; }
    PayloadKind GetPayloadKind() const { return payload_; }
    const UserImageData& GetUserImage() const { return user_image_; }
    std::span<const Header> GetResponseHeaders() const { return {headers_.data(), headers_.size()}; }
    // The bytes without a copy; null when the response had none.
    const RefPtr<ResourceBuffer>& GetBuffer() const { return buffer_; }
    RefPtr<ResourceBuffer> TakeBuffer() { return std::move(buffer_); }

  private:
    void Discount();

    std::atomic<bool> counted_{true};
    RefPtr<ResourceContext> context_;
    std::optional<uint16_t> status_code_;
    URL response_url_;
    Vector<Header, MemoryTag::Resources> headers_;
    RefPtr<ResourceBuffer> buffer_;
    UserImageData user_image_;
    IAsyncResourceResponse::Status status_ = IAsyncResourceResponse::Status::Failure;
    ResourceJobCallback on_finished_;
    ResourceJobCallback on_progress_;
    bool binary_;
    PayloadKind payload_ = PayloadKind::None;
};

}  // namespace qorvex
