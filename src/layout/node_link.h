// How the layout side knows a DOM node: a counted control block that outlives the node.
//
// The layout side never touches a DOM node. It holds links, and what it has to tell a node travels as a named
// task (dom_tasks.h) that ends in Receive on the DOM thread. When the node is gone, every operation does
// nothing. Counting is atomic; all other operations belong to the DOM thread.
#pragma once

#include "qsl/ref_ptr.h"

#include <cstdint>
#include <string_view>

namespace qorvex::layout {

enum class DOMTaskKind : uint8_t;
class DOMTaskData;

class INodeLink {
  public:
    virtual void AddRef() noexcept = 0;
    virtual void Release() noexcept = 0;

    // Mirrors "a handle is part of the live tree" into the node.
    virtual void SetInLayoutTree(bool inTree) = 0;
    // For diagnostics; empty when the node is gone.
    virtual std::string_view DebugName() const = 0;
    // A result of the layout side; data is valid for the call only unless the node keeps a reference.
    virtual void Receive(DOMTaskKind kind, const DOMTaskData& data) = 0;

  protected:
    ~INodeLink() = default;
};

using NodeLinkPtr = qsl::RefPtr<INodeLink>;

}  // namespace qorvex::layout
