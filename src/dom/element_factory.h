// Makes the element class that a tag asks for. One table, shared by the parser's path and by script.
#pragma once

#include <string_view>

#include "css/values/html_tags.h"
#include "qsl/ref_ptr.h"

struct GumboInternalNode;

namespace qorvex::dom {

class Document;
class Element;

// For the parser. Null for noscript, whose content does not exist here.
qsl::RefPtr<Element> CreateElementFromParser(const GumboInternalNode& node, Document& document);
// For script. The name may have any case.
qsl::RefPtr<Element> CreateElementByName(std::string_view name, Document& document);
// A bare element of a tag; `name` counts for custom elements only.
qsl::RefPtr<Element> CreateElementByTag(css::TagId tag, std::string_view name, Document& document);

}  // namespace qorvex::dom
