// Small results that cross from the layout side to a DOM node, as named tasks on the view's DOM channel.
//
// The data block is counted and immutable once sent. A call from the DOM thread itself (a synchronous
// measure) delivers at once instead of through the channel.
#pragma once

#include "layout/node_link.h"

#include <atomic>

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
};

// The name under which the task runs and is traced.
const char* DOMTaskName(DOMTaskKind kind);

// Base of every data block; the receiver knows the concrete type from the kind.
class DOMTaskData {
  public:
    DOMTaskData() = default;
    DOMTaskData(const DOMTaskData&) = delete;
    DOMTaskData& operator=(const DOMTaskData&) = delete;

    void AddRef() noexcept { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() noexcept {
        if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) Destroy();
    }

  protected:
    virtual ~DOMTaskData() = default;
    // Runs the destructor and gives the memory back under the tag it came from.
    virtual void Destroy() noexcept = 0;

  private:
    std::atomic<uint32_t> count_{0};
};

using DOMTaskDataPtr = qsl::RefPtr<DOMTaskData>;

enum class Delivery : uint8_t { ThroughChannel, AtOnce };

void SendToDOM(const TaskFamilyHandle& family, DOMTaskKind kind, NodeLinkPtr node, DOMTaskDataPtr data,
               Delivery delivery);

}  // namespace qorvex::layout
