#include "dom/preload_scan.h"

#include <gumbo.h>

#include "dom/ascii.h"
#include "dom/document.h"
#include "dom/gumbo_access.h"
#include "dom/resource_loader.h"

namespace qorvex::dom {

namespace {

void PreloadElement(const GumboElement& element, Document& document) {
    if (element.tag == GUMBO_TAG_LINK) {
        const std::string_view href = AttributeValue(element, "href");
        if (AttributeValue(element, "rel") != "stylesheet" || AttributeValue(element, "type") != "text/css")
            return;
        if (href.empty()) return;
        const URL url = document.ResolveURL(href);
        if (!url.IsEmpty()) document.GetLoader().RequestStylesheetPrefetch(url);
    } else if (element.tag == GUMBO_TAG_SCRIPT) {
        const std::string_view src = AttributeValue(element, "src");
        if (src.empty()) return;
        const URL url = document.ResolveURL(src);
        if (!url.IsEmpty()) document.GetLoader().RequestPrefetch(url);
    }
}

}  // namespace

void RunPreloadScan(const GumboInternalNode& root, Document& document) {
    Vector<const GumboInternalNode*, MemoryTag::DOM> stack;
    stack.push_back(&root);
    while (!stack.empty()) {
        const GumboInternalNode* node = stack.take_back();
        if (node->type != GUMBO_NODE_ELEMENT) continue;
        PreloadElement(node->v.element, document);
        const auto children = ChildrenOf(node->v.element);
        for (size_t i = children.size(); i-- > 0;)
            stack.push_back(children[i]);
    }
}

}  // namespace qorvex::dom
