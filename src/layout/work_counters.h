// How much work a frame's layout side did. Tests assert these, and the player reports them; nothing else
// reads them.
#pragma once

#include <cstdint>

namespace qorvex::layout {

struct WorkCounters {
    uint32_t committed = 0;    // handles copied to the layout side
    uint32_t synced = 0;       // styles written to flex nodes
    uint32_t laidOut = 0;      // boxes computed anew
    uint32_t transformed = 0;  // nodes visited by the transform pass
    uint32_t restyled = 0;     // nodes whose paint values were resolved
    uint32_t recorded = 0;     // display elements painted into command buffers
    uint32_t visited = 0;      // nodes looked at by the recording
    uint32_t measured = 0;     // calls of IDisplayElement::Measure
};

}  // namespace qorvex::layout
