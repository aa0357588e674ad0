// What a view shows of itself to developers: dumps, captures, hooks of the rendering library.
#include "core/api_call.h"
#include "core/debug/debug_dump_impl.h"
#include "core/library_impl.h"
#include "core/unavailable.h"
#include "core/view_impl.h"
#include "display/dump.h"
#include "resources/cached_images_manager.h"

namespace qorvex {

DebugDump* ViewImpl::DumpDOM(unsigned) {
    const APICall call(family_, api_depth_);
    if (!call) return nullptr;
    if (!document_) return nullptr;
    return New<DebugDumpImpl, MemoryTag::DebugDump>(document_->DumpDOM());
}

DebugDump* ViewImpl::DumpStackingContexts() {
    const APICall call(family_, api_depth_);
    if (!call) return nullptr;
    // First: results that come in meanwhile may bring another document, or take the last one away.
    WaitUntilLayoutIdle();
    if (!document_) return nullptr;
    layout::LayoutHandle* root = document_->GetLayoutTree().Root();
    if (!root) return New<DebugDumpImpl, MemoryTag::DebugDump>(std::string_view());
    return New<DebugDumpImpl, MemoryTag::DebugDump>(dsp::DumpStackingContexts(*root));
}

ImagesList* ViewImpl::GetImagesList(unsigned flags) {
    const APICall call(family_, api_depth_);
    if (!call) return nullptr;
    return document_ ? services_.images->ListImages(*document_, flags) : nullptr;
}

void ViewImpl::BeginCaptureFrames(FrameCaptureCallback callback, void* user_data) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    capture_callback_ = callback;
    capture_user_data_ = user_data;
    capture_all_ = callback != nullptr;
}

void ViewImpl::EndCaptureFrames() {
    const APICall call(family_, api_depth_);
    if (!call) return;
    capture_callback_ = nullptr;
    capture_all_ = false;
}

void ViewImpl::CaptureNextFrame(FrameCaptureCallback callback, void* user_data) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    capture_callback_ = callback;
    capture_user_data_ = user_data;
    capture_all_ = false;
    // A frame that changes nothing has nothing to capture.
    MarkWholeViewDirty();
}

void ViewImpl::SetCustomCompositor(fresco::ICustomCompositor* compositor) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (!scene_) {
        AssertFailure("Cannot set custom compostior without an internal scene object!");
        return;
    }
    scene_->SetCustomCompositor(compositor);
}

void ViewImpl::SetCustomEffectRenderer(fresco::ICustomEffectRenderer* renderer) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (!scene_) {
        AssertFailure("Cannot set custom effect renderer without an internal scene object!");
        return;
    }
    scene_->SetCustomEffectRenderer(renderer);
}

// Console lines end with a blank, as all arguments are followed by one.
bool ViewImpl::OnConsoleLine(Logging::Severity severity, std::string_view line) {
    LibraryImpl* library = GetLibrary();
    if (!library) return false;
    const String text(line);
    ConsoleMessage message;
    message.ViewId = id_;
    message.Severity = severity;
    message.Text = text.c_str();
    message.Length = text.size();
    return library->GetDebugInterfaces().GetDebugInterface().ForwardConsoleLine(message);
}

// The history object comes with the window's globals.
void ViewImpl::ClearHistory() {
    const APICall call(family_, api_depth_);
    if (!call) return;
    LogUnavailable("View::ClearHistory");
}

}  // namespace qorvex
