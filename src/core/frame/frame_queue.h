// Frames of one view that wait for Paint, by id. Owned by the view, shared with its renderer.
//
// Invariant: every id that an Advance has taken is here, in ascending order, until Paint completes it or the
// queue is cleared. A null frame means that the id has (so far) nothing to draw. The mutex guards the array
// only: a frame never runs under it.
#pragma once

#include <atomic>

#include "core/frame/render_frame.h"
#include "core/limits.h"
#include "core/memory/containers.h"
#include "qsl/mutex.h"

namespace qorvex {

class FrameQueue {
  public:
    struct Entry {
        uint32_t id;
        RenderFramePtr frame;
    };

    // All the room it will ever need, so that a frame without work allocates nothing.
    FrameQueue() { entries_.reserve(limits::kMaxWaitingFrames); }

    // Main thread. When the queue is full, the oldest frame goes unpainted.
    void RegisterFrame(uint32_t id);
    // Main or layout thread. An id that is not there is ignored.
    void SetFrame(uint32_t id, const RenderFramePtr& frame);
    void ClearFrames();

    // Render thread. False when the id is not there.
    bool Find(uint32_t id, RenderFramePtr* frame) const;
    void Remove(uint32_t id);
    void DiscardAll();
    // Whether frames that had something to draw were lost because nobody painted; true once.
    bool TakeLoss() { return lost_.load(std::memory_order_relaxed) && lost_.exchange(false); }

    // How often the rendering resources were freed: grows on the render thread, read anywhere. It stands here
    // and not in the renderer because a renderer may go while the view looks.
    void CountReset() { resets_.fetch_add(1, std::memory_order_acq_rel); }
    uint32_t GetResets() const { return resets_.load(std::memory_order_acquire); }

  private:
    // Returns the position of the id, or the size.
    size_t IndexOf(uint32_t id) const QSL_REQUIRES(mutex_);

    std::atomic<uint32_t> resets_{0};
    std::atomic<bool> lost_{false};
    mutable qsl::Mutex mutex_;
    Vector<Entry, MemoryTag::Rendering> entries_ QSL_GUARDED_BY(mutex_);
};

}  // namespace qorvex
