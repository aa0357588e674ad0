// The small nodes: fragment, document type, and the placeholder of structural data binding.
#pragma once

#include "core/memory/atoms.h"
#include "dom/node.h"

namespace qorvex::dom {

class DocumentFragment final : public Node {
    QORVEX_SCRIPT_CLASS(DocumentFragment)
  public:
    explicit DocumentFragment(Document& document) : Node(document, kIsFragment) {}
    Atom GetNodeName() const override { return atoms::kDocumentFragment; }
    void ToDebugString(NodeText& out) const override { out.append("DocumentFragment"); }
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override {
        return nullptr;
    }
};

// One per document, made by its constructor; it is no child of it.
class DocumentType final : public Node {
    QORVEX_SCRIPT_CLASS(DocumentType)
  public:
    explicit DocumentType(Document& document) : Node(document, kIsDocumentType) {}
    void ToDebugString(NodeText& out) const override { out.append("DocumentType"); }
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override {
        return nullptr;
    }
};

class DataBindElement final : public Node {
  public:
    explicit DataBindElement(Document& document) : Node(document, kIsDataBindElement) {}
    void ToDebugString(NodeText& out) const override { out.append("DataBindElement"); }
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override {
        return nullptr;
    }
};

}  // namespace qorvex::dom
