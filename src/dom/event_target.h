// Base of everything that can receive events. The listener store is kept out of the target, in a table of its
// document, so that a target without listeners costs nothing.
#pragma once

#include "core/memory/string_pool.h"
#include "qsl/ref_ptr.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::script {
struct ScriptingContext;
}

namespace qorvex::dom {

class Document;
class Event;
class EventListener;
class EventListeners;
class Node;

class EventTarget : public script::ScriptingHandleEnabledRefCountedWithWeak {
    QORVEX_SCRIPT_CLASS(EventTarget)
  public:
    // The store of this target in its document's table; null when there is none and `create` is false.
    virtual EventListeners* GetEventListeners(bool create);
    virtual script::ScriptingContext* GetScriptingContext();
    // The client's look at an event before the listeners of this target; false keeps them from running.
    virtual bool PreDispatch(Event&) { return true; }
    // Default action.
    virtual void PostDispatch(Event&) {}
    virtual Node* GetEventTargetNode() { return nullptr; }
    virtual Document* GetEventTargetDocument() const = 0;

    void AddEventListener(Atom type, qsl::RefPtr<EventListener> listener, bool use_capture,
                          bool from_binding = false);
    void RemoveEventListener(Atom type, EventListener* listener, bool use_capture, bool from_binding = false);
    // The script entry: only an initialised event that is not being dispatched goes out. False when it does
    // not, and when its default was prevented.
    bool DispatchEvent(Event* event);

  protected:
    ~EventTarget() override = default;

  private:
    friend class EventListenerTable;
    bool has_listeners_ = false;  // an entry in the table exists: saves the lookup when the target dies
};

}  // namespace qorvex::dom
