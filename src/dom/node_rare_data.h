// What few nodes need, made on first need.
#pragma once

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class NodeList;

struct AttributePair {
    Atom name;
    Atom value;
};

struct NodeRareData {
    RefPtr<NodeList> child_nodes;
    // The data- attributes, names without "data-".
    Vector<AttributePair, MemoryTag::DOM> dataset;
};

}  // namespace qorvex::dom
