// https://dom.spec.whatwg.org/#concept-event-dispatch, with these differences: the path is computed anew for
// each phase, so that a change of the tree by a listener shows in the later phases; the window is the
// outermost station of every node in a document, "load" included; and each target has a client callback
// before its listeners.
#include "dom/event_dispatcher.h"

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "dom/document.h"
#include "dom/event.h"
#include "dom/event_listeners.h"
#include "dom/inline_handlers.h"

namespace qorvex::dom {

using qsl::RefPtr;

bool EventDispatcher::Dispatch() {
    const RefPtr<Event> event_held(&event_);
    const RefPtr<EventTarget> target_held(&target_);
    node_ = target_.GetEventTargetNode();
    Capture();
    if (!node_ || !event_.propagation_stopped_) AtTarget();
    if (node_ && event_.bubbles_ && !event_.propagation_stopped_) Bubble();
    RunDefaultActions();
    event_.target_ = nullptr;
    event_.last_target_ = &target_;
    event_.current_target_ = nullptr;
    event_.phase_ = EventPhase::None;
    return !event_.default_prevented_;
}

void EventDispatcher::ComputePath(Path& path) const {
    if (node_->IsText()) AssertFailure("Anonymous node should not be the first inserted node in eventPath");
    for (Node* node = node_; node && node->IsInDocument(); node = node->GetParent())
        path.push_back(RefPtr<Node>(node));
}

void EventDispatcher::Visit(EventTarget& current) {
    event_.current_target_ = &current;
    if (current.PreDispatch(event_)) FireEventListeners(current, event_);
}

void EventDispatcher::Capture() {
    if (!node_) return;
    event_.phase_ = EventPhase::Capture;
    event_.target_ = node_;
    if (EventTarget* window = node_->GetDocument()->GetWindow()) Visit(*window);
    Path path;
    ComputePath(path);
    for (size_t i = path.size(); i > 1;) {
        event_.target_ = node_;
        Visit(*path[--i]);
        // Looked at only after an entry has run: a window listener cannot keep the root's from running.
        if (event_.propagation_stopped_) return;
    }
}

void EventDispatcher::AtTarget() {
    event_.phase_ = EventPhase::AtTarget;
    event_.target_ = &target_;
    event_.current_target_ = &target_;
    if (node_) {
        // A text node acts through its element.
        Node* current = node_;
        while (!current->IsElement() && current->GetParent())
            current = current->GetParent();
        event_.current_target_ = current;
    }
    if (target_.PreDispatch(event_)) FireEventListeners(target_, event_);
}

void EventDispatcher::Bubble() {
    Path path;
    ComputePath(path);
    for (size_t i = 1; i < path.size(); ++i) {
        event_.phase_ = EventPhase::Bubble;
        event_.target_ = node_;
        Visit(*path[i]);
        if (event_.propagation_stopped_) return;
    }
    if (!event_.bubbles_) return;
    if (EventTarget* window = node_->GetDocument()->GetWindow()) Visit(*window);
}

void EventDispatcher::RunDefaultActions() {
    event_.target_ = &target_;
    event_.current_target_ = nullptr;
    event_.phase_ = EventPhase::None;
    if (event_.default_prevented_) return;
    target_.PostDispatch(event_);
    if (!event_.bubbles_ || !node_) return;
    if (node_->IsElement() && event_.type_ == atoms::kMousedown) static_cast<Element*>(node_)->Focus();
    Path path;
    ComputePath(path);
    for (size_t i = 1; i < path.size(); ++i)
        path[i]->PostDispatch(event_);
}

bool FireEventListeners(EventTarget& target, Event& event) {
    if (event.GetType() == Atom()) {
        AssertFailure("Broken event fired!");
        return false;
    }
    EventListeners* store = target.GetEventListeners(false);
    if (!store) return true;
    if (store->InlineHandlers().any() && event.GetPhase() != EventPhase::Capture)
        CallInlineHandler(target, *store, event);

    // By index with the list read anew in each round: listeners come and go while they run.
    for (size_t i = 0;; ++i) {
        store = target.GetEventListeners(false);
        EventListeners::Entries* entries = store ? store->Find(event.GetType()) : nullptr;
        if (!entries || i >= entries->size()) break;
        const ListenerEntry& entry = (*entries)[i];
        if (event.GetPhase() == EventPhase::Capture && !entry.use_capture) continue;
        if (event.GetPhase() == EventPhase::Bubble && entry.use_capture) continue;
        if (event.IsImmediatePropagationStopped()) break;
        const RefPtr<EventListener> listener = entry.listener;
        if (listener) listener->HandleEvent(event);
    }
    return !event.GetDefaultPrevented();
}

}  // namespace qorvex::dom
