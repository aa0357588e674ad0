// The 32 flag bits of a node. Values are fixed: masks over them decide what may be a parent or a child.
#pragma once

#include <cstdint>

namespace qorvex::dom {

enum NodeFlags : uint32_t {
    kIsElement = 0x1,
    kIsDocument = 0x2,
    kDisplayable = 0x4,  // may produce a display element
    kInDocument = 0x8,   // connected to the document
    kIsText = 0x10,
    kIsLink = 0x20,
    kIsUpgradedCustom = 0x40,  // a custom element with a definition
    kIsFragment = 0x80,
    kHasId = 0x100,
    kIsComment = 0x200,
    kHasClasses = 0x400,
    kIsAttr = 0x800,
    kIsDocumentType = 0x1000,
    kIsFormControl = 0x2000,
    kIsDataBindElement = 0x4000,
    kInLayoutTree = 0x8000,   // the layout handle is linked
    kBeingRemoved = 0x10000,  // set around a removal notification
};

constexpr uint32_t kParentMask = kIsElement | kIsDocument | kIsFragment;
constexpr uint32_t kChildMask = kIsElement | kIsText | kIsFragment | kIsComment | kIsDataBindElement;

// Bits of Node::pendingStyleBits.
enum PendingStyleBits : uint16_t {
    kGathered = 1,           // seen by the gather walk that runs now
    kQueuedForMatching = 2,  // already queued for a restyle in this invalidation walk
    kHoverDependent = 4,     // some rule of the element depends on :hover
    kActiveFocusDependent = 8,
    kHoverDependentQueued = 16,  // twins of the two above, set while the element is queued
    kActiveFocusDependentQueued = 32,
};

}  // namespace qorvex::dom
