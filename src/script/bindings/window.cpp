#include "script/bindings/window.h"

#include <JavaScriptCore/JavaScript.h>

#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/event_listeners.h"
#include "script/bindings/script_timer.h"
#include "script/bindings/window_host.h"
#include "script/evaluate.h"
#include "script/make_handle.h"

namespace qorvex::dom {

// https://html.spec.whatwg.org/#timer-initialisation-steps sets no lower bound for the first levels; a
// repeating timer needs one, or its next time would be the present one.
constexpr double kShortestInterval = 1;

Window::Window(IWindowHost& host, script::ScriptingContext& context, Document& document)
    : context_(&context),
      document_(&document),
      host_(host),
      console_(script::MakeHandle<Console>()),
      performance_(script::MakeHandle<Performance>(*this)) {
    wrapper_ = JSContextGetGlobalObject(context.context);
    timer_queue_.SetClock(this);
}

Window::~Window() = default;

void Window::GetOrCreateWrapper(JSContextRef, JSValueRef* out) {
    *out = wrapper_;
}

double Window::GetTimerTime() const {
    return host_.GetTime();
}

uint32_t Window::AddTimer(script::ProtectedValue function, double delay, bool repeating) {
    const uint32_t id = ++next_timer_id_;
    RefPtr<ScriptTimer> timer = MakeRef<ScriptTimer>(*this, std::move(function), id);
    const double interval = repeating ? std::max(delay, kShortestInterval) : 0;
    timer_queue_.Add(timer, host_.GetTime() + (repeating ? interval : delay), interval);
    timers_.insert_or_assign(id, std::move(timer));
    return id;
}

void Window::CancelTimer(uint32_t id) {
    const RefPtr<ScriptTimer>* entry = timers_.get(id);
    if (id == 0 || !entry) return;
    const RefPtr<ScriptTimer> timer = *entry;
    timer_queue_.Cancel(*timer);
}

void Window::ForgetTimer(uint32_t id) {
    timers_.erase(id);
}

uint32_t Window::RequestAnimationFrame(script::ProtectedValue function) {
    frame_callbacks_.push_back({++next_frame_callback_id_, std::move(function)});
    return next_frame_callback_id_;
}

void Window::CancelAnimationFrame(uint32_t id) {
    for (size_t i = 0; i < frame_callbacks_.size(); ++i) {
        if (frame_callbacks_[i].id != id) continue;
        frame_callbacks_.erase(frame_callbacks_.begin() + i);
        return;
    }
}

void Window::RunTimersAndFrameCallbacks(double time) {
    const RefPtr<Window> held(this);
    timer_queue_.Advance(time);
    RunFrameCallbacks(time);
}

void Window::RunFrameCallbacks(double time) {
    if (frame_callbacks_.empty()) return;
    // Detached first: a request made by a callback belongs to the next frame, and a cancel does not reach
    // this one.
    Vector<FrameCallback, MemoryTag::DOM> callbacks;
    callbacks.swap(frame_callbacks_);
    for (FrameCallback& callback : callbacks) {
        // A callback may have left the page.
        if (!context_) return;
        JSContextRef context = context_->context;
        const JSObjectRef function =
            callback.function ? JSValueToObject(context, callback.function.get(), nullptr) : nullptr;
        if (!function) continue;
        const JSValueRef argument = JSValueMakeNumber(context, time);
        script::CallFunction(context, function, nullptr, {&argument, 1});
    }
}

void Window::DetachFromContext() {
    frame_callbacks_.clear();
    timer_queue_.CancelAll();
    document_->GetEventListenerTable().Remove(*this);
    wrapper_ = nullptr;
    context_ = nullptr;
}

}  // namespace qorvex::dom
