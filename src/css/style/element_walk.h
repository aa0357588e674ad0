// A subtree in document order, at a cost that does not grow with the number of siblings.
#pragma once

#include "css/values/css_containers.h"
#include "dom/element.h"

namespace qorvex::css {

// Visits the elements below `root` in document order until `visit` answers false. The stack holds how far the
// walk has come in each ancestor, since nodes have no links to their siblings.
template <class Visitor>
void ForEachElementBelow(dom::Node& root, Visitor&& visit) {
    struct Level {
        dom::Node* node;
        size_t next;
    };
    CssSmallVector<Level, 16> stack;
    stack.push_back({&root, 0});
    while (!stack.empty()) {
        Level& level = stack.back();
        const auto children = level.node->GetChildren();
        if (level.next == children.size()) {
            stack.pop_back();
            continue;
        }
        dom::Node& child = *children[level.next++];
        if (child.IsElement() && !visit(static_cast<dom::Element&>(child))) return;
        if (child.HasChildNodes()) stack.push_back({&child, 0});
    }
}

}  // namespace qorvex::css
