// The listeners of one target, and the document's table from target to listeners.
#pragma once

#include <bitset>

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "script/scripting_handle.h"

namespace qorvex::dom {

class Event;
class EventTarget;

// Holds what is called. Script functions derive from it in the bindings' floor; native listeners of the
// engine and its tests derive from it directly.
class EventListener : public script::ScriptingHandleEnabledRefCounted {
  public:
    virtual void HandleEvent(Event& event) = 0;
    // Two listeners are the same when their functions are.
    virtual bool IsSameAs(const EventListener& other) const { return this == &other; }
};

struct ListenerEntry {
    RefPtr<EventListener> listener;  // null is allowed and does nothing
    bool use_capture = false;
    bool from_binding = false;  // installed by data binding; at most one for each type
};

class EventListeners {
  public:
    static constexpr int kEventIdCount = 68;
    using Entries = Vector<ListenerEntry, MemoryTag::DOM>;

    void Add(Atom type, RefPtr<EventListener> listener, bool use_capture, bool from_binding);
    void Remove(Atom type, EventListener* listener, bool use_capture, bool from_binding);
    Entries* Find(Atom type);
    void CopyFrom(const EventListeners& other);

    // Which on<type> properties of the target's script object hold a function.
    std::bitset<kEventIdCount>& InlineHandlers() { return inline_handlers_; }

  private:
    struct TypeEntry {
        Atom type;
        Entries entries;
    };
    Vector<TypeEntry, MemoryTag::DOM> by_type_;
    std::bitset<kEventIdCount> inline_handlers_;
};

// Index of an event name in the table of names with an on<type> property, -1 for any other name.
int EventId(std::string_view type);
// The name with "on" in front.
std::string_view InlineHandlerName(int event_id);

class EventListenerTable {
  public:
    EventListeners* Find(EventTarget& target);
    EventListeners& FindOrCreate(EventTarget& target);
    void Remove(EventTarget& target);
    void Clear();

  private:
    HashMap<EventTarget*, UniquePtr<EventListeners, MemoryTag::DOM>, MemoryTag::DOM> stores_;
};

}  // namespace qorvex::dom
