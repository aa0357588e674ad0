// Base of everything that can receive events. The listener store is kept out of the target, in a table of its
// document, so that a target without listeners costs nothing.
#pragma once

#include "core/memory/string_pool.h"
#include "script/scripting_handle.h"

namespace qorvex::script {
class ScriptingContext;
}

namespace qorvex::dom {

class Document;
class Event;
class EventListener;
class EventListeners;
class Node;

class EventTarget : public script::ScriptingHandleEnabledRefCountedWithWeak {
  public:
    // The store of this target in its document's table; null when there is none and `create` is false.
    virtual EventListeners* GetEventListeners(bool create);
    virtual script::ScriptingContext* GetScriptingContext();
    // The client's look at an event before the listeners of this target; false keeps them from running.
    virtual bool PreDispatch(Event& event);
    // Default action.
    virtual void PostDispatch(Event& event);
    virtual Node* GetEventTargetNode() { return nullptr; }
    virtual Document* GetEventTargetDocument() const = 0;

    void AddEventListener(Atom type, RefPtr<EventListener> listener, bool use_capture,
                          bool from_binding = false);
    void RemoveEventListener(Atom type, EventListener* listener, bool use_capture, bool from_binding = false);
    // The script entry: only an initialised event that is not being dispatched goes out.
    bool DispatchEvent(Event* event);

  protected:
    ~EventTarget() override;

  private:
    friend class EventListenerTable;
    bool has_listeners_ = false;  // an entry in the table exists: saves the lookup when the target dies
};

}  // namespace qorvex::dom
