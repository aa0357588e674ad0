// Starts the loads that a page will ask for, while its nodes are still being made.
#pragma once

struct GumboInternalNode;

namespace qorvex::dom {

class Document;

// Stylesheet links and scripts with an address, in document order.
void RunPreloadScan(const GumboInternalNode& root, Document& document);

}  // namespace qorvex::dom
