// A callable of any type behind one signature. Move-only, so that it may own what it captures; callables of
// up to four words stay inside. Calling an empty one returns the neutral value and tells the hook, because
// qsl itself has nobody to complain to.
#pragma once

#include <cstddef>
#include <memory>
#include <new>
#include <type_traits>
#include <utility>

#include "qsl/allocation.h"

namespace qsl {

/// Called when an empty function is called; the engine points it to its log.
using EmptyCallHook = void (*)();
inline constinit EmptyCallHook g_on_empty_function_call = nullptr;

template <class Signature, class Alloc = std::allocator<std::byte>>
class function;

template <class R, class... A, class Alloc>
class function<R(A...), Alloc> {
    static constexpr size_t kRoom = 4 * sizeof(void*);

    struct Operations {
        R (*call)(void* room, A&&... args);
        void (*move)(void* from, void* to);
        void (*destroy)(void* room);
    };

    template <class F>
    static constexpr bool kInside = sizeof(F) <= kRoom &&
                                    alignof(F) <= alignof(void*) && std::is_nothrow_move_constructible_v<F>;

    template <class F>
    struct Inside {
        static F& Of(void* room) { return *std::launder(static_cast<F*>(room)); }
        static R Call(void* room, A&&... args) { return static_cast<R>(Of(room)(std::forward<A>(args)...)); }
        static void Move(void* from, void* to) {
            ::new (to) F(std::move(Of(from)));
            Of(from).~F();
        }
        static void Destroy(void* room) { Of(room).~F(); }
        static constexpr Operations kOperations = {&Call, &Move, &Destroy};
    };

    template <class F>
    struct Outside {
        static F*& Of(void* room) { return *static_cast<F**>(room); }
        static R Call(void* room, A&&... args) {
            return static_cast<R>((*Of(room))(std::forward<A>(args)...));
        }
        static void Move(void* from, void* to) { ::new (to) F*(Of(from)); }
        static void Destroy(void* room) {
            std::destroy_at(Of(room));
            DeallocateArray<F, Alloc>(Of(room), 1);
        }
        static constexpr Operations kOperations = {&Call, &Move, &Destroy};
    };

  public:
    function() = default;
    function(std::nullptr_t) {}
    template <class F, class D = std::decay_t<F>>
    requires(!std::is_same_v<D, function> && std::is_invocable_r_v<R, D&, A...>) function(F&& callable) {
        if constexpr (std::is_pointer_v<D>) {
            if (!callable) return;
        }
        if constexpr (kInside<D>) {
            ::new (static_cast<void*>(room_)) D(std::forward<F>(callable));
            operations_ = &Inside<D>::kOperations;
        } else {
            D* made = ::new (AllocateArray<D, Alloc>(1)) D(std::forward<F>(callable));
            ::new (static_cast<void*>(room_)) D*(made);
            operations_ = &Outside<D>::kOperations;
        }
    }
    function(function&& other) noexcept : operations_(std::exchange(other.operations_, nullptr)) {
        if (operations_) operations_->move(other.room_, room_);
    }
    function& operator=(function&& other) noexcept {
        if (this == &other) return *this;
        reset();
        operations_ = std::exchange(other.operations_, nullptr);
        if (operations_) operations_->move(other.room_, room_);
        return *this;
    }
    ~function() { reset(); }

    void reset() {
        if (auto* operations = std::exchange(operations_, nullptr)) operations->destroy(room_);
    }

    explicit operator bool() const { return operations_ != nullptr; }

    R operator()(A... args) const {
        if (operations_) [[likely]]
            return operations_->call(room_, std::forward<A>(args)...);
        if (g_on_empty_function_call) g_on_empty_function_call();
        return R();
    }

  private:
    const Operations* operations_ = nullptr;
    alignas(void*) mutable unsigned char room_[kRoom];
};

template <class Signature, class Alloc = std::allocator<std::byte>>
using Function = function<Signature, Alloc>;

}  // namespace qsl
