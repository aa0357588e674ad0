// Where the handles of one tree live, and what their layout side shares. Counted: it outlives the tree while
// any handle lives, so that a released handle always has a pool to return to.
//
// A handle may be released by the last task of a frame on any thread, so the pool takes a lock. Everything
// else here belongs to the layout thread.
#pragma once

#include "css/values/shared_style.h"
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

    HandlePtr MakeHandle(bool isBox);
    void Destroy(LayoutHandle* handle) noexcept;
    // Yoga's node is larger than all else that a handle has, so it is made when Yoga first has to lay the
    // node out, and given back when it has not any more.
    void MakeFlexNode(LayoutHandle& handle);
    void FreeFlexNode(LayoutNode& node) noexcept;

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
    // As of the last transform pass.
    bool snapsToPixels = true;
    // The warning about the depth limit is given once a tree.
    bool reportedDepth = false;
    EdgesCache recentEdges;
    css::SharedStyles textStyles;
    // Yoga has nodes whose style was never written.
    bool flexStylesMissing = false;
    // The engine of the last layout; the other one's inputs are stale.
    enum class Engine : uint8_t { None, Flex, Simple };
    Engine engine = Engine::None;

  private:
    std::mutex mutex_;
    ObjectPool<LayoutHandle> texts_;
    ObjectPool<BoxHandle> boxes_;
    YGConfig* config_;
};

}  // namespace qorvex::layout
