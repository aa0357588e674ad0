#include "core/frame/frame_queue.h"

#include "core/logging/log.h"

namespace qorvex {

void FrameQueue::RegisterFrame(uint32_t id) {
    LogTrace("Registering frame for painting ", id);
    RenderFramePtr dropped;  // dies after the lock
    qsl::MutexLock lock(mutex_);
    // A client that never paints (a server, a minimised window) must not grow the queue for ever: the oldest
    // frame goes, and a later Paint of it finds it missing.
    if (entries_.size() >= limits::kMaxWaitingFrames) {
        dropped = std::move(entries_[0].frame);
        entries_.erase(entries_.begin());
        if (dropped && dropped->GetState() != RenderFrame::State::Discarded) lost_.store(true);
    }
    entries_.push_back(Entry{id, nullptr});
}

void FrameQueue::SetFrame(uint32_t id, const RenderFramePtr& frame) {
    LogTrace("Setting frame for painting ", id);
    qsl::MutexLock lock(mutex_);
    const size_t index = IndexOf(id);
    if (index < entries_.size()) entries_[index].frame = frame;
}

void FrameQueue::ClearFrames() {
    LogTrace("Clearing frames for painting");
    Vector<Entry, MemoryTag::Rendering> dropped;  // frames die after the lock
    dropped.reserve(limits::kMaxWaitingFrames);
    qsl::MutexLock lock(mutex_);
    dropped.swap(entries_);
}

bool FrameQueue::Find(uint32_t id, RenderFramePtr* frame) const {
    qsl::MutexLock lock(mutex_);
    const size_t index = IndexOf(id);
    if (index >= entries_.size()) return false;
    *frame = entries_[index].frame;
    return true;
}

void FrameQueue::Remove(uint32_t id) {
    RenderFramePtr dropped;
    qsl::MutexLock lock(mutex_);
    const size_t index = IndexOf(id);
    if (index >= entries_.size()) return;
    dropped = std::move(entries_[index].frame);
    entries_.erase(entries_.begin() + index);
}

void FrameQueue::DiscardAll() {
    qsl::MutexLock lock(mutex_);
    for (Entry& entry : entries_) {
        LogDebug("Trying to discard frame ", entry.id);
        if (!entry.frame) continue;
        entry.frame->Discard();
        LogTrace("Discarded frame ", entry.id);
    }
}

size_t FrameQueue::IndexOf(uint32_t id) const {
    size_t index = 0;
    while (index < entries_.size() && entries_[index].id != id)
        ++index;
    return index;
}

}  // namespace qorvex
