// What few nodes need, made on first need.
#pragma once

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "css/values/style_declaration_set.h"
#include "layout/geometry.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class DOMStringMap;
class DOMTokenList;
class NodeList;
class StyleImages;

struct AttributePair {
    Atom name;
    Atom value;
};

struct NodeRareData {
    NodeRareData();
    ~NodeRareData();

    layout::ScrollPosition scroll;
    // Of a text: what text-transform makes of it.
    UniquePtr<TaggedString<MemoryTag::DOM>, MemoryTag::DOM> transformed_text;
    // Declarations of an element that come between the default sheet and the author's.
    UniquePtr<css::StyleDeclarationSet, MemoryTag::DOM> extra_style;
    // Null while the style names no images.
    UniquePtr<StyleImages, MemoryTag::DOM> style_images;
    qsl::RefPtr<NodeList> child_nodes;
    qsl::RefPtr<DOMStringMap> dataset_map;
    qsl::RefPtr<DOMTokenList> class_list;
    // The data- attributes, names without "data-".
    Vector<AttributePair, MemoryTag::DOM> dataset;
};

}  // namespace qorvex::dom
