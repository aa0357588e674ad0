// Which native object stands behind which script object of a page, and who keeps whom alive.
//
// Wrappers are plain script objects that inherit from the prototype of their class; only classes with
// property rules of their own (class_table.h) need an object of a native class. Plain objects are what the
// engine is fast with: it remembers where `el.appendChild` was found, so a call costs what a bare C callback
// costs, and a property that a page puts on an element costs what it costs on any object. What the C API
// would give (an object of a JSClass, its private, its finaliser, JSValueProtect) is replaced by this table:
//
//   object -> native      `entries_`, a flat map; script objects do not move
//   roots                 `Slot::root`, read by the collector, possibly from its own thread
//   death                 a weak reference for each wrapper that no native holder keeps
//
// Invariant: root is set exactly while the wrapper has to live whatever script does: while its object has
// native holders, or has lost the last one since the last Settle. Otherwise `weak` is set. A dead wrapper is
// out of the table before the engine can use its memory again. Collections come to their end in idle frames,
// so the lists that follow them are chained through the slots: nothing is allocated between Add and the end.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <array>
#include <atomic>
#include <span>

#include "core/memory/containers.h"
#include "script/class_table.h"
#include "script/engine_seam.h"

namespace qorvex::script {

struct ScriptingContext;

class WrapperTable final : private IHeapObserver {
  public:
    WrapperTable() = default;
    ~WrapperTable();
    WrapperTable(const WrapperTable&) = delete;
    WrapperTable& operator=(const WrapperTable&) = delete;

    // `page` has its context.
    void Start(ScriptingContext& page);
    // Parts all natives and wrappers; natives without another holder end here. The context is still there.
    void Stop();

    // What PackPrivate made of the native behind `object`; null for every other object.
    [[nodiscard]] const void* Find(JSObjectRef object) const {
        const Entry* entry = entries_.get(object);
        return entry ? entry->packed : nullptr;
    }
    [[nodiscard]] size_t size() const { return entries_.size(); }

    // A new wrapper of the class, held. Null when the page has no such class (any more).
    [[nodiscard]] JSObjectRef Add(ScriptClass script_class, const void* packed);
    // The first native holder is there again, or the last one has gone. Nothing for wrappers of other pages.
    void Hold(JSObjectRef wrapper);
    void LetGo(JSObjectRef wrapper);

    // Turns wrappers without holders over to the collector and ends natives whose wrappers it has taken.
    void Settle() override;

  private:
    struct Slot {
        std::atomic<JSObjectRef> root{nullptr};
        JSObjectRef object = nullptr;
        ScriptWeakRef weak = nullptr;
        const void* packed = nullptr;  // of the dead ones: the native, with the holder that its wrapper was
        Slot* next = nullptr;          // of the free, blank, let go or dead ones, which exclude each other
        Slot* next_weak = nullptr;     // in weak_
        bool let_go = false;           // stands in let_go_
        bool listed = false;           // stands in weak_
    };
    // Slots never move, as the collector walks them beside us; `next` is set once.
    struct Chunk {
        static constexpr size_t kSlots = 128;
        std::atomic<Chunk*> next{nullptr};
        Slot slots[kSlots];
    };
    struct Entry {
        const void* packed = nullptr;
        Slot* slot = nullptr;
    };
    // Blank objects of one class, made ahead: one call into script makes some rounds
    // (class_installation.cpp). The watchdog reads the thread's clock at each such call, which costs more
    // than a round, so a class that is used much gets twice as many rounds each time.
    static constexpr uint32_t kBlanksInRound = 16;
    static constexpr uint32_t kMostRounds = 8;
    struct Blanks {
        Slot* first = nullptr;
        JSObjectRef maker = nullptr;
        uint32_t rounds = 1;  // of the next call
    };

    void MarkRoots(Marker& marker) override;
    void OnCollected() override;

    Slot* TakeSlot(JSObjectRef object);
    void FreeSlot(Slot* slot);
    void Bury(Slot* slot, const void* packed);
    void EndNatives();
    Slot* TakeBlank(ScriptClass script_class);
    void MakeBlanks(ScriptClass script_class);
    void MakeOneBlank(size_t index);
    Slot* MakeWithRules(ScriptClass script_class, const void* packed);
    static JSValueRef AcceptBlanks(JSContextRef context, JSObjectRef, JSObjectRef, size_t count,
                                   const JSValueRef objects[], JSValueRef*);
    void TurnOver(Slot* slot);

    ScriptingContext* page_ = nullptr;
    JSContextGroupRef group_ = nullptr;
    HashMap<JSObjectRef, Entry, MemoryTag::DOM> entries_;
    std::atomic<Chunk*> chunks_{nullptr};
    Slot* free_ = nullptr;
    std::array<Blanks, kScriptClassCount> blanks_{};
    Blanks* filling_ = nullptr;
    Slot* let_go_ = nullptr;
    Slot* weak_ = nullptr;  // and some that were held again since
    Slot* dead_ = nullptr;  // their natives are parted from them, and still to end
    size_t unsettled_ = 0;  // let go or dead
};

}  // namespace qorvex::script
