// Small results that cross from the layout side to a DOM node, as named tasks on the view's DOM channel.
//
// The data block is counted and immutable once sent. A call from the DOM thread itself (a synchronous
// measure) delivers at once instead of through the channel.
#pragma once

#include "core/memory/ref_counted.h"
#include "layout/node_link.h"

namespace qorvex {
struct TaskFamilyHandle;
}

namespace qorvex::layout {

enum class DOMTaskKind : uint8_t {
    UpdateTextRunsInDOM,
    UpdateTextPositionsInDOM,
    UpdateFontStyleDataInDOM,
    UpdateTextAlignmentInDOM,
    UpdateScrollPositionInDOM,
    UpdateDirtyHighlightRect,
    FontArrived,  // delivered at once, from the DOM thread: a font that the node's style waited for
};

// The name under which the task runs and is traced.
const char* DOMTaskName(DOMTaskKind kind);

// Base of every data block; the receiver knows the concrete type from the kind.
class DOMTaskData : public AtomicRefCounted<DOMTaskData, MemoryTag::LayoutData> {
  public:
    virtual ~DOMTaskData() = default;
};

using DOMTaskDataPtr = qsl::RefPtr<DOMTaskData>;

enum class Delivery : uint8_t { ThroughChannel, AtOnce };

void SendToDOM(const TaskFamilyHandle& family, DOMTaskKind kind, NodeLinkPtr node, DOMTaskDataPtr data,
               Delivery delivery);

}  // namespace qorvex::layout
