// The weak link by which the layout side and tasks know a node: it outlives the node and reads null after it.
#pragma once

#include <atomic>

#include "core/memory/pool.h"
#include "layout/node_link.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class Node;

// Counted from any thread; everything else on the script thread.
class NodeLink final : public layout::INodeLink, public MTPoolObject<NodeLink, MemoryTag::DOM, 64> {
  public:
    explicit NodeLink(Node& node) : node_(&node) {}

    Node* GetNode() const { return node_; }
    // The node is dying.
    void Cut() { node_ = nullptr; }

    void AddRef() noexcept override { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() noexcept override;
    void SetInLayoutTree(bool in_tree) override;
    std::string_view DebugName() const override;
    void Receive(layout::DOMTaskKind kind, const layout::DOMTaskData& data) override;

  private:
    std::atomic<uint32_t> count_{1};
    Node* node_;
};

}  // namespace qorvex::dom
