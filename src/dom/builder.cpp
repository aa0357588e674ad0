#include "dom/builder.h"

#include "core/limits.h"
#include "core/logging/log.h"
#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/element_factory.h"
#include "dom/gumbo_access.h"
#include "dom/html_elements.h"
#include "dom/preload_scan.h"
#include "script/make_handle.h"

namespace qorvex::dom {

Builder::Builder(RefPtr<ParsedHTML> parsed, Document& document)
    : parsed_(std::move(parsed)), document_(document) {
    if (parsed_->IsNestingCut()) ReportDepth();
}
Builder::~Builder() = default;

UniquePtr<Builder, MemoryTag::DOM> Builder::BuildRoot(RefPtr<ParsedHTML> parsed, Document& document) {
    const GumboNode* root = parsed->GetRootNode();
    if (!parsed->GetDocumentNode() || !root) {
        AssertFailure("HTML not parsed!");
        return nullptr;
    }
    if (root->type != GUMBO_NODE_ELEMENT || root->v.element.tag != GUMBO_TAG_HTML) return nullptr;
    RefPtr<Element> html = script::MakeHandle<HTMLHtmlElement>(document, css::TagId::Html);
    for (const GumboAttribute* attribute : AttributesOf(root->v.element))
        html->SetAttribute(attribute->name, attribute->value);
    document.InsertBefore(html, nullptr, true);
    // Local pages gain nothing from asking early.
    if (document.GetURL().GetScheme() == "http" || document.GetURL().GetScheme() == "https")
        RunPreloadScan(*root, document);
    auto builder = MakeUnique<Builder, MemoryTag::DOM>(std::move(parsed), document);
    builder->PushChildren(*root, *html, 1);
    return builder;
}

UniquePtr<Builder, MemoryTag::DOM> Builder::BuildFragment(RefPtr<ParsedHTML> parsed, Document& document,
                                                          Node& target) {
    const GumboNode* root = parsed->GetRootNode();
    if (!root || root->type != GUMBO_NODE_ELEMENT || root->v.element.children.length == 0) return nullptr;
    // A fragment is parsed as a whole document; its last child is the body, and what went to the head is
    // dropped.
    const GumboNode* last = ChildrenOf(root->v.element).back();
    if (last->type == GUMBO_NODE_TEXT) {
        target.AppendChild(script::MakeHandle<Text>(document, last->v.text.text));
        return nullptr;
    }
    if (last->type != GUMBO_NODE_ELEMENT) return nullptr;
    uint32_t depth = 0;
    for (const Node* node = target.GetParent(); node; node = node->GetParent())
        ++depth;
    auto builder = MakeUnique<Builder, MemoryTag::DOM>(std::move(parsed), document);
    builder->stops_at_pause_ = false;
    builder->PushChildren(*last, target, depth);
    return builder;
}

void Builder::PushChildren(const GumboInternalNode& node, Node& parent, uint32_t depth) {
    const auto children = ChildrenOf(node.v.element);
    for (size_t i = children.size(); i-- > 0;)
        stack_.push_back({RefPtr<Node>(&parent), children[i], depth});
}

bool Builder::IsPaused() const {
    return stops_at_pause_ && document_.GetBuildState() == BuildState::Paused;
}

void Builder::FlushReactions() {
    if (document_.customElements) document_.customElements->Flush();
}

BuildResult Builder::Step() {
    if (pending_child_) {
        const RefPtr<Node> parent = std::move(pending_parent_);
        parent->AppendChild(std::move(pending_child_));
        if (IsPaused()) return BuildResult::Paused;
    }
    while (!stack_.empty()) {
        if (document_.IsUnloaded()) return BuildResult::Finished;
        const StackEntry entry = stack_.take_back();
        switch (entry.node->type) {
            case GUMBO_NODE_ELEMENT:
                if (BuildElement(entry)) return BuildResult::Paused;
                break;
            case GUMBO_NODE_TEXT:
                AppendText(entry);
                break;
            default:
                break;  // comments, white space between tags, CDATA and templates make no nodes
        }
    }
    if (text_active_) {
        if (!text_parent_) {
            AssertFailure("Detected detached text. Missing text is possible");
            return BuildResult::Failed;
        }
        FlushText();
    }
    FlushReactions();
    return BuildResult::Finished;
}

bool Builder::BuildElement(const StackEntry& entry) {
    const GumboElement& source = entry.node->v.element;
    if (source.tag == GUMBO_TAG_BR) {
        if (text_active_) text_run_.push_back('\n');
        return false;
    }
    if (text_active_) FlushText();
    const RefPtr<Element> element = CreateElementFromParser(*entry.node, document_);
    if (!element) return false;
    for (const GumboAttribute* attribute : AttributesOf(source))
        element->SetAttribute(attribute->name, attribute->value);
    if (source.tag == GUMBO_TAG_SCRIPT && AttributeValue(source, "defer") != "true") FlushReactions();
    PushContent(entry, *element);
    if (IsPaused()) {
        // Whatever paused the building, this element or one before it, comes before what this one may start.
        FlushReactions();
        pending_child_ = element;
        pending_parent_ = entry.parent;
        return true;
    }
    entry.parent->AppendChild(element);
    return false;
}

void Builder::PushContent(const StackEntry& entry, Node& element) {
    if (entry.depth + 1 < limits::kMaxDocumentDepth) {
        PushChildren(*entry.node, element, entry.depth + 1);
        return;
    }
    // At the bound the content becomes siblings of what should hold it, scripts and sheets keep their text.
    const bool keeps_text =
        entry.node->v.element.tag == GUMBO_TAG_SCRIPT || entry.node->v.element.tag == GUMBO_TAG_STYLE;
    ReportDepth();
    PushChildren(*entry.node, keeps_text ? element : *entry.parent, entry.depth);
}

void Builder::ReportDepth() {
    if (std::exchange(depth_reported_, true)) return;
    LogWarning("HTML nests deeper than ", limits::kMaxDocumentDepth,
               " levels; deeper content is attached there");
}

void Builder::AppendText(const StackEntry& entry) {
    if (text_active_ && text_parent_ != entry.parent) FlushText();
    text_active_ = true;
    text_parent_ = entry.parent;
    text_run_.append(std::string_view(entry.node->v.text.text));
}

void Builder::FlushText() {
    const RefPtr<Node> parent = std::move(text_parent_);
    const TaggedString<MemoryTag::DOM> text = std::move(text_run_);
    text_active_ = false;
    text_run_.clear();
    if (!parent) {
        AssertFailure("Detected text detached from parent");
        return;
    }
    // A translation takes the place of the page's own text.
    if (parent->HasLocalizedContent()) return;
    parent->AppendChild(script::MakeHandle<Text>(document_, text));
}

void ParseFragment(std::string_view text, Document& document, Node& target) {
    const RefPtr<Node> held(&target);
    if (UniquePtr<Builder, MemoryTag::DOM> builder =
            Builder::BuildFragment(ParseHTML(text), document, target))
        builder->Step();
}

}  // namespace qorvex::dom
