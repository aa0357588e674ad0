// What a view tells the client.
#pragma once

#include <qorvex/cursor_types.h>
#include <qorvex/input_events.h>
#include <qorvex/text_input.h>

namespace qorvex {

class IClientSideSocket;
class INodeProxy;
class ISocketListener;

struct ScreenInfo {
    int Width = 1920;
    int Height = 1080;
    int AvailWidth = 1920;
    int AvailHeight = 1080;
    int ColorDepth = 24;
    int PixelDepth = 24;
};

enum class InterceptRequestStatus : unsigned {
    Allow = 0,  // any other value refuses the request
    Refuse = 1,
};

// Implemented by the client; override what is of interest. Every operation runs on the main thread, inside a
// call of the client's into the engine. A listener may call the view, but may not destroy it.
class IViewListener {
  public:
    virtual ~IViewListener() = default;

    // First thing in View::LoadURL. False stops the load, silently.
    virtual bool OnNavigateTo(const char* url) {
        (void)url;
        return true;
    }
    // With ViewSettings::InterceptAllRequests, before the page itself and before each of its scripts and
    // stylesheets. Images, fonts and what script requests reach the resource handler alone.
    virtual InterceptRequestStatus OnResourceRequestIntercepted(const char* url) {
        (void)url;
        return InterceptRequestStatus::Allow;
    }
    // The new document's script context and binder exist; no script has run yet.
    virtual void OnScriptContextCreated() {}
    // The document's tree is complete; images and deferred scripts may still be on their way.
    virtual void OnDOMBuilt() {}
    virtual void OnLoadFailed(const char* url, const char* error) { (void)url, (void)error; }
    // After the "load" event, once for each document.
    virtual void OnFinishLoad(const char* url) { (void)url; }
    // The binder may be used from here on; see View::IsReadyForBindings.
    virtual void OnReadyForBindings() {}
    virtual void OnBindingsReleased() {}
    virtual ScreenInfo OnScreenInfoRequested() { return ScreenInfo(); }

    // An input event passes a node, before the page's own listeners. node and data are valid during the call;
    // userData is what the input call was given.
    virtual EventAction::Actions OnNodeTouched(const INodeProxy* node, const TouchEventData* data,
                                               void* userData, InputEventPhase::PhaseType phase) {
        (void)node, (void)data, (void)userData, (void)phase;
        return EventAction::ContinueHandling;
    }
    virtual EventAction::Actions OnNodeMouseEvent(const INodeProxy* node, const MouseEventData* data,
                                                  void* userData, InputEventPhase::PhaseType phase) {
        (void)node, (void)data, (void)userData, (void)phase;
        return EventAction::ContinueHandling;
    }
    virtual EventAction::Actions OnNodeKeyEvent(const INodeProxy* node, const KeyEventData* data,
                                                void* userData, InputEventPhase::PhaseType phase) {
        (void)node, (void)data, (void)userData, (void)phase;
        return EventAction::ContinueHandling;
    }

    // Audio of the page's media elements. Samples are 32-bit floats, one array for each channel.
    virtual void OnAudioStreamCreated(int id, int bitDepth, int channels, float sampleRate) {
        (void)id, (void)bitDepth, (void)channels, (void)sampleRate;
    }
    virtual void OnAudioDataReceived(int id, int samples, float** data, int channels) {
        (void)id, (void)samples, (void)data, (void)channels;
    }
    virtual void OnAudioStreamPlay(int id) { (void)id; }
    virtual void OnAudioStreamPause(int id) { (void)id; }
    virtual void OnAudioStreamEnded(int id) { (void)id; }
    virtual void OnAudioStreamClosed(int id) { (void)id; }
    virtual void OnAudioStreamVolumeChanged(int id, float volume) { (void)id, (void)volume; }

    // The focus moved to or from a text control.
    virtual void OnTextInputTypeChanged(TextInputControlType::ControlType type) { (void)type; }
    // View pixels.
    virtual void OnCaretRectChanged(int x, int y, unsigned width, unsigned height) {
        (void)x, (void)y, (void)width, (void)height;
    }
    virtual void OnIMEShouldCancelComposition() {}
    // The cursor under the pointer differs from the last one reported. url is set for CursorTypes::URL only,
    // the hotspot pointers only when the page gave one.
    virtual void OnCursorChanged(CursorTypes::Cursors cursor, const char* url, const float* hotspotX,
                                 const float* hotspotY) {
        (void)cursor, (void)url, (void)hotspotX, (void)hotspotY;
    }
    // Copy and cut. length without a terminator.
    virtual void OnClipboardTextSet(const char* text, unsigned length) { (void)text, (void)length; }
    // Paste: call data->Set, or leave it alone for nothing to paste.
    virtual void OnClipboardTextGet(IClipboardData* data) { (void)data; }
    // The page made a WebSocket. Null: no connection is made. The listener may be called from any thread.
    virtual IClientSideSocket* OnCreateWebSocket(ISocketListener* listener, const char* url,
                                                 const char** protocols, unsigned count) {
        (void)listener, (void)url, (void)protocols, (void)count;
        return nullptr;
    }
};

}  // namespace qorvex
