// What the client holds of a request: the response object that it answers through, and where those objects
// come from.
//
// The client gets a plain pointer and may make mistakes with it: finish twice, write after Finish, or never
// finish at all. So the pointer never leads to the job itself but to a slot that stays a slot until the
// library ends: after Finish it leads nowhere and says so. A slot that was finished waits behind
// limits::kFinishedResponses others before it serves another request; by then nobody means the old one.
//
// Invariants: a slot holds one reference to its job from Open until Finish, which acts once, whatever thread
// wins; what the client never finished is released with the pool.
#pragma once

#include <qorvex/resource_handler.h>

#include <atomic>

#include "core/memory/containers.h"
#include "qsl/mutex.h"
#include "qsl/ref_ptr.h"

namespace qorvex {

class ClientResponsePool;
class ResourceRequestJob;
class ResourceStreamRequestJob;

class ClientResponse final : public IAsyncResourceResponse, public IAsyncResourceStreamResponse {
  public:
    using Status = IAsyncResourceResponse::Status;

    ClientResponse() = default;
    ~ClientResponse() override;

    void* GetSpace(size_t size) override;
    void RecieveUserImage(const UserImageData& image) override;
    void SignalDataReceived() override;
    void SetStatus(uint16_t status) override;
    void SetResponseURL(const char* url) override;
    void SetHeader(const char* name, const char* value) override;
    void SetStreamReader(ISyncStreamReader* reader) override;
    void Finish(Status status) override;

  private:
    friend class ClientResponsePool;

    // The job, or null with a line in the log.
    ResourceRequestJob* Job(const char* operation);

    ClientResponsePool* pool_ = nullptr;
    ClientResponse* next_free_ = nullptr;
    std::atomic<ResourceRequestJob*> job_{nullptr};
    std::atomic<ResourceStreamRequestJob*> stream_{nullptr};
};

// One for each library, since a client may answer long after the system has gone. Any thread.
class ClientResponsePool {
  public:
    ClientResponsePool() = default;
    // The client must not answer any more.
    ~ClientResponsePool();
    ClientResponsePool(const ClientResponsePool&) = delete;
    ClientResponsePool& operator=(const ClientResponsePool&) = delete;

    ClientResponse& Open(ResourceRequestJob& job);
    ClientResponse& Open(ResourceStreamRequestJob& job);

  private:
    friend class ClientResponse;

    ClientResponse& Take() QSL_EXCLUDES(mutex_);
    void Give(ClientResponse& response) QSL_EXCLUDES(mutex_);

    qsl::Mutex mutex_;
    Vector<UniquePtr<ClientResponse, MemoryTag::Resources>, MemoryTag::Resources> all_ QSL_GUARDED_BY(mutex_);
    // First in, first out.
    ClientResponse* first_free_ QSL_GUARDED_BY(mutex_) = nullptr;
    ClientResponse* last_free_ QSL_GUARDED_BY(mutex_) = nullptr;
    uint32_t free_ QSL_GUARDED_BY(mutex_) = 0;
};

}  // namespace qorvex
