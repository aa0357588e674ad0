#include "core/debug/frame_stats_recorder.h"

namespace qorvex {

void FrameStatsRecorder::Begin(uint32_t frame_id) {
    if (!IsEnabled()) return;
    qsl::MutexLock lock(mutex_);
    FrameStats& slot = slots_[frame_id % slots_.size()];
    slot = FrameStats();
    slot.FrameId = frame_id;
}

bool FrameStatsRecorder::Get(uint32_t frame_id, FrameStats* out) const {
    qsl::MutexLock lock(mutex_);
    const FrameStats& slot = slots_[frame_id % slots_.size()];
    if (slot.FrameId != frame_id) return false;
    *out = slot;
    return true;
}

}  // namespace qorvex
