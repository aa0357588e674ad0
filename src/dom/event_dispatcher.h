// The road of one event: capture, target, bubble, default actions.
#pragma once

#include "core/memory/containers.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class Event;
class EventTarget;
class Node;

class EventDispatcher {
  public:
    EventDispatcher(Event& event, EventTarget& target) : event_(event), target_(target) {}

    // False when the default was prevented. The event is held for the call.
    bool Dispatch();

  private:
    using Path = SmallVector<qsl::RefPtr<Node>, 16, MemoryTag::DOM>;

    void ComputePath(Path& path) const;
    void Capture();
    void AtTarget();
    void Bubble();
    void RunDefaultActions();
    void Visit(EventTarget& current);

    Event& event_;
    EventTarget& target_;
    Node* node_ = nullptr;
};

// Runs the listeners of one target for the event's present phase; true unless the default was prevented.
bool FireEventListeners(EventTarget& target, Event& event);

}  // namespace qorvex::dom
