// The listeners of one target, and the document's table from target to listeners.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <bitset>
#include <string_view>

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "qsl/ref_ptr.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::dom {

class Event;
class EventTarget;

// Holds what is called: a script function (dom/script_event_listener.h) or native code.
class EventListener : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(EventListener)
  public:
    virtual void HandleEvent(Event& event) = 0;
    // Two listeners are the same when their functions are.
    virtual bool IsSameAs(const EventListener& other) const { return this == &other; }
    virtual JSValueRef GetScriptFunction() const { return nullptr; }
};

struct ListenerEntry {
    qsl::RefPtr<EventListener> listener;  // null is allowed and does nothing
    bool use_capture = false;
    bool from_binding = false;  // installed by data binding; at most one for each type
};

class EventListeners {
  public:
    static constexpr int kEventIdCount = 68;
    using Entries = SmallVector<ListenerEntry, 1, MemoryTag::DOM>;

    void Add(Atom type, ListenerEntry entry);
    void Remove(Atom type, EventListener* listener, bool use_capture, bool from_binding);
    // Valid until a type is added; entries may come and go.
    Entries* Find(Atom type);
    void CopyFrom(const EventListeners& other) { *this = other; }

    // Which on<type> properties of the target's script object hold a function, by event id.
    std::bitset<kEventIdCount>& InlineHandlers() { return inline_handlers_; }

  private:
    struct TypeEntry {
        Atom type;
        Entries entries;
    };
    SmallVector<TypeEntry, 1, MemoryTag::DOM> by_type_;
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
    void Copy(EventTarget& from, EventTarget& to);
    void Remove(EventTarget& target);
    void Clear() { stores_.clear(); }

  private:
    HashMap<EventTarget*, UniquePtr<EventListeners, MemoryTag::DOM>, MemoryTag::DOM> stores_;
};

}  // namespace qorvex::dom
