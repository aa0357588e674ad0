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

    // The target lacks what frames that never ran would have drawn on it: the view is to draw all of itself.
    // Asked on the render thread, taken on the main thread.
    void AskForRedraw() { redraw_.store(true, std::memory_order_release); }
    bool TakeRedraw() {
        return redraw_.load(std::memory_order_relaxed) && redraw_.exchange(false, std::memory_order_acquire);
    }

    using SurfaceList = Vector<fresco::SurfaceId, MemoryTag::Rendering>;
    // Surfaces that a frame which never ran was to free; the next one that runs does. Any thread.
    void LeaveSurfaces(const SurfaceList& surfaces) QSL_EXCLUDES(mutex_) {
        qsl::MutexLock lock(mutex_);
        for (fresco::SurfaceId surface : surfaces)
            left_surfaces_.push_back(surface);
    }
    SurfaceList TakeLeftSurfaces() QSL_EXCLUDES(mutex_) {
        qsl::MutexLock lock(mutex_);
        return std::exchange(left_surfaces_, {});
    }

  private:
    fresco::IScene* scene_;
    FrameStatsRecorder stats_;
    std::atomic<uint32_t> renderers_{0};
    std::atomic<bool> redraw_{false};
    qsl::Mutex mutex_;
    SurfaceList left_surfaces_ QSL_GUARDED_BY(mutex_);
    FrameQueue frames_;  // goes first: frames that never ran leave their surfaces above
};

}  // namespace qorvex
