// Reads Yoga's results back into the boxes of layout nodes.
#pragma once

#include "layout/perform_layout.h"

namespace qorvex::layout {

// Walks from `root` into whatever Yoga laid out anew or a moved containing block carries along. `rootOrigin`
// is the document position of the root's own origin; `everything` visits all nodes.
struct FlexReadRoot {
    LayoutHandle* handle = nullptr;
    LayoutHandle* fixedContainer = nullptr;
    Point origin;
    bool everything = false;
};
void ReadYogaResults(const FlexReadRoot& root, LayoutPass& pass);

// What both engines do with a node whose box has been computed: sets the change marks and enters the handle
// in the frame's lists.
struct OldBox {
    Rect box;
    Edges border;
    Edges padding;
    explicit OldBox(const LayoutNode& node) : box(node.box), border(node.border()), padding(node.padding()) {}
};
void NoteBoxChange(LayoutHandle& handle, const OldBox& old, LayoutPass& pass);

}  // namespace qorvex::layout
