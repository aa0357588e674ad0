// What solving the style of one node changed, and the lists that gather it for one run. The style engine
// fills the lists, the document's layout side and the animation side read them. Insertion order is kept.
#pragma once

#include <cstdint>

#include "core/memory/containers.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class Node;
class Element;

enum ChangeMask : uint32_t {
    kChangeSolved = 1,         // always set
    kChangeLeftLayout = 2,     // has display: none now; kChangeEnteredLayout is then not looked at
    kChangeEnteredLayout = 4,  // has a display again
    kChangeLayout = 8,         // a layout input changed
    kChangeTransform = 16,     // a transform or stacking input changed; counts only without kChangeLayout
    kChangeVisual = 32,        // a paint input changed
    kChangeAnimation = 64,     // animation fields changed
    kChangeTransition = 128,   // transition fields changed
    kChangeTransitionTarget = 256,  // the transition record has new end values
    kChangeTextTransform = 512,
    kChangeImages = 1024,  // the images that the style names, or how a border image is cut
};

// Style solving runs no script, so the nodes named here cannot die while a run fills the lists; the lists
// that live on until the layout query (layout, transform, visual, restyle) are cleaned of removed nodes by
// Document::NodeRemoved.
struct StyleRunLists {
    using NodeList = Vector<Node*, MemoryTag::DOM>;
    NodeList leftLayout;
    NodeList enteredLayout;
    NodeList animation;
    NodeList transition;
    NodeList transitionTargets;
    NodeList textTransform;

    void Clear();
};

}  // namespace qorvex::dom
