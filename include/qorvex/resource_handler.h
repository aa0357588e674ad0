// How bytes reach the engine: it hands a request and a response object to the client's handler and goes on.
#pragma once

#include <qorvex/user_image.h>

#include <cstddef>
#include <cstdint>

namespace qorvex {

class ISyncStreamReader;

// What the engine wants. Implemented by the engine; valid until the response's Finish has returned, readable
// from any thread. Texts are UTF-8 and live as long as the request.
class IAsyncResourceRequest {
  protected:
    virtual ~IAsyncResourceRequest() = default;

  public:
    struct AlternativeURLs {
        const char** URLs = nullptr;
        unsigned Count = 0;
    };

    // Unique within a system; 0xFFFFFFFF for a stream request.
    virtual unsigned GetId() const = 0;
    // As the page wrote it, after the resource mapping; "" when invalid.
    virtual const char* GetURL() const = 0;
    virtual const char* GetAbsoluteURL() const = 0;
    virtual const char* GetMethod() const = 0;                       // "GET", "POST", ...
    virtual const char* GetUser() const = 0;                         // null when absent
    virtual const char* GetPassword() const = 0;                     // null when absent
    virtual const char* GetHeaderValueAt(unsigned index) const = 0;  // null when out of range
    // The first header of this name, compared with case; null when there is none.
    virtual const char* GetHeaderValue(const char* name) const = 0;
    virtual unsigned GetHeadersCount() const = 0;
    virtual const char* GetHeaderNameAt(unsigned index) const = 0;  // null when out of range
    virtual const char* GetBody() const = 0;                        // null when absent
    virtual std::size_t GetBodySize() const = 0;
    // The URL with the other substitutes of the resource mapping that applied; empty without one.
    virtual AlternativeURLs GetAlternativeURLs() const = 0;
};

// Where the answer goes. Implemented by the engine. The client may keep it and answer from any thread, one
// thread at a time, and should call Finish exactly once, inside OnResourceRequest or later, even when the
// view or the system has gone. By mistake: a second Finish, or a write after it, gets a Warning line and does
// nothing, as long as some hundred later requests have not been finished too; a request that is never
// finished keeps its page waiting and goes with Library::Uninitialize. After Uninitialize nothing may be
// touched.
class IAsyncResourceResponse {
  protected:
    virtual ~IAsyncResourceResponse() = default;

  public:
    enum class Status : std::uint32_t { Success = 0, Failure = 1 };

    // A buffer of size bytes for the data. A further call resizes it and keeps what was written; only the
    // last buffer is valid. Null, with a Warning line, for more than 1 GiB: what was written so far stays.
    virtual void* GetSpace(std::size_t size) = 0;
    // An image made by the client, in place of bytes. The record is copied.
    virtual void RecieveUserImage(const UserImageData& image) = 0;
    // Tells the page's progress listeners that more data stands in the buffer.
    virtual void SignalDataReceived() = 0;
    // HTTP-like status code.
    virtual void SetStatus(std::uint16_t status) = 0;
    // Where the data finally came from, after redirects.
    virtual void SetResponseURL(const char* url) = 0;
    // Adds a header, or replaces the value of the one with this name.
    virtual void SetHeader(const char* name, const char* value) = 0;
    virtual void Finish(Status status) = 0;
};

// The answer to a request for data that is read piece by piece. The same rules as above. The reader passes to
// the engine, which closes it when it is done.
class IAsyncResourceStreamResponse {
  protected:
    virtual ~IAsyncResourceStreamResponse() = default;

  public:
    using Status = IAsyncResourceResponse::Status;

    virtual void SetStreamReader(ISyncStreamReader* reader) = 0;
    virtual void Finish(Status status) = 0;
};

// Implemented by the client. Called on the main thread, or on a thread inside Library::ExecuteWork when the
// system was made with ResourceRequestsOnWorkers. A default operation fails the request, so that no page
// waits for a handler that does not know it.
class IAsyncResourceHandler {
  public:
    virtual ~IAsyncResourceHandler() = default;
    virtual void OnResourceRequest(const IAsyncResourceRequest* request, IAsyncResourceResponse* response) {
        (void)request;
        response->Finish(IAsyncResourceResponse::Status::Failure);
    }
    virtual void OnResourceStreamRequest(const IAsyncResourceRequest* request,
                                         IAsyncResourceStreamResponse* response) {
        (void)request;
        response->Finish(IAsyncResourceStreamResponse::Status::Failure);
    }
    // Nobody wants the answer any more. The response must still be finished. The id may belong to a request
    // that has been finished already.
    virtual void OnAbortResourceRequest(unsigned id) { (void)id; }
};

}  // namespace qorvex
