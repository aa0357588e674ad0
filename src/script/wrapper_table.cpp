#include "script/wrapper_table.h"

#include <JavaScriptCore/JavaScript.h>

#include <algorithm>

#include "script/class_installation.h"
#include "script/native_private.h"
#include "script/scripting_context.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::script {

namespace {

// What the native behind a wrapper takes at least: an event 192 bytes, an element 600 and more. Script alone
// would count 64, and a loop that makes elements could hold a hundred megabytes before the first collection.
constexpr size_t kNativeBytes = 256;

template <class F>
decltype(auto) WithHandle(const void* packed, F&& use) {
    const NativePrivate found = UnpackPrivate(packed);
    auto* handle = static_cast<ScriptingHandleEnabled*>(found.object);
    if (found.has_weak) return use(static_cast<ScriptingHandleEnabledRefCountedWithWeak*>(handle));
    return use(static_cast<ScriptingHandleEnabledRefCounted*>(handle));
}

// A page that has fewer wrappers than this is not worth the script that makes blanks by the handful.
constexpr size_t kFewWrappers = 64;

}  // namespace

WrapperTable::~WrapperTable() {
    if (page_) Stop();
}

void WrapperTable::Start(ScriptingContext& page) {
    page_ = &page;
    group_ = JSContextGetGroup(page.context);
    AddHeapObserver(group_, *this);
}

void WrapperTable::Stop() {
    if (!page_) return;
    RemoveHeapObserver(*this);
    let_go_ = nullptr;
    HashMap<JSObjectRef, Entry, MemoryTag::DOM> entries;
    entries.swap(entries_);
    for (auto& [object, entry] : entries) {
        WithHandle(entry.packed, [](auto* handle) { handle->DetachWrapper(); });
        Bury(entry.slot, entry.packed);
    }
    for (Slot* slot = dead_; slot; slot = slot->next) {
        if (slot->weak) ReleaseWeakReference(group_, std::exchange(slot->weak, nullptr));
    }
    // Natives may still ask for wrappers while they end; they get none.
    page_ = nullptr;
    EndNatives();
    for (Chunk* chunk = chunks_.exchange(nullptr); chunk;) {
        Chunk* next = chunk->next;
        Delete<MemoryTag::DOM>(chunk);
        chunk = next;
    }
    free_ = nullptr;
    weak_ = nullptr;
    blanks_ = {};
    unsettled_ = 0;
}

JSObjectRef WrapperTable::Add(ScriptClass script_class, const void* packed) {
    if (!page_ || !GetPrototype(*page_, script_class)) return nullptr;
    Slot* slot =
        HasPropertyRules(script_class) ? MakeWithRules(script_class, packed) : TakeBlank(script_class);
    if (!slot) return nullptr;
    entries_.insert_or_assign(slot->object, Entry{packed, slot});
    return slot->object;
}

void WrapperTable::Hold(JSObjectRef wrapper) {
    const Entry* entry = entries_.get(wrapper);
    if (!entry || !entry->slot->weak) return;
    // While the engine is entered no collection comes to its end, so the reference tells the truth until the
    // root stands. One that had ended before is heard of on the way in: then there is no wrapper any more.
    const ScriptEngineLock lock(page_->context);
    entry = entries_.get(wrapper);
    if (!entry || !GetWeakObject(entry->slot->weak)) return;
    entry->slot->root.store(wrapper, std::memory_order_release);
    ReleaseWeakReference(group_, std::exchange(entry->slot->weak, nullptr));
}

void WrapperTable::LetGo(JSObjectRef wrapper) {
    const Entry* entry = entries_.get(wrapper);
    if (!entry || entry->slot->let_go || entry->slot->weak) return;
    // Most come back at once: the reference that a call holds, a node on its way from one parent to another.
    entry->slot->let_go = true;
    entry->slot->next = std::exchange(let_go_, entry->slot);
    ++unsettled_;
}

void WrapperTable::Settle() {
    if (!page_ || unsettled_ == 0) return;
    {
        const ScriptEngineLock lock(page_->context);
        while (Slot* slot = let_go_) {
            let_go_ = slot->next;
            --unsettled_;
            TurnOver(slot);
        }
        for (Slot* slot = dead_; slot; slot = slot->next) {
            if (slot->weak) ReleaseWeakReference(group_, std::exchange(slot->weak, nullptr));
        }
    }
    EndNatives();
}

// Destructors may let go of others, and run script in the end, which may settle or bury more: one at a time.
void WrapperTable::EndNatives() {
    while (Slot* slot = dead_) {
        // One that was buried meanwhile still has its reference, which goes with the next Settle.
        if (slot->weak) return;
        dead_ = slot->next;
        --unsettled_;
        const void* packed = slot->packed;
        FreeSlot(slot);
        WithHandle(packed, [](auto* handle) { handle->Release(); });
    }
}

void WrapperTable::TurnOver(Slot* slot) {
    slot->let_go = false;
    const Entry* entry = slot->object ? entries_.get(slot->object) : nullptr;
    if (!entry || !WithHandle(entry->packed, [](auto* handle) { return handle->IsHeldByWrapperOnly(); }))
        return;
    slot->weak = MakeWeakReference(group_, slot->object);
    slot->root.store(nullptr, std::memory_order_release);
    if (!std::exchange(slot->listed, true)) slot->next_weak = std::exchange(weak_, slot);
}

void WrapperTable::MarkRoots(Marker& marker) {
    for (Chunk* chunk = chunks_.load(std::memory_order_acquire); chunk;
         chunk = chunk->next.load(std::memory_order_acquire)) {
        for (Slot& slot : chunk->slots) {
            if (const JSObjectRef object = slot.root.load(std::memory_order_acquire)) marker.Mark(object);
        }
    }
}

void WrapperTable::OnCollected() {
    for (Slot** link = &weak_; Slot* slot = *link;) {
        if (slot->weak && GetWeakObject(slot->weak)) {
            link = &slot->next_weak;
            continue;
        }
        *link = slot->next_weak;
        slot->listed = false;
        if (!slot->weak) continue;
        const void* packed = entries_.get(slot->object)->packed;
        WithHandle(packed, [](auto* handle) { handle->DetachWrapper(); });
        entries_.erase(slot->object);
        Bury(slot, packed);
    }
}

void WrapperTable::Bury(Slot* slot, const void* packed) {
    slot->packed = packed;
    slot->next = std::exchange(dead_, slot);
    ++unsettled_;
}

// --- Slots

WrapperTable::Slot* WrapperTable::TakeSlot(JSObjectRef object) {
    if (!free_) {
        Chunk* chunk = New<Chunk, MemoryTag::DOM>();
        for (Slot& slot : chunk->slots)
            FreeSlot(&slot);
        chunk->next.store(chunks_.load(std::memory_order_relaxed), std::memory_order_relaxed);
        chunks_.store(chunk, std::memory_order_release);
    }
    Slot* slot = std::exchange(free_, free_->next);
    slot->object = object;
    slot->root.store(object, std::memory_order_release);
    return slot;
}

void WrapperTable::FreeSlot(Slot* slot) {
    slot->root.store(nullptr, std::memory_order_release);
    slot->object = nullptr;
    slot->weak = nullptr;
    slot->next = free_;
    free_ = slot;
}

// --- Objects

WrapperTable::Slot* WrapperTable::TakeBlank(ScriptClass script_class) {
    Blanks& blanks = blanks_[static_cast<size_t>(script_class)];
    if (!blanks.first) MakeBlanks(script_class);
    if (!blanks.first) return nullptr;
    return std::exchange(blanks.first, blanks.first->next);
}

JSValueRef WrapperTable::AcceptBlanks(JSContextRef context, JSObjectRef, JSObjectRef, size_t count,
                                      const JSValueRef objects[], JSValueRef*) {
    ScriptingContext* page = GetScriptingContext(context);
    Blanks* blanks = page ? page->wrappers.filling_ : nullptr;
    for (size_t i = 0; blanks && i < count; ++i) {
        Slot* slot = page->wrappers.TakeSlot(const_cast<JSObjectRef>(objects[i]));
        slot->next = blanks->first;
        blanks->first = slot;
    }
    return JSValueMakeUndefined(context);
}

void WrapperTable::MakeBlanks(ScriptClass script_class) {
    // What has piled up since the last frame goes here too: a script may make objects without end.
    Settle();
    const auto index = static_cast<size_t>(script_class);
    JSContextRef context = page_->context;
    Blanks& blanks = blanks_[index];
    if (!blanks.maker && entries_.size() < kFewWrappers) return MakeOneBlank(index);
    filling_ = &blanks;
    JSValueRef exception = nullptr;
    if (!blanks.maker) {
        blanks.maker = MakeBlankMaker(*page_, page_->prototypes[index],
                                      JSObjectMakeFunctionWithCallback(context, nullptr, AcceptBlanks));
        if (blanks.maker) {
            JSObjectSetPropertyAtIndex(context, page_->class_keeper,
                                       static_cast<unsigned>(kClassKeeperUses + index), blanks.maker,
                                       nullptr);
        }
    }
    const uint32_t rounds = blanks.rounds;
    if (blanks.maker) {
        const JSValueRef argument = JSValueMakeNumber(context, rounds);
        JSObjectCallAsFunction(context, blanks.maker, nullptr, 1, &argument, &exception);
    }
    filling_ = nullptr;
    if (blanks.first) {
        blanks.rounds = std::min(rounds * 2, kMostRounds);
        return ReportNativeMemory(context, rounds * kBlanksInRound * kNativeBytes);
    }
    // The engine runs no script now: out of stack, or being stopped.
    MakeOneBlank(index);
}

void WrapperTable::MakeOneBlank(size_t index) {
    const JSObjectRef object = JSObjectMake(page_->context, nullptr, nullptr);
    JSObjectSetPrototype(page_->context, object, page_->prototypes[index]);
    blanks_[index].first = TakeSlot(object);
    blanks_[index].first->next = nullptr;
}

WrapperTable::Slot* WrapperTable::MakeWithRules(ScriptClass script_class, const void* packed) {
    JSClassRef engine_class = GetScriptClassTable()[script_class];
    if (!engine_class) return nullptr;
    if (unsettled_ >= Chunk::kSlots) Settle();
    const JSObjectRef object = JSObjectMake(page_->context, engine_class, const_cast<void*>(packed));
    JSObjectSetPrototype(page_->context, object, page_->prototypes[static_cast<size_t>(script_class)]);
    return TakeSlot(object);
}

}  // namespace qorvex::script
