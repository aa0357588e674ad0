#include "core/tasks/timer.h"

#include <string>

#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

class TimerTest : public test::QorvexTest {
  protected:
    struct NotingTimer : Timer {
        NotingTimer(std::string& log, std::string name) : log_(log), name_(std::move(name)) {}
        void Execute() override {
            log_ += name_;
            if (on_execute) on_execute();
        }
        void Cancel() override { log_ += "-" + name_; }
        std::function<void()> on_execute;
        std::string& log_;
        std::string name_;
    };
    RefPtr<NotingTimer> Make(const std::string& name) { return MakeRef<NotingTimer>(order_, name); }

    std::string order_;
    TimerQueue queue_;
};

TEST_F(TimerTest, RunsByDeadlineAndEqualOnesInTheOrderOfMaking) {
    queue_.Add(Make("c"), 20);
    queue_.Add(Make("a"), 10);
    queue_.Add(Make("b"), 10);
    queue_.Add(Make("d"), 30);
    queue_.Advance(25);
    EXPECT_EQ(order_, "a-ab-bc-c");
    queue_.Advance(29.9);
    queue_.Advance(30);
    EXPECT_EQ(order_, "a-ab-bc-cd-d");
    EXPECT_TRUE(queue_.empty());
}

TEST_F(TimerTest, RepeatsAfterThePresentWithoutCatchingUp) {
    auto timer = Make("r");
    queue_.Add(timer, 10, 10);
    for (double now : {10.0, 15.0, 19.9})
        queue_.Advance(now);
    EXPECT_EQ(order_, "r") << "on its very deadline the next one is a whole interval later";
    queue_.Advance(1005);
    queue_.Advance(1005);
    EXPECT_EQ(order_, "rr");
    queue_.Advance(1010);
    EXPECT_EQ(order_, "rrr");
}

struct LateClock final : ITimerClock {
    double GetTimerTime() const override { return time; }
    double time = 0;
};

TEST_F(TimerTest, MeasuresTheNextDeadlineByTheViewsClock) {
    LateClock clock;
    queue_.SetClock(&clock);
    queue_.Add(Make("r"), 10, 10);
    clock.time = 42;
    queue_.Advance(10);
    queue_.Advance(45);
    EXPECT_EQ(order_, "r");
    queue_.Advance(50);
    EXPECT_EQ(order_, "rr");
}

TEST_F(TimerTest, AddsFromInsideWaitForTheNextAdvance) {
    auto timer = Make("a");
    timer->on_execute = [&] { queue_.Add(Make("b"), 0); };
    queue_.Add(timer, 0);
    queue_.Advance(1);
    EXPECT_EQ(order_, "a-a");
    queue_.Advance(1);
    EXPECT_EQ(order_, "a-ab-b");
}

TEST_F(TimerTest, CancelsBeforeInsideAndAllAtOnce) {
    auto self = Make("s");
    auto other = Make("o");
    auto pending = Make("p");
    self->on_execute = [&] {
        queue_.Cancel(*self);
        queue_.Cancel(*other);
    };
    queue_.Add(self, 5, 5);
    queue_.Add(other, 6, 5);
    queue_.Add(pending, 7);
    queue_.Cancel(*pending);
    queue_.Cancel(*pending);
    queue_.Advance(10);
    EXPECT_EQ(order_, "-ps-s-o");
    EXPECT_FALSE(self->IsScheduled());
    queue_.Advance(100);
    EXPECT_TRUE(queue_.empty());

    order_.clear();
    auto last = Make("l");
    last->on_execute = [&] { queue_.CancelAll(); };
    queue_.Add(last, 1, 1);
    queue_.Add(Make("m"), 2);
    queue_.Advance(200);
    EXPECT_EQ(order_, "l-l-m");
    EXPECT_TRUE(queue_.empty());
}

TEST_F(TimerTest, RunsAOneShotAgainWhenItAsks) {
    auto timer = Make("a");
    timer->on_execute = [&] {
        if (order_ == "a") timer->RunAgainAt(50);
    };
    queue_.Add(timer, 1);
    queue_.Advance(2);
    queue_.Advance(49);
    EXPECT_EQ(order_, "a");
    queue_.Advance(50);
    EXPECT_EQ(order_, "aa-a");
}

TEST_F(TimerTest, RefusesATimerThatIsScheduledAlready) {
    auto timer = Make("a");
    queue_.Add(timer, 1);
    queue_.Add(timer, 2);
    EXPECT_EQ(log_.CountSeverity(Logging::Assert), 1u);
    EXPECT_EQ(queue_.size(), 1u);
}

}  // namespace
}  // namespace qorvex
