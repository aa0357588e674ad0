// The on<type> property of a target's script object, called before the target's listeners.
#pragma once

namespace qorvex::dom {

class Event;
class EventListeners;
class EventTarget;

void CallInlineHandler(EventTarget& target, EventListeners& store, Event& event);

}  // namespace qorvex::dom
