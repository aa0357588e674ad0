// What the last frames of one view cost, written by the threads that work on them. Off until somebody asks,
// and then a few clock reads a frame.
//
// Invariant: a slot belongs to the frame id it carries; stages of an older frame that was overtaken are
// dropped.
#pragma once

#include <qorvex/frame_stats.h>

#include <array>
#include <atomic>
#include <ctime>

#include "qsl/mutex.h"

namespace qorvex {

class FrameStatsRecorder {
  public:
    void SetEnabled(bool enabled) { enabled_.store(enabled, std::memory_order_relaxed); }
    bool IsEnabled() const { return enabled_.load(std::memory_order_relaxed); }

    void Begin(uint32_t frame_id);
    bool Get(uint32_t frame_id, FrameStats* out) const;

    // Runs `change` on the record of the frame, if it is still kept.
    template <class Change>
    void Update(uint32_t frame_id, Change change) {
        if (!IsEnabled()) return;
        qsl::MutexLock lock(mutex_);
        FrameStats& slot = slots_[frame_id % slots_.size()];
        if (slot.FrameId == frame_id) change(slot);
    }

  private:
    std::atomic<bool> enabled_{false};
    mutable qsl::Mutex mutex_;
    std::array<FrameStats, 8> slots_ QSL_GUARDED_BY(mutex_){};
};

// Adds the thread CPU time of a scope to one stage of a frame.
class StageTimer {
  public:
    StageTimer(FrameStatsRecorder& recorder, uint32_t frame_id, double FrameStats::*stage)
        : recorder_(recorder), stage_(stage), frame_id_(frame_id), on_(recorder.IsEnabled()) {
        if (on_) start_ = Now();
    }
    ~StageTimer() {
        if (!on_) return;
        const double spent = Now() - start_;
        recorder_.Update(frame_id_, [&](FrameStats& stats) { stats.*stage_ += spent; });
    }
    StageTimer(const StageTimer&) = delete;
    StageTimer& operator=(const StageTimer&) = delete;

  private:
    static double Now() {
        timespec time{};
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
        return static_cast<double>(time.tv_sec) * 1e3 + static_cast<double>(time.tv_nsec) * 1e-6;
    }

    FrameStatsRecorder& recorder_;
    double FrameStats::*stage_;
    uint32_t frame_id_;
    bool on_;
    double start_ = 0;
};

}  // namespace qorvex
