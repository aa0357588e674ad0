#include "qsl/mutex.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

namespace qsl {
namespace {

// More threads than processors, so that some are stopped while they hold the mutex and others must sleep.
constexpr int kThreads = 8;

template <class F>
void OnThreads(F work) {
    std::vector<std::thread> threads;
    for (int i = 0; i < kThreads; ++i)
        threads.emplace_back(work, i);
    for (std::thread& thread : threads)
        thread.join();
}

TEST(Mutex, KeepsOthersOut) {
    constexpr int kRounds = 2000;
    Mutex mutex;
    int count = 0;
    int inside = 0;
    OnThreads([&](int) {
        for (int i = 0; i < kRounds; ++i) {
            MutexLock lock(mutex);
            EXPECT_EQ(++inside, 1);
            // Some hold it for longer than the others spin.
            if (i % 64 == 0) std::this_thread::yield();
            ++count;
            --inside;
            if (i % 3) continue;
            lock.Unlock();
            lock.Lock();
            ++count;
        }
    });
    EXPECT_EQ(count, kThreads * (kRounds + (kRounds + 2) / 3));
}

// Each waits for the one before it: a wake-up that is lost stops the ring.
TEST(Condition, LosesNoSignal) {
    constexpr int kRounds = 200;
    Mutex mutex;
    Condition turn_changed;
    Condition own_turn[kThreads];
    for (const bool broadcast : {true, false}) {
        int turn = 0;
        OnThreads([&](int self) {
            Condition& awaited = broadcast ? turn_changed : own_turn[self];
            for (int round = 0; round < kRounds; ++round) {
                MutexLock lock(mutex);
                while (turn % kThreads != self)
                    awaited.Wait(lock);
                const int next = ++turn % kThreads;
                // Once with the lock held, once without.
                if (round % 2) lock.Unlock();
                broadcast ? turn_changed.Broadcast() : own_turn[next].Signal();
                if (round % 2) lock.Lock();
            }
        });
        EXPECT_EQ(turn, kThreads * kRounds);
    }
}

}  // namespace
}  // namespace qsl
