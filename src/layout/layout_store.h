// Where the handles of one tree live, and what their layout side shares. Counted: it outlives the tree while
// any handle lives, so that a released handle always has pools to return to.
//
// A handle may be released by the last task of a frame on any thread, so the pools take a lock. Everything
// else here belongs to the layout thread.
#pragma once

#include "layout/layout_handle.h"
#include "layout/object_pool.h"
#include "layout/text/text_services.h"

#include <mutex>

struct YGConfig;

namespace qorvex::layout {

class LayoutStore : public AtomicRefCounted<LayoutStore, MemoryTag::LayoutNodes> {
  public:
    LayoutStore();
    ~LayoutStore();

    HandlePtr MakeHandle();
    void Destroy(LayoutHandle* handle) noexcept;

    // What the last layout resolved viewport units and rem against; a difference makes every style be written
    // anew.
    struct Metrics {
        uint32_t viewWidth = 0;
        uint32_t viewHeight = 0;
        float rem = 0;
        friend bool operator==(const Metrics&, const Metrics&) = default;
    };
    Metrics metrics;
    // Set by the document before the first layout.
    TextServices text;
    // Some paragraph of the tree flows its children; never taken back.
    bool flowsText = false;
    // The warning about the depth limit is given once a tree.
    bool reportedDepth = false;
    // The engine of the last layout; the other one's inputs are stale.
    enum class Engine : uint8_t { None, Flex, Simple };
    Engine engine = Engine::None;

  private:
    YGNode* MakeFlexNode(LayoutHandle* handle);
    void RecycleFlexNode(YGNode* node);

    std::mutex mutex_;
    ObjectPool<LayoutData> data_pool_;
    ObjectPool<LayoutNode> node_pool_;
    Vector<YGNode*, MemoryTag::LayoutNodes> free_flex_nodes_;
    YGConfig* config_;
};

}  // namespace qorvex::layout
