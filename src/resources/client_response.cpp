#include "resources/client_response.h"

#include <qorvex/file_system.h>

#include "core/limits.h"
#include "core/logging/log.h"
#include "core/memory/thread_scope.h"
#include "resources/resource_request_job.h"
#include "resources/resource_stream_request_job.h"

namespace qorvex {

ClientResponse::~ClientResponse() {
    if (ResourceRequestJob* job = job_.load(std::memory_order_relaxed)) job->Release();
    if (ResourceStreamRequestJob* stream = stream_.load(std::memory_order_relaxed)) stream->Release();
}

ResourceRequestJob* ClientResponse::Job(const char* operation) {
    ResourceRequestJob* job = job_.load(std::memory_order_acquire);
    if (!job) LogWarning("ResourceRequestJob | ", operation, " after Finish does nothing");
    return job;
}

void* ClientResponse::GetSpace(size_t size) {
    ThreadScope scope;
    ResourceRequestJob* job = Job("GetSpace");
    return job ? job->GetSpace(size) : nullptr;
}

void ClientResponse::RecieveUserImage(const UserImageData& image) {
    ThreadScope scope;
    if (ResourceRequestJob* job = Job("RecieveUserImage")) job->RecieveUserImage(image);
}

void ClientResponse::SignalDataReceived() {
    ThreadScope scope;
    if (ResourceRequestJob* job = Job("SignalDataReceived")) job->SignalDataReceived();
}

void ClientResponse::SetStatus(uint16_t status) {
    if (ResourceRequestJob* job = Job("SetStatus")) job->SetStatus(status);
}

void ClientResponse::SetResponseURL(const char* url) {
    ThreadScope scope;
    if (ResourceRequestJob* job = Job("SetResponseURL")) job->SetResponseURL(url);
}

void ClientResponse::SetHeader(const char* name, const char* value) {
    if (ResourceRequestJob* job = Job("SetHeader")) job->SetHeader(name, value);
}

void ClientResponse::SetStreamReader(ISyncStreamReader* reader) {
    ResourceStreamRequestJob* stream = stream_.load(std::memory_order_acquire);
    if (stream) return stream->SetStreamReader(reader);
    LogWarning("ResourceRequestJob | SetStreamReader after Finish does nothing");
    if (reader) reader->Close();
}

void ClientResponse::Finish(Status status) {
    ThreadScope scope;
    if (ResourceRequestJob* job = job_.exchange(nullptr, std::memory_order_acq_rel)) {
        job->Finish(status);
        job->Release();
    } else if (ResourceStreamRequestJob* stream = stream_.exchange(nullptr, std::memory_order_acq_rel)) {
        stream->Finish(status);
        stream->Release();
    } else {
        LogWarning("ResourceRequestJob | Finished more than once");
        return;
    }
    pool_->Give(*this);
}

ClientResponsePool::~ClientResponsePool() = default;

ClientResponse& ClientResponsePool::Open(ResourceRequestJob& job) {
    ClientResponse& response = Take();
    job.AddRef();
    response.job_.store(&job, std::memory_order_release);
    return response;
}

ClientResponse& ClientResponsePool::Open(ResourceStreamRequestJob& job) {
    ClientResponse& response = Take();
    job.AddRef();
    response.stream_.store(&job, std::memory_order_release);
    return response;
}

ClientResponse& ClientResponsePool::Take() {
    qsl::MutexLock lock(mutex_);
    if (free_ <= limits::kFinishedResponses) {
        all_.push_back(MakeUnique<ClientResponse, MemoryTag::Resources>());
        ClientResponse& made = *all_[all_.size() - 1];
        made.pool_ = this;
        return made;
    }
    ClientResponse& oldest = *first_free_;
    first_free_ = std::exchange(oldest.next_free_, nullptr);
    --free_;
    return oldest;
}

void ClientResponsePool::Give(ClientResponse& response) {
    qsl::MutexLock lock(mutex_);
    (first_free_ ? last_free_->next_free_ : first_free_) = &response;
    last_free_ = &response;
    ++free_;
}

}  // namespace qorvex
