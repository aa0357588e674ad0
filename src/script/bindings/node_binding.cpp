#include "dom/node.h"

#include "dom/document.h"
#include "dom/node_list.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/unavailable.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

namespace {

using dom::Node;
using Bind = Binding<Node>;

std::string_view GetBaseURI(Node& node) {
    return node.GetDocument()->GetURLText();
}
Node* GetRoot(Node& node) {
    return &node.GetRootNode();
}

qsl::RefPtr<Node> InsertBefore(Node& node, qsl::RefPtr<Node> child, Node* reference) {
    return node.InsertBefore(std::move(child), reference);
}
qsl::RefPtr<Node> RemoveChild(Node& node, Node* child) {
    return node.RemoveChild(child);
}
qsl::RefPtr<Node> Clone(Node& node, bool deep) {
    return node.CloneNode(deep);
}
bool IsSame(Node& node, Node* other) {
    return &node == other;
}

int ComparePosition(Node& node, Node* other) {
    return other ? node.CompareDocumentPosition(*other) : 1;  // no node is a disconnected one
}

// Documents of this engine have neither prefixes nor namespaces.
bool IsDefaultNamespace(Node&, std::string_view) {
    return false;
}
JSValueRef LookupPrefix(Node&, ScriptCall& call, std::string_view) {
    LogWarning("Currently LookupPrefix is not implemented!");
    return JSValueMakeNull(call.context);
}
JSValueRef LookupNamespaceURI(Node&, ScriptCall& call, std::string_view) {
    return JSValueMakeNull(call.context);
}

constexpr AttributeDescription kAttributes[] = {
    Bind::ReadOnly<&Node::GetNodeName>("nodeName"),
    Bind::ReadOnly<&Node::GetNodeType>("nodeType"),
    Bind::ReadOnly<&Node::GetParent>("parentNode"),
    Bind::ReadOnly<&Node::GetParentElement>("parentElement"),
    Bind::ReadOnly<&Node::GetChildNodes>("childNodes"),
    Bind::ReadOnly<&Node::GetFirstChild>("firstChild"),
    Bind::ReadOnly<&Node::GetLastChild>("lastChild"),
    Bind::ReadOnly<&Node::GetPreviousSibling>("previousSibling"),
    Bind::ReadOnly<&Node::GetNextSibling>("nextSibling"),
    Bind::ReadOnly<&Node::GetOwnerDocument>("ownerDocument"),
    Bind::ReadOnly<&GetBaseURI>("baseURI"),
    Bind::ReadOnly<&Node::IsInDocument>("isConnected"),
    Bind::ReadWrite<&Node::GetNodeValue, &Node::SetNodeValue>("nodeValue"),
    Bind::ReadWrite<&Node::GetTextContent, &Node::SetTextContent>("textContent"),
};

constexpr MethodDescription kMethods[] = {
    Bind::Method<"appendChild", &Node::AppendChild, 1>(),
    Bind::Method<"cloneNode", &Clone>(),
    Bind::Method<"compareDocumentPosition", &ComparePosition, 1>(),
    Bind::Method<"contains", &Node::Contains, 1>(),
    Bind::Method<"getRootNode", &GetRoot>(),
    Bind::Method<"hasChildNodes", &Node::HasChildNodes>(),
    Bind::Method<"insertBefore", &InsertBefore, 2>(),
    Bind::Method<"isDefaultNamespace", &IsDefaultNamespace, 1>(),
    Bind::Method<"isEqualNode", &Node::IsEqualNode, 1>(),
    Bind::Method<"isSameNode", &IsSame, 1>(),
    Bind::Method<"lookupNamespaceURI", &LookupNamespaceURI, 1>(),
    Bind::Method<"lookupPrefix", &LookupPrefix, 1>(),
    Bind::Method<"normalize", &Node::Normalize>(),
    Bind::Method<"removeChild", &RemoveChild, 1>(),
    Bind::Method<"replaceChild", &Node::ReplaceChild, 2>(),
};

// https://dom.spec.whatwg.org/#interface-node
constexpr ConstantDescription kConstants[] = {
    {"ELEMENT_NODE", 1},
    {"ATTRIBUTE_NODE", 2},
    {"TEXT_NODE", 3},
    {"CDATA_SECTION_NODE", 4},
    {"ENTITY_REFERENCE_NODE", 5},
    {"ENTITY_NODE", 6},
    {"PROCESSING_INSTRUCTION_NODE", 7},
    {"COMMENT_NODE", 8},
    {"DOCUMENT_NODE", 9},
    {"DOCUMENT_TYPE_NODE", 10},
    {"DOCUMENT_FRAGMENT_NODE", 11},
    {"NOTATION_NODE", 12},
    {"DOCUMENT_POSITION_DISCONNECTED", 1},
    {"DOCUMENT_POSITION_PRECEDING", 2},
    {"DOCUMENT_POSITION_FOLLOWING", 4},
    {"DOCUMENT_POSITION_CONTAINS", 8},
    {"DOCUMENT_POSITION_CONTAINED_BY", 16},
    {"DOCUMENT_POSITION_IMPLEMENTATION_SPECIFIC", 32},
};

}  // namespace

const ClassDescription kNodeClass = {.script_class = ScriptClass::Node,
                                     .attributes = kAttributes,
                                     .methods = kMethods,
                                     .constants = kConstants};

}  // namespace qorvex::script
