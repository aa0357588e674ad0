#include "dom/image_clock.h"

#include <cmath>

#include "dom/document.h"
#include "dom/document_host.h"

namespace qorvex::dom {

namespace {

bool IsOnScreen(const Node& node) {
    const layout::BoxResult* box = node.GetBoxResult();
    if (!box || node.GetLaidOutStyle().visual->visibility != css::Visibility::Visible) return false;
    const HostSize view = node.GetDocument()->GetHost().GetViewSize();
    const layout::Rect& seen = box->visualAabb;
    return seen.width > 0 && seen.height > 0 && seen.x < static_cast<float>(view.width) &&
           seen.y < static_cast<float>(view.height) && layout::Right(seen) > 0 && layout::Bottom(seen) > 0;
}

}  // namespace

ImageClock::Entry* ImageClock::Find(uint32_t id) {
    for (Entry& entry : entries_)
        if (entry.id == id) return &entry;
    return nullptr;
}

uint32_t ImageClock::Add(uint32_t id, const ImageInfoPtr& info, Node& node) {
    Entry* entry = Find(id);
    if (!entry) {
        entries_.push_back(Entry{id, 0, time_ + info->frames[0].duration, info, {}});
        entry = &entries_[entries_.size() - 1];
    } else if (entry->info != info) {
        // Loaded again: it starts again.
        entry->info = info;
        entry->frame = 0;
        entry->frame_end = time_ + info->frames[0].duration;
    }
    ++entry->nodes[&node];
    return entry->frame;
}

void ImageClock::Remove(uint32_t id, const Node& node) {
    Entry* entry = Find(id);
    uint32_t* uses = entry ? entry->nodes.get(&node) : nullptr;
    if (!uses || --*uses > 0) return;
    entry->nodes.erase(&node);
    if (entry->nodes.empty()) entries_.erase_if([&](const Entry& other) { return other.id == id; });
}

bool ImageClock::Step(Entry& entry, double time) {
    if (time < entry.frame_end) return false;
    const auto& frames = entry.info->frames;
    const uint32_t before = entry.frame;
    double total = 0;
    for (const ImageFrame& frame : frames)
        total += frame.duration;
    // A view that slept skips whole rounds at once.
    entry.frame_end += std::floor((time - entry.frame_end) / total) * total;
    while (time >= entry.frame_end) {
        entry.frame = (entry.frame + 1) % frames.size();
        entry.frame_end += frames[entry.frame].duration;
    }
    return entry.frame != before;
}

void ImageClock::Advance(double time) {
    time_ = time;
    for (Entry& entry : entries_) {
        if (!Step(entry, time)) continue;
        // Who is off screen takes the frame too, to be right when it comes into sight.
        for (auto& [node, uses] : entry.nodes)
            const_cast<Node*>(node)->OnImageFrame(entry.id, entry.frame, IsOnScreen(*node));
    }
}

}  // namespace qorvex::dom
