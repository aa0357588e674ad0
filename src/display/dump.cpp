#include "display/dump.h"

#include "css/values/style_groups.h"
#include "display/paint_order.h"

#include <cstdio>

namespace qorvex::dsp {

using layout::LayoutHandle;
using layout::LayoutNode;

namespace {

void AppendLine(DumpText& out, uint32_t depth, const LayoutNode& node, bool withZ) {
    char line[256];
    const int length =
        std::snprintf(line, sizeof(line), "%*s%s (%g, %g) %gx%g%s%s%s", static_cast<int>(depth * 2), "",
                      css::KeywordText(node.style->layout->display).data(), node.box.x, node.box.y,
                      node.box.width, node.box.height, node.flags.measuredByDisplayElement ? " measured" : "",
                      node.flags.isFixed        ? " fixed"
                      : node.flags.isAbsolute   ? " absolute"
                      : node.flags.isPositioned ? " relative"
                                                : "",
                      node.flags.shouldOverflowClip ? " clip" : "");
    out.append(std::string_view(line, static_cast<size_t>(std::min<int>(length, sizeof(line) - 1))));
    if (node.establishesStackingContext) {
        const int extra = withZ ? std::snprintf(line, sizeof(line), " context z=%d", node.ZIndex())
                                : std::snprintf(line, sizeof(line), " context");
        out.append(std::string_view(line, static_cast<size_t>(extra)));
    }
    out.append(std::string_view("\n"));
}

struct Pending {
    const LayoutNode* node;
    uint32_t depth;
};

}  // namespace

DumpText DumpLayoutTree(const LayoutHandle& root) {
    DumpText out;
    const TempMark mark;
    TempVector<Pending> stack;
    stack.push_back({&root.node(), 0});
    while (!stack.empty()) {
        const Pending at = stack.back();
        stack.pop_back();
        AppendLine(out, at.depth, *at.node, true);
        const layout::HandleSpan children = at.node->Children();
        for (size_t i = children.size(); i-- > 0;)
            stack.push_back({&children[i]->node(), at.depth + 1});
    }
    return out;
}

// Contexts nest at most as deep as layout does, but a list per level is open at a time only here, so the walk
// keeps its own stack: the entries of a context in reverse paint order.
DumpText DumpStackingContexts(const LayoutHandle& root) {
    DumpText out;
    layout::WorkCounters ignored;
    const TempMark mark;
    TempVector<Pending> stack;
    PaintList list;
    stack.push_back({&root.node(), 0});
    while (!stack.empty()) {
        const Pending at = stack.back();
        stack.pop_back();
        AppendLine(out, at.depth, *at.node, true);
        if (at.depth != 0 && !PaintsAsUnit(*at.node)) continue;
        list.clear();
        CollectPaintOrder(*at.node, {}, list, ignored);
        for (uint32_t i = list.size(); i-- > 0;)
            stack.push_back({list[i].node, at.depth + 1});
    }
    return out;
}

}  // namespace qorvex::dsp
