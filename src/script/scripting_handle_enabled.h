// The bond between a native object and its script object (wrapper).
//
// count = 2 x native references + wrapper bit:
//   0  dead                       1  only the wrapper is left, the collector decides
//   2  one native holder          3  one native holder and a wrapper
// Invariant: a wrapper exists at most once per object, and the collector must keep it exactly while count >=
// 3 (wrapper_table.h). So each side keeps the other alive as long as somebody outside needs it, and no
// longer.
//
// Objects are used only on the thread that runs the view's script, so the count is a plain integer; the weak
// control block is atomic because a weak pointer may be dropped by another thread's clean-up.
//
// A dying object ends in `delete this`: a class with its own pool or memory tag declares its own operator
// delete, which the virtual destructor finds. Nobody else needs to know where an object came from.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <utility>

#include "script/class_table.h"

namespace qorvex::script {

class ScriptingHandleEnabledRefCountedWithWeak;

// Base of every object that can appear in script. Objects are born with one native reference (count 2) that
// the creator adopts: see MakeHandle in script/make_handle.h.
class ScriptingHandleEnabled {
  public:
    ScriptingHandleEnabled() = default;
    ScriptingHandleEnabled(const ScriptingHandleEnabled&) = delete;
    ScriptingHandleEnabled& operator=(const ScriptingHandleEnabled&) = delete;

    virtual ~ScriptingHandleEnabled();
    // The last reference is about to go. Only the WithWeak flavour calls it.
    virtual void OnBeforeDestroy() {}
    // Gives the wrapper back to the collector, unless a context teardown is in progress.
    virtual void ReleaseWrapper();
    // The one wrapper of this object, made on first use. Bound classes override it by QORVEX_SCRIPT_CLASS.
    // Gives null for an object that is being destroyed.
    virtual void GetOrCreateWrapper(JSContextRef context, JSValueRef* out) = 0;

    [[nodiscard]] JSObjectRef wrapper() const { return wrapper_; }

    // Memory of the DOM area from the client's allocator.
    static void* operator new(size_t size);
    static void operator delete(void* memory);

  protected:
    void HoldWrapper();
    // True when it was made.
    bool MakeWrapper(ScriptClass script_class, bool has_weak, JSContextRef context);

    // Null until the first wrapping. Of which page it is the pages of the thread know.
    JSObjectRef wrapper_ = nullptr;
};

// Plain count that weak control blocks use: the one part another thread may touch.
class ThreadSafeRC {
  public:
    void Add() { count_.fetch_add(1, std::memory_order_relaxed); }
    [[nodiscard]] bool Drop() { return count_.fetch_sub(1, std::memory_order_acq_rel) == 1; }

  private:
    std::atomic<uint32_t> count_{1};
};

// Outlives its object as long as weak pointers hold it. `object` is null once the object is dead.
template <class T, class Count>
struct WeakControlBlock {
    Count count;
    T* object = nullptr;
};

using WeakHandleBlock = WeakControlBlock<ScriptingHandleEnabledRefCountedWithWeak, ThreadSafeRC>;
[[nodiscard]] WeakHandleBlock* MakeWeakHandleBlock(ScriptingHandleEnabledRefCountedWithWeak* object);
void DropWeakHandleBlock(WeakHandleBlock* block);

// Policies of ReferenceCounted.
template <class T, class Count>
class HasWeakPtr {
  public:
    static constexpr bool kHasWeak = true;

    // The block, made on first use, with one more count for the caller.
    [[nodiscard]] WeakHandleBlock* AcquireWeakBlock(T* self) {
        if (!block_) block_ = MakeWeakHandleBlock(self);
        block_->count.Add();
        return block_;
    }
    void ClearWeakBlock() {
        if (!block_) return;
        block_->object = nullptr;
        DropWeakHandleBlock(std::exchange(block_, nullptr));
    }

  private:
    WeakControlBlock<T, Count>* block_ = nullptr;
};

struct NoWeakPtr {
    static constexpr bool kHasWeak = false;
    void ClearWeakBlock() {}
};

struct RequireDestroyNotification {
    static constexpr bool kNotifies = true;
};
struct NoDestroyNotification {
    static constexpr bool kNotifies = false;
};

// The arithmetic of the head comment, without the actions.
template <class T>
class ScriptingHandleRefCounter {
  public:
    // While the destructor runs, references come and go around this value and reach nothing.
    static constexpr uint32_t kDying = 0x40000000;

    uint32_t AddNative() { return count_ += 2; }
    uint32_t DropNative() { return count_ -= 2; }
    void AddWrapper() { count_ += 1; }
    // The wrapper's bit becomes the weight of one native reference, for the release that follows.
    void TurnWrapperIntoNative() { count_ += 1; }
    [[nodiscard]] bool NextDropIsLast() const { return count_ == 1 || count_ == 2; }
    [[nodiscard]] bool IsDying() const { return count_ >= kDying / 2; }
    void SetDying() { count_ = kDying; }
    [[nodiscard]] uint32_t value() const { return count_; }

  private:
    uint32_t count_ = 2;
};

template <class T, class Counter, class WeakPolicy, class NotificationPolicy>
class ReferenceCounted : public ScriptingHandleEnabled, protected WeakPolicy, protected Counter {
  public:
    void AddRef() {
        if (Counter::AddNative() == 3 && wrapper_) HoldWrapper();
    }

    void Release() {
        if constexpr (NotificationPolicy::kNotifies) {
            if (Counter::NextDropIsLast()) OnBeforeDestroy();
        }
        const uint32_t left = Counter::DropNative();
        if (left > 1) return;
        if (left == 1) {
            ReleaseWrapper();
            return;
        }
        WeakPolicy::ClearWeakBlock();
        Counter::SetDying();
        delete this;
    }

    // The wrapper is gone. What it weighed is now one native reference, which the caller releases.
    void DetachWrapper() {
        Counter::TurnWrapperIntoNative();
        wrapper_ = nullptr;
    }
    [[nodiscard]] bool IsHeldByWrapperOnly() const { return Counter::value() == 1; }

    // 2 x native references + wrapper bit.
    [[nodiscard]] uint32_t reference_count() const { return Counter::value(); }

  protected:
    void WrapAs(ScriptClass script_class, JSContextRef context, JSValueRef* out) {
        if (!wrapper_ && !Counter::IsDying() && MakeWrapper(script_class, WeakPolicy::kHasWeak, context)) {
            Counter::AddWrapper();
        }
        *out = wrapper_;
    }
};

class ScriptingHandleEnabledRefCounted
    : public ReferenceCounted<ScriptingHandleEnabledRefCounted,
                              ScriptingHandleRefCounter<ScriptingHandleEnabledRefCounted>, NoWeakPtr,
                              NoDestroyNotification> {};

class ScriptingHandleEnabledRefCountedWithWeak
    : public ReferenceCounted<ScriptingHandleEnabledRefCountedWithWeak,
                              ScriptingHandleRefCounter<ScriptingHandleEnabledRefCountedWithWeak>,
                              HasWeakPtr<ScriptingHandleEnabledRefCountedWithWeak, ThreadSafeRC>,
                              RequireDestroyNotification> {
  public:
    // For WeakHandle.
    [[nodiscard]] WeakHandleBlock* AcquireWeakBlock() {
        return IsDying() ? nullptr : HasWeakPtr::AcquireWeakBlock(this);
    }
};

// Weak pointer to a WithWeak object: get() is null once the object is dead. A pointer taken from a dying
// object's own destructor is null at once.
template <class T>
class WeakHandle {
  public:
    WeakHandle() = default;
    WeakHandle(T* object) : block_(object ? object->AcquireWeakBlock() : nullptr) {}  // NOLINT: by design
    WeakHandle(const WeakHandle& other) : block_(other.block_) {
        if (block_) block_->count.Add();
    }
    WeakHandle(WeakHandle&& other) noexcept : block_(std::exchange(other.block_, nullptr)) {}
    WeakHandle& operator=(WeakHandle other) noexcept {
        std::swap(block_, other.block_);
        return *this;
    }
    ~WeakHandle() {
        if (block_) DropWeakHandleBlock(block_);
    }

    [[nodiscard]] T* get() const { return block_ ? static_cast<T*>(block_->object) : nullptr; }
    T* operator->() const { return get(); }
    explicit operator bool() const { return get() != nullptr; }

  private:
    WeakHandleBlock* block_ = nullptr;
};

// Names the bound class of a native class: the private section's answer to "which row of the table am I".
// A class without the line appears in script as its base does.
#define QORVEX_SCRIPT_CLASS(Name)                                                                      \
  public:                                                                                              \
    static constexpr ::qorvex::script::ScriptClass kScriptClass = ::qorvex::script::ScriptClass::Name; \
    void GetOrCreateWrapper(JSContextRef context, JSValueRef* out) override {                          \
        WrapAs(kScriptClass, context, out);                                                            \
    }

}  // namespace qorvex::script
