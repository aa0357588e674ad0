// Events that need no payload. The richer classes derive from these.
#pragma once

#include "core/memory/string_pool.h"
#include "script/pooled_memory.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::dom {

class Document;
class EventTarget;

enum class EventPhase : uint32_t { None = 0, Capture = 1, AtTarget = 2, Bubble = 3 };

class Event : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(Event)
  public:
    QORVEX_POOLED(Event, 192)

    Event(Document* document, Atom type, bool bubbles, bool cancelable);

    Atom GetType() const { return type_; }
    bool GetBubbles() const { return bubbles_; }
    bool GetCancelable() const { return cancelable_; }
    bool GetDefaultPrevented() const { return default_prevented_; }
    EventPhase GetPhase() const { return phase_; }
    // The target stays known after dispatch as long as it lives; the current target is none then.
    EventTarget* GetTarget() const;
    EventTarget* GetCurrentTarget() const { return current_target_; }
    Document* GetDocument() const { return document_; }
    // What the client passed with the input that caused the event.
    void* GetUserData() const { return user_data_; }
    void SetUserData(void* data) { user_data_ = data; }

    // No effect while the event is being dispatched.
    void InitEvent(Atom type, bool bubbles, bool cancelable);
    void StopPropagation() { propagation_stopped_ = true; }
    void StopImmediatePropagation() { propagation_stopped_ = immediate_propagation_stopped_ = true; }
    void PreventDefault() { default_prevented_ = default_prevented_ || cancelable_; }
    void SetScriptConstructed() { script_constructed_ = true; }
    bool IsImmediatePropagationStopped() const { return immediate_propagation_stopped_; }
    bool IsScriptConstructed() const { return script_constructed_; }

  private:
    friend class EventDispatcher;

    Atom type_;
    bool bubbles_ = false;
    bool cancelable_ = false;
    bool propagation_stopped_ = false;
    bool immediate_propagation_stopped_ = false;
    bool default_prevented_ = false;
    bool script_constructed_ = false;  // such an event never reaches the client's callbacks
    EventPhase phase_ = EventPhase::None;
    EventTarget* target_ = nullptr;  // while dispatched
    script::WeakHandle<EventTarget> last_target_;
    EventTarget* current_target_ = nullptr;
    Document* document_ = nullptr;
    void* user_data_ = nullptr;
};

class UIEvent : public Event {
    QORVEX_SCRIPT_CLASS(UIEvent)
  public:
    using Event::Event;
};

}  // namespace qorvex::dom
