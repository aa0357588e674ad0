// text-transform through the client's case mapping.
#pragma once

#include <string_view>

#include "dom/node.h"

namespace qorvex::dom {

enum class TextTransformResult { NotWanted, Failed, Done };

TextTransformResult TransformText(const css::LaidOutStyle& style, Document& document, std::string_view text,
                                  NodeText& out);

}  // namespace qorvex::dom
