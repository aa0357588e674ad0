#include "dom/event_listeners.h"

#include <array>

#include "core/logging/log.h"
#include "dom/event_target.h"

namespace qorvex::dom {

namespace {

bool SameListener(const EventListener* a, const EventListener* b) {
    return a == b || (a && b && a->IsSameAs(*b));
}

// Names of events that have an on<type> property; the index is the event id. Kept with "on" in front: the
// plain name is its tail.
constexpr std::array<std::string_view, EventListeners::kEventIdCount> kInlineHandlerNames = {
    "onabort",
    "onblur",
    "onclick",
    "ondblclick",
    "onerror",
    "onfocus",
    "onfocusin",
    "onfocusout",
    "onkeydown",
    "onkeypress",
    "onkeyup",
    "onload",
    "onmousedown",
    "onmouseover",
    "onmouseout",
    "onmouseenter",
    "onmouseleave",
    "onmousemove",
    "onmouseup",
    "oninput",
    "onchange",
    "onscroll",
    "onwheel",
    "ontouchstart",
    "ontouchend",
    "ontouchmove",
    "onresize",
    "onqorplaybackstalled",
    "onqorplaybackresumed",
    "ondurationchange",
    "onemptied",
    "onended",
    "onplay",
    "onplaying",
    "onpause",
    "onseeked",
    "onseeking",
    "ontimeupdate",
    "onvolumechange",
    "onfinish",
    "onanimationend",
    "ontransitionend",
    "ongamepadconnected",
    "ongamepaddisconnected",
    "onprogress",
    "ontimeout",
    "onloadend",
    "onloadstart",
    "onreadystatechange",
    "onvrdisplayconnect",
    "onvrdisplaydisconnect",
    "onvrdisplayactivate",
    "onvrdisplaydeactivate",
    "onvrdisplayblur",
    "onvrdisplayfocus",
    "onvrdisplaypresentchange",
    "onaddsourcebuffer",
    "onremovesourcebuffer",
    "onupdate",
    "onupdatestart",
    "onupdateend",
    "onsourceopen",
    "onsourceended",
    "onsourceclose",
    "onpopstate",
    "onclose",
    "onopen",
    "onmessage",
};

}  // namespace

int EventId(std::string_view type) {
    for (size_t i = 0; i < kInlineHandlerNames.size(); ++i)
        if (kInlineHandlerNames[i].substr(2) == type) return static_cast<int>(i);
    return -1;
}

std::string_view InlineHandlerName(int event_id) {
    return kInlineHandlerNames[static_cast<size_t>(event_id)];
}

EventListeners::Entries* EventListeners::Find(Atom type) {
    for (TypeEntry& entry : by_type_)
        if (entry.type == type) return &entry.entries;
    return nullptr;
}

void EventListeners::Add(Atom type, ListenerEntry added) {
    Entries* entries = Find(type);
    if (!entries) {
        by_type_.push_back({type, {}});
        entries = &by_type_.back().entries;
    }
    for (ListenerEntry& entry : *entries) {
        if (added.from_binding) {
            if (!entry.from_binding) continue;
            entries->erase(&entry);
            break;
        }
        if (entry.use_capture == added.use_capture &&
            SameListener(entry.listener.get(), added.listener.get()))
            return;
    }
    entries->push_back(std::move(added));
}

void EventListeners::Remove(Atom type, EventListener* listener, bool use_capture, bool from_binding) {
    Entries* entries = Find(type);
    if (!entries) {
        AssertFailure("Attempting to remove listener for non-existing event type.");
        return;
    }
    for (ListenerEntry& entry : *entries) {
        const bool wanted =
            from_binding ? entry.from_binding
                         : entry.use_capture == use_capture && SameListener(entry.listener.get(), listener);
        if (!wanted) continue;
        entries->erase(&entry);
        return;
    }
}

EventListeners* EventListenerTable::Find(EventTarget& target) {
    if (!target.has_listeners_) return nullptr;
    auto* store = stores_.get(&target);
    return store ? store->get() : nullptr;
}

EventListeners& EventListenerTable::FindOrCreate(EventTarget& target) {
    auto& store = stores_[&target];
    if (!store) store = MakeUnique<EventListeners, MemoryTag::DOM>();
    target.has_listeners_ = true;
    return *store;
}

void EventListenerTable::Copy(EventTarget& from, EventTarget& to) {
    // The store stands behind a pointer, so that making the second cannot move the first.
    if (const EventListeners* store = Find(from)) FindOrCreate(to).CopyFrom(*store);
}

void EventListenerTable::Remove(EventTarget& target) {
    if (!target.has_listeners_) return;
    stores_.erase(&target);
    target.has_listeners_ = false;
}

}  // namespace qorvex::dom
