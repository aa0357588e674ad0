#include "dom/document.h"

#include "core/logging/log.h"
#include "core/memory/atoms.h"
#include "dom/attr.h"
#include "dom/character_data.h"
#include "dom/document_fragment.h"
#include "dom/document_host.h"
#include "dom/element_factory.h"
#include "dom/event.h"
#include "dom/html_script_element.h"
#include "dom/node_list.h"
#include "dom/resource_loader.h"
#include "dom/style_engine.h"
#include "dom/style_sheet_list.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

Document::Document(DocumentParams params)
    : Element(*this, css::TagId::Unknown),
      host_(params.host),
      strings_(&params.host->GetStringPool()),
      url_(std::move(params.url)),
      complex_selectors_(params.host->AreComplexSelectorsEnabled()),
      style_engine_(std::move(params.style_engine)),
      loader_(std::move(params.loader)),
      default_style_(&style_engine_->GetDefaultStyle()),
      default_text_style_(MakeRef<css::SharedStyle>(*default_style_)) {
    SetFlag(kIsDocument, true);
    GetStyle() = *default_style_;
    const HostSize size = host_->GetViewSize();
    view_width_ = size.width;
    view_height_ = size.height;
    doctype_ = script::MakeHandle<DocumentType>(*this);
}

Document::~Document() = default;

// --- Life

void Document::OnBeforeDestroy() {
    if (disposed_) return;
    disposed_ = disposing_ = true;
    AddRef();  // stands for all nodes that outlive the tree; the last of them gives it back
    Unload();
    DropTree();
    doctype_ = nullptr;
    style_sheets_ = nullptr;
    scripting_context_ = nullptr;
    window_ = nullptr;
    ClearWeakBlock();  // for whoever asks, the document is dead from here on
    disposing_ = false;
    ReleaseIfOrphaned();
}

void Document::ReleaseIfOrphaned() {
    if (disposed_ && !disposing_ && !releasing_ && live_nodes_ == 0) Release();
}

void Document::OnNodeDestroyed(Node& node) {
    listeners_.Remove(node);
    if (!collections_.empty()) collections_.erase(&node);
    CountNode(-1);
    ReleaseIfOrphaned();
}

void Document::ReleaseLater(NodeChildren& children) {
    for (RefPtr<Node>& child : children)
        doomed_.push_back(std::move(child));
    children.clear();
    if (releasing_) return;
    releasing_ = true;
    while (!doomed_.empty()) {
        const RefPtr<Node> node = doomed_.take_back();
    }
    releasing_ = false;
    ReleaseIfOrphaned();
}

void Document::DropTree() {
    // Nodes that somebody holds leave the document for good; nobody is told any more.
    for (Node* node = GetNextInTree(this); node; node = node->GetNextInTree(this)) {
        node->SetFlag(kInDocument | kInLayoutTree, false);
        node->depth_ = -1;
        node->layout_node_ = nullptr;
    }
    SetFlag(kInDocument, false);
    layout_tree_.Clear(nullptr);
    listeners_.Clear();
    ids_.clear();
    collections_.clear();
    deferred_scripts_.clear();
    std::exchange(waiting_for_images_, {});
    for (NodeSet* set :
         {&style_dirty_nodes_, &selector_dirty_elements_, &layout_changes_, &transform_changes_,
          &visual_changes_, &restyle_changes_, &text_commits_, &image_changes_, &image_commits_})
        set->clear();
    run_lists_.Clear();
    for (const RefPtr<Node>& child : children_)
        child->parent_ = nullptr;
    ReleaseLater(children_);
}

void Document::Unload() {
    if (unloaded_) return;
    unloaded_ = true;
    // Images first: other documents may wait for the same ones.
    if (IImageLoader* images = host_->GetImageLoader()) images->ForgetDocument(*this);
    if (ISVGLoader* svgs = host_->GetSVGLoader()) svgs->ForgetDocument(*this);
    image_clock_.Clear();
    std::exchange(waiting_for_images_, {});
    if (loader_) loader_->StopLoading();
    builder_.reset();
    build_state_ = BuildState::Built;
    deferred_scripts_.clear();
    layout_tasks_.clear();
}

void Document::OnInsertedIntoDocument() {
    SetFlag(kInDocument, true);
    GetStyle() = *default_style_;
}

// --- Identity

std::string_view Document::GetURLText() const {
    return url_.GetText();
}

URL Document::ResolveURL(std::string_view text) const {
    URL url;
    url.Parse(text);
    return url.IsEmpty() || !url.IsRelative() ? url : url.Merge(url_);
}

Atom Document::GetNodeName() const {
    return atoms::kDocument;
}

Atom Document::GetTagName(css::TagId tag) const {
    Atom& name = tag_names_[static_cast<size_t>(tag)];
    if (name.empty()) name = Intern(css::TagName(tag));
    return name;
}

RefPtr<Node> Document::CloneNode(bool) {
    LogWarning("Document::CloneNode is not available in this build");
    return nullptr;
}

NodeText Document::DumpDOM() {
    NodeText out;
    const int32_t top = GetDepth();
    for (Node* node = this; node; node = node->GetNextInTree(this)) {
        for (int32_t depth = node->GetDepth(); depth > top; --depth)
            out.append("  ");
        node->ToDebugString(out);
        out.push_back('\n');
    }
    return out;
}

// --- Landmarks

bool Document::SetLandmark(Element*& landmark, Element& element, const char* set_text,
                           const char* second_text) {
    if (landmark) {
        LogWarning(second_text);
        return false;
    }
    landmark = &element;
    LogTrace(set_text);
    return true;
}

void Document::SetHtmlElement(Element& element) {
    SetLandmark(html_, element, "Set HTML element!", "Trying to set second HTML element!");
}

void Document::SetHeadElement(Element& element) {
    SetLandmark(head_, element, "Set HEAD element!", "Trying to set second HEAD element!");
}

void Document::SetBodyElement(Element& element) {
    SetLandmark(body_, element, "Set BODY element!", "Trying to set second BODY element - ignoring it!");
}

void Document::ForgetLandmark(Element& element) {
    struct Landmark {
        Element*& element;
        const char* text;
    };
    for (const Landmark& landmark :
         {Landmark{html_, "Removed HTML element!"}, Landmark{head_, "Removed HEAD element!"},
          Landmark{body_, "Removed BODY element!"}}) {
        if (landmark.element != &element) continue;
        landmark.element = nullptr;
        LogTrace(landmark.text);
    }
}

DocumentType* Document::GetDoctype() const {
    return doctype_.get();
}

Element* Document::GetFocusedElementOrBody() const {
    Element* focused = GetFocusedElement();
    return focused ? focused : body_;
}

void Document::SetFocusedElement(Element* element) {
    Element* old = GetFocusedElement();
    if (old == element) return;
    focused_ = script::WeakHandle<Node>(element);
    // The events of the change come with input routing; the pseudo-class follows at once.
    if (old) old->OnPseudoStateChanged();
    if (element) element->OnPseudoStateChanged();
}

// --- Making nodes

RefPtr<Element> Document::CreateElement(std::string_view name) {
    return CreateElementByName(name, *this);
}

RefPtr<Text> Document::CreateTextNode(std::string_view text) {
    return script::MakeHandle<Text>(*this, text);
}

RefPtr<Comment> Document::CreateComment(std::string_view text) {
    return script::MakeHandle<Comment>(*this, text);
}

RefPtr<DocumentFragment> Document::CreateDocumentFragment() {
    return script::MakeHandle<DocumentFragment>(*this);
}

RefPtr<Attr> Document::CreateAttribute(std::string_view name) {
    return script::MakeHandle<Attr>(*this, name, std::string_view(), nullptr);
}

RefPtr<Event> Document::CreateEvent(std::string_view name) {
    if (name == "Event") return script::MakeHandle<Event>(this, Atom(), false, false);
    if (name == "UIEvent") return script::MakeHandle<UIEvent>(this, Atom(), false, false);
    for (const std::string_view later : {"MouseEvent", "KeyboardEvent", "TouchEvent", "CustomEvent",
                                         "GamepadEvent", "PopStateEvent", "MessageEvent"}) {
        if (name != later) continue;
        LogWarning("Document::createEvent(\"", name, "\") is not available in this build");
        return script::MakeHandle<Event>(this, Atom(), false, false);
    }
    return nullptr;
}

RefPtr<Node> Document::ImportNode(Node* node, bool deep) {
    return node ? node->CloneNode(deep) : nullptr;
}

void Document::Write(std::string_view text) {
    // The web writes at the parser's place and, after it, into a fresh document. A page of a game is not
    // rewritten: both cases append to the body.
    if (body_) body_->InsertAdjacentHTML("beforeend", text);
}

}  // namespace qorvex::dom
