#include "dom/event_target.h"

#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/event.h"
#include "dom/event_dispatcher.h"

namespace qorvex::dom {

EventListeners* EventTarget::GetEventListeners(bool create) {
    Document* document = GetEventTargetDocument();
    if (!document) return nullptr;
    EventListenerTable& table = document->GetEventListenerTable();
    return create ? &table.FindOrCreate(*this) : table.Find(*this);
}

script::ScriptingContext* EventTarget::GetScriptingContext() {
    Document* document = GetEventTargetDocument();
    if (!document) {
        AssertFailure("Unable to get scripting context for null document!");
        return nullptr;
    }
    return document->GetDocumentContext();
}

void EventTarget::AddEventListener(Atom type, qsl::RefPtr<EventListener> listener, bool use_capture,
                                   bool from_binding) {
    if (EventListeners* store = GetEventListeners(true))
        store->Add(type, {std::move(listener), use_capture, from_binding});
}

void EventTarget::RemoveEventListener(Atom type, EventListener* listener, bool use_capture,
                                      bool from_binding) {
    if (EventListeners* store = GetEventListeners(false))
        store->Remove(type, listener, use_capture, from_binding);
}

bool EventTarget::DispatchEvent(Event* event) {
    if (!event || event->GetType() == Atom() || event->GetPhase() != EventPhase::None) return false;
    return EventDispatcher(*event, *this).Dispatch();
}

}  // namespace qorvex::dom
