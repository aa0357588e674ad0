// What a view and its renderers share. Counted, so that they may be destroyed in either order: a renderer
// that outlives its view finds an empty queue, and the scene goes with the last of them.
//
// Invariant: a frame runs only through a renderer, which holds the link; so what a frame borrows from here
// (the scene, the recorder) is alive while it runs.
#pragma once

#include <fresco/scene.h>

#include <atomic>

#include "core/debug/frame_stats_recorder.h"
#include "core/frame/frame_queue.h"

namespace qorvex {

class RenderLink : public AtomicRefCounted<RenderLink, MemoryTag::Rendering> {
  public:
    // Takes the scene over; null when the rendering library has refused one.
    explicit RenderLink(fresco::IScene* scene) : scene_(scene) {}
    ~RenderLink() {
        if (scene_) scene_->Destroy();
    }

    fresco::IScene* GetScene() const { return scene_; }
    FrameQueue& GetFrames() { return frames_; }
    FrameStatsRecorder& GetStats() { return stats_; }

    // Render thread, read anywhere.
    void CountRenderer(int change) {
        renderers_.fetch_add(static_cast<uint32_t>(change), std::memory_order_acq_rel);
    }
    bool HasRenderer() const { return renderers_.load(std::memory_order_acquire) != 0; }

  private:
    fresco::IScene* scene_;
    FrameStatsRecorder stats_;
    FrameQueue frames_;
    std::atomic<uint32_t> renderers_{0};
};

}  // namespace qorvex
