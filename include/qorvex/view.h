// One page: a document with its script context, layout tree, timers and frames.
//
// All operations run on the main thread unless they say otherwise. Texts are UTF-8 and copied. Times are
// milliseconds, positions and sizes are pixels of the view. An operation that fails logs a line and returns
// null, false or zero; it never throws.
#pragma once

#include <qorvex/frame_capture.h>
#include <qorvex/input_events.h>

#include <cstddef>
#include <cstdint>

namespace fresco {
class ICustomCompositor;
class ICustomEffectRenderer;
}  // namespace fresco

namespace qorvex {

class Binder;
class DebugDump;
class IEventHandler;
class ImagesList;

// Bits, so that ClearCaches can take several.
enum class CacheType : std::uint32_t {
    Shadows = 1,
    Paths = 2,
    RenderingLibrary = 4,
    ScratchLayers = 8,
    ScratchTextures = 16,
};

class View {
  protected:
    virtual ~View() = default;

  public:
    // Ends the view: waits for its frame on the layout side, unloads the document, drops frames not painted.
    // Best after its ViewRenderer. Refused, with an Error line, inside an operation of this view.
    virtual void Destroy() = 0;

    // Asks for a page by absolute URL and returns; the old document stays until the new one has arrived.
    // IViewListener tells what came of it.
    virtual void LoadURL(const char* url) = 0;
    virtual void Reload() = 0;
    virtual void UnloadDocument() = 0;
    virtual void ClearHistory() = 0;

    // One frame: results of the last one, timers, scripts, animations, styles; then the layout side gets its
    // work. Calls OnFrameComplete once. Waits for the layout side only while the previous frame is still
    // there, and does itself what of it no thread has begun. Refused inside a listener of this view and after
    // Library::StopWorkers. A time that goes back, or is not finite, is reported and ignored.
    virtual void Advance(double time) = 0;

    virtual unsigned GetId() const = 0;
    // The family to give to Library::ExecuteWork(WorkType::Layout, ...).
    virtual unsigned GetTaskFamilyId() const = 0;
    virtual void Resize(unsigned width, unsigned height) = 0;
    // Draws the view scaled to this many pixels; layout keeps the view's own size.
    virtual void SetVirtualResolution(unsigned width, unsigned height) = 0;
    virtual unsigned GetWidth() const = 0;
    virtual unsigned GetHeight() const = 0;
    // Forgets Listener and TextInputHandler, for example before they are destroyed.
    virtual void ClearListeners() = 0;
    virtual void EnableRendering(bool enabled) = 0;
    // Every Advance redraws the whole view.
    virtual void ContinuousRepaint(bool enabled) = 0;
    // Outlines what each frame redraws.
    virtual void ShowPaintRectangles(bool enabled) = 0;
    // True: a frame that has anything to draw draws the whole view, not only what changed.
    virtual void SetPaintOption(bool enabled) = 0;
    virtual void EnableGPUMetadataEmission(bool enabled) = 0;

    // Texts for developers; null without a document. Released with DebugDump::Destroy.
    virtual DebugDump* DumpDOM(unsigned flags) = 0;
    virtual DebugDump* DumpStackingContexts() = 0;

    // Input. handled is deprecated and not written to; userData comes back in the listener's node callbacks.
    // Without a document that has been laid out once, input does nothing.
    virtual void TouchEvent(const TouchEventData* touches, unsigned count, bool* handled, void* userData) = 0;
    virtual void GestureEvent(const GestureEventData& data, bool* handled) = 0;
    virtual void MouseEvent(const MouseEventData& data, bool* handled, void* userData) = 0;
    virtual void KeyEvent(const KeyEventData& data, bool* handled, void* userData) = 0;

    // Input method composition in the focused text control. False: no text control has the focus.
    virtual bool IMESetComposition(const char* text) = 0;
    virtual bool IMEConfirmComposition(const char* text) = 0;
    virtual bool IMECancelComposition() = 0;

    virtual float GetGestureScrollThreshold() const = 0;
    virtual void SetGestureScrollThreshold(float pixels) = 0;
    virtual void SetUserAgent(const char* userAgent) = 0;

    // Bit 0: also images of elements with display "none". Bit 1: also images that only stylesheets name.
    virtual ImagesList* GetImagesList(unsigned flags) = 0;

    // Frames as files of the rendering library. The frame must also be painted by the ViewRenderer.
    virtual void BeginCaptureFrames(FrameCaptureCallback callback, void* userData) = 0;
    virtual void EndCaptureFrames() = 0;
    virtual void CaptureNextFrame(FrameCaptureCallback callback, void* userData) = 0;

    // Caches of the drawing side. Sizes and clears take effect with the next frame. A count of 0 is refused
    // for all but the rendering library's cache; bytes exist for ScratchLayers and ScratchTextures (at least
    // 4 MiB) and RenderingLibrary.
    virtual void GetCacheCountStats(CacheType type, unsigned* current, unsigned* capacity) = 0;
    virtual void GetCacheBytesStats(CacheType type, std::size_t* current, std::size_t* capacity) = 0;
    virtual void SetCacheCountSize(CacheType type, unsigned count) = 0;
    virtual void SetCacheBytesSize(CacheType type, unsigned bytes) = 0;
    virtual void ClearCaches(std::uint32_t mask) = 0;

    // Native callables for script. Usable between IViewListener::OnReadyForBindings and OnBindingsReleased.
    // The view owns the handlers from here on, and deletes one that it refuses (then the result is null).
    virtual IEventHandler* RegisterForEvent(const char* name, IEventHandler* handler) = 0;
    virtual void UnregisterFromEvent(IEventHandler* handler) = 0;
    virtual IEventHandler* BindCall(const char* name, IEventHandler* handler) = 0;
    virtual void UnbindCall(const char* name) = 0;
    // Removes every handler whose target is owner.
    virtual void UnregisterAll(void* owner) = 0;
    virtual bool IsReadyForBindings() const = 0;

    // Evaluates script in the page; no effect without a document. Errors go to the log.
    virtual void ExecuteScript(const char* source) = 0;
    // Evaluated in each later document before its own scripts, in the order of these calls.
    virtual void AddInitialScript(const char* source) = 0;
    virtual void ClearInitialScripts() = 0;

    // Hooks of the rendering library, called by it on the render thread. They stay the client's.
    virtual void SetCustomCompositor(fresco::ICustomCompositor* compositor) = 0;
    virtual void SetCustomEffectRenderer(fresco::ICustomEffectRenderer* renderer) = 0;

    // Null until the page is ready for bindings.
    virtual Binder* GetBinder() = 0;

    // Data binding of the game's objects. Model addresses are even.
    virtual void SynchronizeModels() = 0;
    virtual void RegisterTypeBinding(const char* typeName, void (*binding)(Binder*, void*)) = 0;
    virtual void UpdateWholeModel(void* model, const char* typeName) = 0;
    virtual void UnregisterModel(void* model, const char* typeName) = 0;
    virtual void CreateModel(const char* name, void* model, const char* typeName,
                             void (*writer)(Binder*, void*)) = 0;
    virtual void RaiseBoundEvent(const char* name) = 0;
};

}  // namespace qorvex
