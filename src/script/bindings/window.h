// The native object behind a page's global object: its timers, its animation frames and the small helpers
// that every page sees. Lives exactly as long as its ScriptingContext, so that neither survives a navigation.
//
// The global object itself is its wrapper; see script/class_installation.h for what stands on it.
#pragma once

#include "core/memory/containers.h"
#include "core/tasks/timer.h"
#include "dom/event_target.h"
#include "script/bindings/console.h"
#include "script/bindings/performance.h"
#include "script/protected_value.h"

namespace qorvex::dom {

class IWindowHost;
class ScriptTimer;

class Window final : public EventTarget, private ITimerClock {
  public:
    static constexpr script::ScriptClass kScriptClass = script::ScriptClass::Window;

    Window(IWindowHost& host, script::ScriptingContext& context, Document& document);

    // --- Handle. No wrapper is ever made: the global object is set at construction.
    void GetOrCreateWrapper(JSContextRef context, JSValueRef* out) override;
    void ReleaseWrapper() override {}

    // --- EventTarget
    // Null once the page is gone.
    script::ScriptingContext* GetScriptingContext() override { return context_; }
    Document* GetEventTargetDocument() const override { return document_; }

    // --- Timers. Ids start at 1.
    uint32_t AddTimer(script::ProtectedValue function, double delay, bool repeating);
    // Unknown ids are ignored.
    void CancelTimer(uint32_t id);
    [[nodiscard]] size_t timer_count() const { return timers_.size(); }

    // --- Animation frames. Ids start at 1.
    uint32_t RequestAnimationFrame(script::ProtectedValue function);
    void CancelAnimationFrame(uint32_t id);
    [[nodiscard]] size_t frame_callback_count() const { return frame_callbacks_.size(); }

    // Once an Advance: due timers, then the frame callbacks that were requested before this call, so that
    // what a timer has prepared shows in this frame.
    void RunTimersAndFrameCallbacks(double time);

    // The page goes: drops listeners, callbacks and timers without running anything.
    void DetachFromContext();

    [[nodiscard]] IWindowHost& host() const { return host_; }
    [[nodiscard]] Console& console() const { return *console_; }
    [[nodiscard]] Performance& performance() const { return *performance_; }

  private:
    friend class ScriptTimer;

    struct FrameCallback {
        uint32_t id = 0;
        script::ProtectedValue function;
    };

    ~Window() override;
    double GetTimerTime() const override;
    void ForgetTimer(uint32_t id);
    void RunFrameCallbacks(double time);

    HashMap<uint32_t, RefPtr<ScriptTimer>, MemoryTag::DOM> timers_;
    uint32_t next_timer_id_ = 0;
    script::ScriptingContext* context_;
    Document* document_;
    IWindowHost& host_;
    RefPtr<Console> console_;
    RefPtr<Performance> performance_;
    // After the map: its end retires timers, which take themselves out of the map.
    TimerQueue timer_queue_;
    Vector<FrameCallback, MemoryTag::DOM> frame_callbacks_;
    uint32_t next_frame_callback_id_ = 0;
};

}  // namespace qorvex::dom
