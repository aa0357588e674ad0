// Callbacks in the order of their deadlines. Timers belong to one thread, the main one; deadlines, intervals
// and `now` are on the time base that the client gives to Advance.
//
// Invariants: `active_` is a heap by deadline and, for equal ones, by the order of making; a timer without an
// owner is retired and runs no more; timers that are added while others run wait for the next Advance.
#pragma once

#include <type_traits>
#include <utility>

#include "core/memory/containers.h"

namespace qorvex {

class TimerQueue;

/// Counted, since both its maker and the queue hold it.
class Timer : public AtomicRefCounted<Timer, MemoryTag::General> {
  public:
    Timer() = default;
    virtual ~Timer() = default;
    virtual void Execute() = 0;
    /// The queue has retired the timer; called once.
    virtual void Cancel() {}

    bool IsScheduled() const { return owner_ != nullptr; }
    /// From inside Execute: run a one-shot timer once more, at this time.
    void RunAgainAt(double deadline) { delay_ = deadline; }

  private:
    friend class TimerQueue;
    TimerQueue* owner_ = nullptr;
    double delay_ = 0;
    double interval_ = 0;
};

using TimerPtr = RefPtr<Timer>;

template <class F>
class TimerFunc final : public Timer {
  public:
    explicit TimerFunc(F function) : function_(std::move(function)) {}
    void Execute() override { function_(); }

  private:
    F function_;
};

template <class F>
[[nodiscard]] TimerPtr MakeTimer(F&& function) {
    return MakeRef<TimerFunc<std::decay_t<F>>>(std::forward<F>(function));
}

/// Tells a queue the present time, which may be later than that of the Advance under way.
class ITimerClock {
  public:
    virtual double GetTimerTime() const = 0;

  protected:
    ~ITimerClock() = default;
};

class TimerQueue {
  public:
    TimerQueue() = default;
    ~TimerQueue() { CancelAll(); }
    TimerQueue(const TimerQueue&) = delete;
    TimerQueue& operator=(const TimerQueue&) = delete;

    /// The clock of the view whose time counts; null: the time of the Advance under way.
    void SetClock(const ITimerClock* clock) { clock_ = clock; }

    /// A timer is added once. An interval of 0 makes it run once.
    void Add(TimerPtr timer, double deadline, double interval = 0);
    /// Retires the timer, also while it runs; one of another queue is left alone.
    void Cancel(Timer& timer);
    void CancelAll();

    /// Runs what is due.
    void Advance(double now);

    size_t size() const { return active_.size() + pending_.size(); }
    bool empty() const { return size() == 0; }

  private:
    struct Entry {
        using TriviallyRelocatable = Entry;
        double deadline;
        uint64_t sequence;
        TimerPtr timer;
    };
    static bool Later(const Entry& a, const Entry& b) {
        return a.deadline != b.deadline ? a.deadline > b.deadline : a.sequence > b.sequence;
    }

    void DropCancelled();
    void TakePending();
    void RunFirst(double now);
    double NextDeadline(double deadline, double interval, double now) const;
    void Retire(Timer& timer);

    Vector<Entry> active_;
    Vector<Entry> pending_;
    /// Some entry's timer has no owner any more.
    bool has_cancelled_ = false;
    bool running_ = false;
    Timer* executing_ = nullptr;
    const ITimerClock* clock_ = nullptr;
    uint64_t next_sequence_ = 0;
};

}  // namespace qorvex
