#include "display/paint_order.h"

#include <algorithm>
#include <cmath>

namespace qorvex::dsp {

using layout::LayoutNode;
using layout::Rect;

namespace {

// How near to the eye the middle of a box is, in steps finer than can be seen. Under one perspective the
// order of these is that of the projected depths.
int32_t DepthOf(const LayoutNode& node) {
    const float* m = node.world.Get().m;
    const float x = node.box.x + node.box.width / 2, y = node.box.y + node.box.height / 2;
    const float depth = (m[2] * x + m[6] * y + m[14]) * 16;
    constexpr float kFarthest = 1e9f;
    return std::isfinite(depth) ? static_cast<int32_t>(std::clamp(depth, -kFarthest, kFarthest)) : 0;
}

bool PaintsBefore(const PaintEntry& a, const PaintEntry& b) {
    if (a.depth != b.depth) return a.depth < b.depth;
    if (a.zIndex != b.zIndex) return a.zIndex < b.zIndex;
    if (a.layer != b.layer) return a.layer < b.layer;
    return a.order < b.order;
}

class Collector {
  public:
    Collector(const LayoutNode& context, std::span<const Rect> areas, bool runs, PaintList& out,
              layout::WorkCounters& counters)
        : areas_(areas),
          runs_(runs),
          out_(out),
          counters_(counters),
          inSpace_(context.flags.preserves3d),
          planeDepth_(inSpace_ ? DepthOf(context) : 0) {}

    // Depth first, in tree order. Recursion ends at contexts and clips, and at the depth limit.
    void Walk(const LayoutNode& parent, uint32_t layer) {
        ForEachChild(parent, areas_, [&](const LayoutNode& child) { Take(child, layer); });
    }

  private:
    void Take(const LayoutNode& node, uint32_t layer) {
        ++order_;
        if (node.IsBeyondLimit()) return;
        ++counters_.visited;
        if (!TouchesAny(areas_, node.visualAabb)) return;
        const bool positioned = node.flags.isPositioned || node.establishesStackingContext;
        const uint32_t own = positioned ? order_ : layer;
        const bool unit = PaintsAsUnit(node);
        const bool run = runs_ && !unit && !node.Children().empty() && PaintsInTreeOrder(node);
        // What has no transform lies in the plane of the context.
        const int32_t depth = !inSpace_ ? 0 : node.Local() ? DepthOf(node) : planeDepth_;
        out_.push_back({&node, node.establishesStackingContext ? node.ZIndex() : 0, own, order_, depth, run});
        if (!unit && !run) Walk(node, own);
    }

    std::span<const Rect> areas_;
    bool runs_;
    PaintList& out_;
    layout::WorkCounters& counters_;
    bool inSpace_;
    int32_t planeDepth_;
    uint32_t order_ = 0;
};

void Collect(const LayoutNode& context, std::span<const Rect> areas, bool runs, PaintList& out,
             layout::WorkCounters& counters) {
    const uint32_t first = out.size();
    Collector(context, areas, runs, out, counters).Walk(context, 0);
    // Most lists were found in their order.
    if (!std::is_sorted(out.begin() + first, out.end(), PaintsBefore))
        std::sort(out.begin() + first, out.end(), PaintsBefore);
}

}  // namespace

void CollectPaintOrder(const LayoutNode& context, std::span<const Rect> areas, PaintList& out,
                       layout::WorkCounters& counters) {
    Collect(context, areas, false, out, counters);
}

void CollectPaintRuns(const LayoutNode& context, std::span<const Rect> areas, PaintList& out,
                      layout::WorkCounters& counters) {
    Collect(context, areas, true, out, counters);
}

}  // namespace qorvex::dsp
