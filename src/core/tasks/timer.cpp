#include "core/tasks/timer.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "core/logging/log.h"

namespace qorvex {
namespace {

/// Below this an interval or a delay counts as none.
constexpr double kTimeTolerance = 0.000001;

}  // namespace

void TimerQueue::Add(TimerPtr timer, double deadline, double interval) {
    if (!timer || timer->owner_) {
        AssertFailure("A timer can be scheduled only once!");
        return;
    }
    timer->owner_ = this;
    timer->interval_ = interval;
    pending_.push_back(Entry{deadline, next_sequence_++, std::move(timer)});
}

void TimerQueue::Cancel(Timer& timer) {
    if (timer.owner_ != this) return;
    // Its entry goes with the next Advance, which sweeps once for all timers that were cancelled since the
    // last.
    has_cancelled_ = true;
    Retire(timer);
}

void TimerQueue::Retire(Timer& timer) {
    timer.owner_ = nullptr;
    timer.Cancel();
}

void TimerQueue::CancelAll() {
    // Cancelling may drop the last reference of things that look at this queue.
    Vector<Entry> lists[2];
    lists[0].swap(active_);
    lists[1].swap(pending_);
    has_cancelled_ = false;
    if (executing_ && executing_->owner_ == this) Retire(*executing_);
    for (Vector<Entry>& list : lists)
        for (Entry& entry : list)
            if (entry.timer->owner_ == this) Retire(*entry.timer);
}

void TimerQueue::Advance(double now) {
    // A timer that advances its own queue would run its fellows inside itself.
    if (running_) return;
    DropCancelled();
    TakePending();
    running_ = true;
    while (!active_.empty() && active_.front().deadline <= now)
        RunFirst(now);
    running_ = false;
}

void TimerQueue::DropCancelled() {
    if (!has_cancelled_) return;
    has_cancelled_ = false;
    const auto retired = [](const Entry& entry) { return !entry.timer->IsScheduled(); };
    pending_.erase_if(retired);
    if (active_.erase_if(retired)) std::make_heap(active_.begin(), active_.end(), Later);
}

void TimerQueue::TakePending() {
    active_.reserve(active_.size() + pending_.size());
    for (Entry& entry : pending_) {
        active_.push_back(std::move(entry));
        std::push_heap(active_.begin(), active_.end(), Later);
    }
    pending_.clear();
}

void TimerQueue::RunFirst(double now) {
    std::pop_heap(active_.begin(), active_.end(), Later);
    Entry entry = active_.take_back();
    Timer& timer = *entry.timer;
    if (!timer.owner_) return;
    executing_ = &timer;
    timer.Execute();
    executing_ = nullptr;
    if (timer.owner_ != this) return;

    if (std::abs(timer.interval_) > kTimeTolerance) {
        entry.deadline = NextDeadline(entry.deadline, timer.interval_, now);
    } else if (timer.delay_ > kTimeTolerance) {
        entry.deadline = std::exchange(timer.delay_, 0);
    } else {
        Retire(timer);
        return;
    }
    pending_.push_back(std::move(entry));
}

double TimerQueue::NextDeadline(double deadline, double interval, double now) const {
    const double present = clock_ ? clock_->GetTimerTime() : now;
    double next = deadline + std::ceil((present - deadline) / interval) * interval;
    // On the very deadline, or where rounding eats the step, the formula stands still; the timer must not.
    if (!(next > present)) next += std::abs(interval);
    if (!(next > present)) next = std::nextafter(present, std::numeric_limits<double>::infinity());
    return next;
}

}  // namespace qorvex
