#include "display/paint_order.h"

#include <algorithm>

namespace qorvex::dsp {

using layout::LayoutNode;
using layout::Rect;

namespace {

bool PaintsBefore(const PaintEntry& a, const PaintEntry& b) {
    if (a.zIndex != b.zIndex) return a.zIndex < b.zIndex;
    if (a.layer != b.layer) return a.layer < b.layer;
    return a.order < b.order;
}

class Collector {
  public:
    Collector(std::span<const Rect> areas, bool runs, PaintList& out, layout::WorkCounters& counters)
        : areas_(areas), runs_(runs), out_(out), counters_(counters) {}

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
        const bool run = runs_ && !unit && !node.children.empty() && PaintsInTreeOrder(node);
        out_.push_back({&node, node.establishesStackingContext ? node.zIndex : 0, own, order_, run});
        if (!unit && !run) Walk(node, own);
    }

    std::span<const Rect> areas_;
    bool runs_;
    PaintList& out_;
    layout::WorkCounters& counters_;
    uint32_t order_ = 0;
};

void Collect(const LayoutNode& context, std::span<const Rect> areas, bool runs, PaintList& out,
             layout::WorkCounters& counters) {
    const uint32_t first = out.size();
    Collector(areas, runs, out, counters).Walk(context, 0);
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
