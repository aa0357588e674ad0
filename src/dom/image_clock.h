// The frames of the animated images of a document: one clock for each image, so that all its uses show the
// same frame, as of when the first of them came.
//
// Cost: nothing while no image is animated; one comparison for each animated image until its frame is over;
// an image of which no use is on screen is looked at once per frame of its own and tells nobody. Script
// thread.
#pragma once

#include "dom/image_loading.h"

namespace qorvex::dom {

class ImageClock {
  public:
    // Uses are counted. Gives the frame that shows now.
    uint32_t Add(uint32_t id, const ImageInfoPtr& info, Node& node);
    void Remove(uint32_t id, const Node& node);
    void Clear() { entries_.clear(); }

    // Milliseconds of the view's clock. Calls Node::OnImageFrame for what changes.
    void Advance(double time);

    uint32_t GetAnimatedImages() const { return entries_.size(); }

  private:
    struct Entry {
        uint32_t id = 0;
        uint32_t frame = 0;
        double frame_end = 0;
        ImageInfoPtr info;
        // With the number of their uses.
        HashMap<const Node*, uint32_t, MemoryTag::DOM> nodes;
    };
    Entry* Find(uint32_t id);
    // False when the frame stays.
    static bool Step(Entry& entry, double time);

    Vector<Entry, MemoryTag::DOM> entries_;
    double time_ = 0;
};

}  // namespace qorvex::dom
