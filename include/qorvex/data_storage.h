// The backing store of localStorage. Without a handler the system keeps the data in memory for its own life.
#pragma once

#include <cstdint>

namespace qorvex {

// What Read is asked for. Implemented by the engine; valid during the call.
class IDataStorageRequest {
  protected:
    virtual ~IDataStorageRequest() = default;

  public:
    enum class RequestType : std::uint32_t { ReadByIndex = 0, ReadByKey = 1 };

    virtual RequestType GetType() const = 0;
    virtual const char* GetOrigin() const = 0;
    virtual const char* GetKey() const = 0;  // null for a read by index
    virtual std::uint32_t GetIndex() const = 0;
};

// Where Read puts its answer. Implemented by the engine; valid during the call.
class IDataStorageResponse {
  protected:
    virtual ~IDataStorageResponse() = default;

  public:
    enum class ResponseStatus : std::uint32_t { Success = 0, Failure = 1 };

    // Makes room for size bytes and returns them; contents are kept, growth is zeroed.
    virtual void* Resize(unsigned size) = 0;
    // Failure until this says otherwise.
    virtual void SetStatus(ResponseStatus status) = 0;
};

// Implemented by the client. Main thread; script waits for the answer, so it must come before the call
// returns.
class IDataStorageHandler {
  public:
    virtual ~IDataStorageHandler() = default;
    // The value for a key, or the key at an index.
    virtual void Read(const IDataStorageRequest* request, IDataStorageResponse* response) {
        (void)request, (void)response;
    }
    virtual void Write(const char* origin, const char* key, const char* value) {
        (void)origin, (void)key, (void)value;
    }
    virtual void Remove(const char* origin, const char* key) { (void)origin, (void)key; }
    virtual void Clear(const char* origin) { (void)origin; }
    virtual std::uint32_t GetLength(const char* origin) {
        (void)origin;
        return 0;
    }
};

}  // namespace qorvex
