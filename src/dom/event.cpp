#include "dom/event.h"

#include "dom/event_target.h"

namespace qorvex::dom {

Event::Event(Document* document, Atom type, bool bubbles, bool cancelable)
    : type_(type), bubbles_(bubbles), cancelable_(cancelable), document_(document) {}

EventTarget* Event::GetTarget() const {
    return target_ ? target_ : last_target_.get();
}

// https://dom.spec.whatwg.org/#dom-event-initevent
void Event::InitEvent(Atom type, bool bubbles, bool cancelable) {
    if (phase_ != EventPhase::None) return;
    type_ = type;
    bubbles_ = bubbles;
    cancelable_ = cancelable;
    propagation_stopped_ = immediate_propagation_stopped_ = default_prevented_ = false;
}

}  // namespace qorvex::dom
