// The document's side of the layout tree: making it, keeping its place with the nodes, and carrying changes
// over.

#include "core/limits.h"
#include "core/logging/log.h"
#include "display/dirty_region.h"
#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/style_engine.h"
#include "layout/fonts/font_manager.h"

namespace qorvex::dom {

using qsl::RefPtr;

namespace {
bool HasDisplay(const Node& node) {
    return node.GetLaidOutStyle().layout->display != css::CSSDisplay::None;
}
}  // namespace

void Document::SetViewSize(uint32_t width, uint32_t height) {
    if (width == view_width_ && height == view_height_) return;
    view_width_ = width;
    view_height_ = height;
    style_engine_->OnMetricsChanged(*this);
    if (html_ && html_->GetLayoutHandle()) QueueLayoutChange(*html_);
}

css::LengthContext Document::GetLengthContext() const {
    css::LengthContext context;
    context.vw = static_cast<float>(view_width_) / 100;
    context.vh = static_cast<float>(view_height_) / 100;
    const css::LayoutStyleRefs& root = html_ ? html_->GetStyle() : *default_style_;
    context.em = context.rem = root.text->computedFontSize;
    return context;
}

// --- The tree

void Document::RequestLayoutTreeRebuild() {
    layout_tree_built_ = false;
    layout_tree_.Clear(host_->GetDirtyRegion());
}

void Document::RebuildLayoutTree() {
    LogTrace("Rebuilding full layout tree");
    if (!html_) {
        AssertFailure("Missing HTML element, unable to create layout tree!");
        return;
    }
    Element& root = *html_;
    layout::FontManager* fonts = host_->GetFontManager();
    layout_tree_.SetTextServices(
        {fonts ? &fonts->Service() : nullptr, host_->GetInternationalizationManager()});
    root.layout_node_ = layout_tree_.CreateRoot({.style = root.GetStyle(),
                                                 .display = root.display_element_,
                                                 .link = root.GetLayoutLink(),
                                                 .scroll = root.GetStoredScroll()});
    root.GetStyle().written.Clear();
    if (HasDisplay(root)) AppendLayoutSubtree(root, *root.layout_node_);
    layout_tree_built_ = true;
}

// Breadth first: the children of a node that made no handle go to the handle above it; what has no display is
// not entered.
void Document::AppendLayoutSubtree(Node& top, layout::LayoutHandle& handle) {
    struct Entry {
        Node* node;
        layout::LayoutHandle* parent;
    };
    Vector<Entry, MemoryTag::DOM> queue;
    queue.push_back({&top, &handle});
    for (size_t i = 0; i < queue.size(); ++i) {
        const Entry entry = queue[i];
        for (const RefPtr<Node>& child : entry.node->children_) {
            if (!HasDisplay(*child)) continue;
            if (IsTooDeepForLayout(*child)) break;
            layout::LayoutHandle* made = child.get() == html_
                                             ? child->layout_node_.get()
                                             : child->CreateLayoutNode(layout_tree_, *entry.parent).get();
            if (made) child->GetWrittenGroups()->Clear();
            queue.push_back({child.get(), made ? made : entry.parent});
        }
    }
}

bool Document::IsTooDeepForLayout(const Node& node) {
    if (node.GetDepth() < static_cast<int32_t>(limits::kMaxDocumentDepth)) return false;
    if (!depth_reported_)
        LogWarning("The document nests deeper than ", limits::kMaxDocumentDepth,
                   " levels; deeper content is not shown");
    depth_reported_ = true;
    return true;
}

bool Document::AttachLayoutNode(Node& node) {
    if (!layout_tree_built_ || !node.IsInDocument() || node.Is(kInLayoutTree)) return node.Is(kInLayoutTree);
    Node* parent = node.parent_;
    if (!parent || !parent->Is(kInLayoutTree) || !parent->layout_node_ || IsTooDeepForLayout(node))
        return false;
    layout::LayoutHandle& parent_handle = *parent->layout_node_;
    if (node.layout_node_) {
        const uint32_t index = node.FindLayoutIndex(parent_handle);
        layout_tree_.Attach(*node.layout_node_, parent_handle, index);
        layout_tree_.UpdateStyle(*node.layout_node_, *node.GetOwnLaidOutStyle(), *node.GetWrittenGroups());
    } else if (!node.CreateLayoutNode(layout_tree_, parent_handle)) {
        return false;
    }
    node.GetWrittenGroups()->Clear();
    QueueLayoutChange(node);
    return true;
}

void Document::DetachLayoutNode(Node& node) {
    if (!node.layout_node_ || !node.Is(kInLayoutTree)) return;
    layout_tree_.Remove(*node.layout_node_, host_->GetDirtyRegion());
}

// --- Changes

bool Document::TakeChange(Node& node) {
    if (!node.layout_node_ || !node.IsInDocument()) return false;
    css::WrittenGroups& written = *node.GetWrittenGroups();
    layout_tree_.UpdateStyle(*node.layout_node_, *node.GetOwnLaidOutStyle(), written);
    written.Clear();
    return true;
}

layout::LayoutWork Document::UpdateLayoutStyles(bool force_full_layout) {
    using layout::LayoutWork;
    if (!layout_tree_built_) {
        RebuildLayoutTree();
        layout_changes_.clear();
        transform_changes_.clear();
        visual_changes_.clear();
        return layout_tree_built_ ? LayoutWork::Layout : LayoutWork::None;
    }
    LayoutWork work = force_full_layout ? LayoutWork::Layout : LayoutWork::None;
    const auto lower = [&](LayoutWork wanted) {
        if (work == LayoutWork::None || static_cast<int>(wanted) < static_cast<int>(work)) work = wanted;
    };
    for (Node* node : layout_changes_) {
        if (!TakeChange(*node)) continue;
        layout_tree_.MarkChanged(*node->layout_node_);
        lower(LayoutWork::Layout);
    }
    for (Node* node : transform_changes_)
        if (TakeChange(*node)) lower(LayoutWork::Transforms);
    for (Node* node : visual_changes_)
        if (TakeChange(*node)) lower(LayoutWork::VisualStyle);
    if (!restyle_changes_.empty()) host_->RequestFrames(2);
    for (Node* node : restyle_changes_)
        if (TakeChange(*node) && work == LayoutWork::None) work = LayoutWork::Transforms;
    for (NodeSet* set : {&layout_changes_, &transform_changes_, &visual_changes_, &restyle_changes_})
        set->clear();
    return work;
}

void Document::QueueTextCommit(Text& text) {
    text_commits_.insert(&text);
}

TaskPtr Document::TakeFontPreload(fresco::IFontService& service) {
    for (Node* node : text_commits_) {
        // Scripts, style sheets and titles are text nodes, too.
        if (!node->Is(kInLayoutTree)) continue;
        const css::LaidOutStyle& style = node->GetLaidOutStyle();
        if (style.text) font_usage_.Add(style.text->typefaces, static_cast<Text*>(node)->GetDisplayedText());
    }
    return font_usage_.TakeTask(service);
}

IImageLoader* Document::GetImageLoader() const {
    return unloaded_ ? nullptr : host_->GetImageLoader();
}

void Document::HoldForImage(Node& node) {
    if (!unloaded_) waiting_for_images_[&node] = RefPtr<Node>(&node);
}

void Document::LetGoForImage(Node& node) {
    // It may be the last reference, and must not end inside the map.
    RefPtr<Node>* held = waiting_for_images_.get(&node);
    if (!held) return;
    const RefPtr<Node> last = std::move(*held);
    waiting_for_images_.erase(&node);
}

ISVGLoader* Document::GetSVGLoader() const {
    return unloaded_ ? nullptr : host_->GetSVGLoader();
}

void Document::QueueImageChange(Node& node) {
    if (!node.IsInDocument()) return;
    image_commits_.insert(&node);
    visual_changes_.insert(&node);
}

void Document::CommitLayout(layout::LayoutUpdateData& update, dsp::DirtyRegion* dirty,
                            layout::DebugNames* names) {
    for (Node* node : text_commits_)
        static_cast<Text*>(node)->CommitDisplayedText();
    text_commits_.clear();
    for (Node* node : image_commits_) {
        node->CommitImages();
        if (node->layout_node_ && node->Is(kInLayoutTree)) layout_tree_.MarkChanged(*node->layout_node_);
    }
    image_commits_.clear();
    if (body_) update.bodyDisplay = body_->GetStyle().layout->display;
    layout_tree_.Commit(update, dirty, names);
}

// --- Nodes that come and go

void Document::ElementConnected(Element& element) {
    AddId(element, element.GetId());
    if (needs_full_style_solve_) return;
    MarkSelectorDirty(element);
}

void Document::ElementDisconnected(Element& element) {
    RemoveId(element, element.GetId());
}

void Document::NodeInserted(Node& node) {
    if (!needs_full_style_solve_) {
        // The solve walks down from a dirty node by itself. Those behind it are matched anew where rules look
        // at siblings: what stands before them has changed.
        if (node.IsElement() && style_engine_->SiblingInvalidatingRules() > 0 && node.GetNextSibling())
            node.MarkStyleDirty();
        else
            MarkNodeDirty(node);
    }
    if (!dataBinding) return;
    for (Node* below = &node; below; below = below->GetNextInTree(&node)) {
        if (!below->IsElement()) continue;
        auto& element = static_cast<Element&>(*below);
        for (const AttributePair& entry : element.GetDataset())
            dataBinding->OnDataAttribute(element, entry.name, entry.value);
    }
}

void Document::NodeRemoved(Node& node) {
    // Taking out the top of a subtree takes out the whole of it; those below have nothing left to unlink.
    DetachLayoutNode(node);
    if (node.layout_node_) node.layout_node_->data().style = nullptr;
    node.layout_node_ = nullptr;
    for (NodeSet* set :
         {&style_dirty_nodes_, &selector_dirty_elements_, &layout_changes_, &transform_changes_,
          &visual_changes_, &restyle_changes_, &text_commits_, &image_changes_, &image_commits_})
        set->erase(&node);
    node.pendingStyleBits = 0;
    ForgetCollections(node);
    if (node.IsElement() && dataBinding) dataBinding->OnElementRemoved(static_cast<Element&>(node));
    for (INodeLifetimeObserver* observer : lifetimeObservers)
        if (observer) observer->OnNodeRemoved(node);
}

}  // namespace qorvex::dom
