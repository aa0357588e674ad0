#pragma once

#include <atomic>
#include <cstdint>

namespace qorvex::host {

// A clock that moves only when it is told to, for tests and repeatable runs: give Read to
// ViewSettings::GetCurrentTime with the clock as user data, and Now() to Advance. Milliseconds. Set on one
// thread, read on any.
class ManualClock {
  public:
    explicit ManualClock(double now = 0) : now_(now) {}

    [[nodiscard]] double Now() const { return now_.load(std::memory_order_relaxed); }
    void Set(double now) { now_.store(now, std::memory_order_relaxed); }
    // Returns the new time. A negative step goes back.
    double Step(double milliseconds) {
        Set(Now() + milliseconds);
        return Now();
    }

    static double Read(void* clock, std::uint32_t) { return static_cast<const ManualClock*>(clock)->Now(); }

  private:
    std::atomic<double> now_;
};

}  // namespace qorvex::host
