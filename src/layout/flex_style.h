// Writes computed style to a Yoga node. Yoga's setters compare before they write and mark dirty only on a
// change, which is what keeps its own caches alive.
#pragma once

#include "css/values/length_context.h"
#include "layout/layout_handle.h"

#include <array>

namespace qorvex::layout {

// All that a node's style in Yoga follows from, but for its position type and for pictures.
struct FlexStyleKey {
    const css::LayoutStyle* layout = nullptr;
    float em = 0;
    css::TextAlignType align{};
    friend bool operator==(const FlexStyleKey&, const FlexStyleKey&) = default;
};

struct FlexStyleContext {
    css::LengthContext lengths;  // em is set per node
    bool disableFlexBasisUnits = false;
    const LayoutHandle* root = nullptr;
    // Nodes that were written in this pass. Boxes of one kind share their style, and to copy what Yoga has of
    // it takes a third of writing it again.
    struct Written {
        FlexStyleKey key;
        YGNode* node = nullptr;
    };
    std::array<Written, 16> written{};
};

bool SyncStyleToYoga(LayoutHandle& handle, FlexStyleContext& context);

// Widths of the four borders in pixels; a side without a painting or counting style is 0.
Edges ResolveBorders(const css::LayoutStyle& style, const css::LengthContext& lengths);

}  // namespace qorvex::layout
