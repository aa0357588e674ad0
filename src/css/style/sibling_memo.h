// What one pass of matching has found out about siblings, so that matching all children of a parent looks at
// each of them a fixed number of times however many there are.
//
// Notes are kept per depth, one parent each: a pass goes through the tree in order, level by level or branch
// by branch, and so is done with the children of one parent before it needs those of another as deep. In any
// other order the answers are the same and cost more.
//
// Invariant: notes are good for one pass, in which neither the tree nor what selectors ask of it changes.
#pragma once

#include <cstdint>

#include "css/values/css_containers.h"

namespace qorvex::dom {
class Node;
}

namespace qorvex::css {

class SiblingMemo {
  public:
    static constexpr uint32_t kNowhere = UINT32_MAX;

    // Of the children before `scannedTo` the one at `match` is the nearest that a selector part asks for;
    // `runStart` is the leftmost element that the part needs there. Both are kNowhere if there is none.
    struct Scan {
        const void* part = nullptr;
        const dom::Node* parent = nullptr;
        uint64_t pass = 0;
        uint32_t scannedTo = 0;
        uint32_t match = kNowhere;
        uint32_t runStart = kNowhere;
    };

    // Forgets what the last pass noted; the memory is kept within reason.
    void BeginPass();
    // The note for this part of a selector and these children, empty if there was none. Borrowed until the
    // next call.
    Scan& Find(const void* part, const dom::Node& parent);
    // Where the child stands, searched from where the last one of this parent was found.
    uint32_t IndexOf(const dom::Node& child);

    void CountStep() { ++steps_; }
    // Children looked at since the memo was made.
    uint64_t GetSteps() const { return steps_; }

  private:
    struct Place {
        const dom::Node* parent = nullptr;
        uint64_t pass = 0;
        uint32_t index = 0;
    };

    CssHashMap<uint64_t, Scan> scans_;
    CssVector<Place> places_;  // by depth
    uint64_t pass_ = 0;
    uint64_t steps_ = 0;
};

}  // namespace qorvex::css
