#include "dom/node_rare_data.h"

#include "dom/dom_string_map.h"
#include "dom/dom_token_list.h"
#include "dom/node_list.h"
#include "dom/style_images.h"

namespace qorvex::dom {

NodeRareData::NodeRareData() = default;
NodeRareData::~NodeRareData() = default;

}  // namespace qorvex::dom
