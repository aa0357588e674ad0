#include "css/style/sibling_memo.h"

#include "core/limits.h"
#include "dom/node.h"

namespace qorvex::css {
namespace {

// Depths that scripts reach beyond this share their places.
constexpr uint32_t kDepths = 1024;

}  // namespace

void SiblingMemo::BeginPass() {
    ++pass_;
    constexpr size_t kOrdinary = 4096;
    if (scans_.size() > kOrdinary) scans_ = {};
}

SiblingMemo::Scan& SiblingMemo::Find(const void* part, const dom::Node& parent) {
    // Too many at once come to nothing but more walks.
    if (scans_.size() >= limits::kSiblingScans) scans_.clear();
    const auto depth = static_cast<uint16_t>(parent.GetDepth());
    Scan& scan = scans_[(reinterpret_cast<uintptr_t>(part) << 16) ^ depth];
    if (scan.part != part || scan.parent != &parent || scan.pass != pass_) scan = {part, &parent, pass_};
    return scan;
}

uint32_t SiblingMemo::IndexOf(const dom::Node& child) {
    const dom::Node& parent = *child.GetParent();
    const uint32_t depth = static_cast<uint32_t>(parent.GetDepth()) % kDepths;
    if (depth >= places_.size()) places_.resize(depth + 1);
    Place& place = places_[depth];
    if (place.parent != &parent || place.pass != pass_) place = {&parent, pass_, 0};
    const auto children = parent.GetChildren();
    // Both ways at once, so that the cost is the distance.
    for (size_t up = place.index, down = place.index;; ++up, --down) {
        ++steps_;
        if (up < children.size() && children[up].get() == &child) {
            place.index = static_cast<uint32_t>(up);
            break;
        }
        if (down < children.size() && children[down].get() == &child) {
            place.index = static_cast<uint32_t>(down);
            break;
        }
    }
    return place.index;
}

}  // namespace qorvex::css
