// The client's side of a page's WebSocket objects.
#pragma once

namespace qorvex {

// Told by the client what happens on a socket. Implemented by the engine; may be called on any thread, from
// IViewListener::OnCreateWebSocket until the socket's Terminate.
class ISocketListener {
  public:
    virtual ~ISocketListener() = default;
    virtual void OnMessage(const char* data, unsigned size) { (void)data, (void)size; }
    virtual void OnClose(unsigned code, const char* reason, unsigned size) {
        (void)code, (void)reason, (void)size;
    }
    virtual void OnError(const char* message, unsigned size) { (void)message, (void)size; }
    virtual void OnOpen() {}
};

// One connection. Made by the client in IViewListener::OnCreateWebSocket and owned by it: after Terminate the
// engine uses neither the socket nor accepts calls to its listener. Main thread.
class IClientSideSocket {
  public:
    virtual ~IClientSideSocket() = default;
    virtual void Send(const char* data, unsigned size) { (void)data, (void)size; }
    virtual unsigned GetBufferedAmount() { return 0; }
    virtual const char* GetProtocol() { return nullptr; }
    virtual void Close(unsigned code, const char* reason, unsigned size) {
        (void)code, (void)reason, (void)size;
    }
    virtual void Terminate(unsigned code, const char* reason, unsigned size) {
        (void)code, (void)reason, (void)size;
    }
};

}  // namespace qorvex
