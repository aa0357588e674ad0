#include "layout/scroll.h"

#include <cmath>

namespace qorvex::layout {

namespace {

float ClampAxis(float position, float scrollSize, float clientSize) {
    const float room = scrollSize - clientSize;
    const float limit = scrollSize > 0 && std::fabs(room) > kLengthTolerance ? room : 0;
    if (position > limit) position = limit;
    return position > 0 ? position : 0;
}

}  // namespace

ScrollPosition ClampScroll(ScrollPosition position, const LayoutNode& node) {
    if (!node.flags.shouldOverflowClip) return {};
    const Rect client = Inset(node.box, node.border());
    const Size content = node.ScrollSize();
    return {ClampAxis(position.x, content.width, client.width),
            ClampAxis(position.y, content.height, client.height)};
}

}  // namespace qorvex::layout
