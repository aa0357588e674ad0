// The document of a page: the root of its tree, its lookup caches, its build state, the marks that tell style
// and layout what changed, and the seats of those who watch it. The operations stand in files by theme:
// document.cpp (life, landmarks, making nodes), document_lookup.cpp, document_building.cpp,
// document_style.cpp, document_layout.cpp.
//
// Invariants:
// - the tree hangs below the document; all its nodes point at it and die before its memory does;
// - the lookup caches never show: whatever was inserted, removed or renamed, an answer equals a fresh walk;
// - the sets of dirty and changed nodes hold nodes of the document only: a node that leaves is taken out.
#pragma once

#include "core/tasks/task_system.h"
#include "core/url/url.h"
#include "css/values/length_context.h"
#include "dom/builder.h"
#include "dom/change_mask.h"
#include "dom/element.h"
#include "dom/event_listeners.h"
#include "dom/font_usage.h"
#include "dom/image_clock.h"
#include "dom/observer_hooks.h"
#include "layout/layout_tree.h"
#include "layout/layout_update.h"

namespace qorvex::dom {

class DocumentFragment;
class DocumentType;
class HTMLScriptElement;
class IDocumentHost;
class IDocumentLoader;
class IStyleEngine;
class StyleSheetList;

enum class BuildState : uint32_t { Building = 0, Paused = 1, Built = 2 };

// What a document is made with. The host outlives it.
struct DocumentParams {
    IDocumentHost* host = nullptr;
    URL url;
    UniquePtr<IStyleEngine, MemoryTag::DOM> style_engine;
    UniquePtr<IDocumentLoader, MemoryTag::DOM> loader;
};

class Document : public Element {
    QORVEX_SCRIPT_CLASS(Document)
  public:
    explicit Document(DocumentParams params);

    IDocumentHost& GetHost() const { return *host_; }
    IStyleEngine& GetStyleEngine() const { return *style_engine_; }
    IDocumentLoader& GetLoader() const { return *loader_; }
    StringPool& GetStrings() const { return *strings_; }
    Atom Intern(std::string_view text) const { return strings_->Intern(text); }
    // The empty atom for a text that nobody interned.
    Atom FindAtom(std::string_view text) const { return strings_->Find(text); }
    Atom GetTagName(css::TagId tag) const;
    const URL& GetURL() const { return url_; }
    std::string_view GetURLText() const;
    URL ResolveURL(std::string_view text) const;

    // The page's script context; null while there is none, and then scripts are not told of anything.
    script::ScriptingContext* GetDocumentContext() const { return scripting_context_; }
    void SetScriptingContext(script::ScriptingContext* context) { scripting_context_ = context; }
    EventTarget* GetWindow() const { return window_; }
    void SetWindow(EventTarget* window) { window_ = window; }

    // --- Landmarks
    Element* GetHtmlElement() const { return html_; }
    Element* GetHeadElement() const { return head_; }
    Element* GetBodyElement() const { return body_; }
    void SetHtmlElement(Element& element);
    void SetHeadElement(Element& element);
    void SetBodyElement(Element& element);
    void ForgetLandmark(Element& element);
    DocumentType* GetDoctype() const;
    // The first element child.
    Element* GetDocumentElement() const { return GetFirstElementChild(); }
    Element* GetFocusedElement() const { return static_cast<Element*>(focused_.get()); }
    void SetFocusedElement(Element* element);
    Element* GetFocusedElementOrBody() const;

    // --- Making nodes
    qsl::RefPtr<Element> CreateElement(std::string_view name);
    qsl::RefPtr<Text> CreateTextNode(std::string_view text);
    qsl::RefPtr<Comment> CreateComment(std::string_view text);
    qsl::RefPtr<DocumentFragment> CreateDocumentFragment();
    qsl::RefPtr<Attr> CreateAttribute(std::string_view name);
    // An uninitialised event for a name that script may ask for; null for any other.
    qsl::RefPtr<Event> CreateEvent(std::string_view name);
    // A copy of a node; null for none. All nodes of a page belong to its one document already.
    qsl::RefPtr<Node> ImportNode(Node* node, bool deep);
    // Appends what the text parses to, to the body.
    void Write(std::string_view text);

    // --- Lookups
    Element* GetElementById(std::string_view id);
    qsl::RefPtr<HTMLCollection> GetElementsByName(std::string_view name);
    using Element::GetElementsByClassName;
    using Element::GetElementsByTagName;
    qsl::RefPtr<HTMLCollection> GetElementsByTagName(Node& root, std::string_view name);
    qsl::RefPtr<HTMLCollection> GetElementsByClassName(Node& root, std::string_view name);
    // All elements below the document, in document order. `visit` may not change the tree.
    template <class Visitor>
    void ForEachElement(Visitor&& visit) {
        for (Node* node = GetNextInTree(this); node; node = node->GetNextInTree(this))
            if (node->IsElement()) visit(static_cast<Element&>(*node));
    }

    // --- Building
    BuildState GetBuildState() const { return build_state_; }
    // Makes the root of a parsed page and the builder of the rest; false when the page has no html root.
    [[nodiscard]] bool BuildRoot(qsl::RefPtr<ParsedHTML> parsed);
    BuildResult IterateDOMBuilding();
    // One owner at a time: a second pause is dropped, and only the owner resumes.
    void PauseDOMBuilding(Element& owner);
    void ResumeDOMBuilding(Element& owner);
    bool HasPassedParsedPoint() const { return parsed_point_; }
    // Fires "load" once nothing holds it back. The loader calls it whenever a resource completes.
    void MaybeFinishLoad();
    bool IsLoadFired() const { return load_fired_; }
    // "loading", "interactive" or "complete".
    std::string_view GetReadyState() const;
    void AppendDeferredScript(HTMLScriptElement& script);
    Element* GetCurrentScript() const { return current_script_; }
    void SetCurrentScript(Element* script) { current_script_ = script; }
    // The page goes: loading, building and pending work stop. The tree stays as it is until the document
    // dies.
    void Unload();
    bool IsUnloaded() const { return unloaded_; }

    // --- Style
    const css::LayoutStyleRefs& GetDefaultStyle() const { return *default_style_; }
    const css::SharedStylePtr& GetDefaultTextStyle() const { return default_text_style_; }
    bool AreComplexSelectorsEnabled() const { return complex_selectors_; }
    // `media` is the text of a link's media attribute, empty for none.
    void AddStyleSheet(Element& owner, css::StylesheetPtr sheet, std::string_view media);
    void RemoveStyleSheet(Element& owner);
    StyleSheetList& GetStyleSheets();
    // The frame's style step.
    void SolveStyles();
    void RequestFullStyleSolve() { needs_full_style_solve_ = true; }
    bool NeedsFullStyleSolve() const { return needs_full_style_solve_; }
    void ClearFullStyleSolve() { needs_full_style_solve_ = false; }
    void MarkNodeDirty(Node& node);
    void MarkSelectorDirty(Element& element);
    NodeSet& GetStyleDirtyNodes() { return style_dirty_nodes_; }
    NodeSet& GetSelectorDirtyElements() { return selector_dirty_elements_; }
    // Files a node in the lists that its change asks for.
    void NoteStyleChange(Node& node, uint32_t change_mask);
    StyleRunLists& GetStyleRunLists() { return run_lists_; }
    void AddRemovedCompositionId(std::string_view id);
    // Compositions that left the page; the frame takes the list over.
    Vector<NodeText, MemoryTag::DOM>& GetRemovedCompositionIds() { return removed_composition_ids_; }

    // --- Layout
    void SetViewSize(uint32_t width, uint32_t height);
    css::LengthContext GetLengthContext() const;
    layout::LayoutTree& GetLayoutTree() { return layout_tree_; }
    // A task that makes the shapes of characters that the document is about to show for the first time; null
    // when there are none.
    TaskPtr TakeFontPreload(fresco::IFontService& service);
    bool IsLayoutTreeBuilt() const { return layout_tree_built_; }
    void RequestLayoutTreeRebuild();
    void RebuildLayoutTree();
    // A node that has a display again, and one that has lost it. True when the node has a handle now.
    bool AttachLayoutNode(Node& node);
    void DetachLayoutNode(Node& node);
    // Brings the data halves of all changed nodes up to date and says how far the frame's layout has to go.
    layout::LayoutWork UpdateLayoutStyles(bool force_full_layout);
    // Carries all changes over to the layout side, which must be idle.
    void CommitLayout(layout::LayoutUpdateData& update, dsp::DirtyRegion* dirty, layout::DebugNames* names);
    void QueueLayoutChange(Node& node) { layout_changes_.insert(&node); }
    void QueueTransformChange(Node& node) { transform_changes_.insert(&node); }
    void QueueVisualChange(Node& node) { visual_changes_.insert(&node); }
    void QueueRestyle(Node& node) { restyle_changes_.insert(&node); }
    // The text's display element takes the new text at the next commit.
    void QueueTextCommit(Text& text);
    // --- Images
    // Null without a view, and once the page is gone.
    IImageLoader* GetImageLoader() const;
    ISVGLoader* GetSVGLoader() const;
    ImageClock& GetImageClock() { return image_clock_; }
    // The node's display element takes what its images are by now at the next commit, and a frame paints it.
    void QueueImageChange(Node& node);
    // The same without a frame of its own, for what is out of sight.
    void QueueImageCommit(Node& node) {
        if (node.IsInDocument()) image_commits_.insert(&node);
    }
    // Images that hold back "load".
    void CountPendingImage(int change) { pending_images_ += change; }
    // An element that waits for its image lives, and holds back "load", until it has had its event or the
    // page ends.
    void HoldForImage(Node& node);
    void LetGoForImage(Node& node);

    // Work that the next frame runs on the layout channel ahead of its layout.
    using LayoutTask = Function<void(TaskFamilyHandle), MemoryTag::DOM>;
    void ScheduleLayoutTask(LayoutTask task) { layout_tasks_.push_back(std::move(task)); }
    Vector<LayoutTask, MemoryTag::DOM> TakeScheduledLayoutTasks() { return std::move(layout_tasks_); }

    // --- Notifications from the tree
    void NodeInserted(Node& node);
    void NodeRemoved(Node& node);
    void ElementConnected(Element& element);
    void ElementDisconnected(Element& element);
    void OnIdChanged(Element& element, Atom old_id);
    // Collections of the node and of its ancestors may have changed.
    void ForgetCollections(Node& node);
    void ForgetClassCollections(Node& node);
    // Nodes die one after the other, however deep they nest.
    void ReleaseLater(NodeChildren& children);
    void CountNode(int change) { live_nodes_ += change; }
    void OnNodeDestroyed(Node& node);

    // --- Seats
    EventListenerTable& GetEventListenerTable() { return listeners_; }
    // What walks along siblings have cost so far; tests count it.
    struct TreeWork {
        uint64_t dependentsVisited = 0;
        uint64_t siblingsSearched = 0;
    } work;
    uint8_t mutationObserverKinds = 0;
    IMutationRegistry* mutationRegistry = nullptr;
    IDomInspector* inspector = nullptr;
    IDataBindingScanner* dataBinding = nullptr;
    ICustomElementReactions* customElements = nullptr;
    INodeLifetimeObserver* lifetimeObservers[2] = {nullptr, nullptr};  // animations, then SVG animations
    HashSet<Element*, MemoryTag::DOM>& GetLocalizedElements() { return localized_elements_; }

    NodeText DumpDOM();

    // --- Node
    Atom GetNodeName() const override;
    void ToDebugString(NodeText& out) const override { out.append("Document"); }
    qsl::RefPtr<Node> CloneNode(bool deep) override;
    layout::HandlePtr CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override {
        return nullptr;
    }
    void OnInsertedIntoDocument() override;
    void MarkStyleDirty() override {}
    // A node may outlive the tree that it came from (a task or a script holds it), and it goes on asking its
    // document. So when the last reference to a document goes, the document gives up its tree, and its memory
    // goes with the last node.
    void OnBeforeDestroy() override;

  protected:
    ~Document() override;

  private:
    bool SetLandmark(Element*& landmark, Element& element, const char* set_text, const char* second_text);
    Element* FindById(Atom id);
    void AppendLayoutSubtree(Node& top, layout::LayoutHandle& parent);
    bool IsTooDeepForLayout(const Node& node);
    bool TakeChange(Node& node);
    void AddId(Element& element, Atom id);
    void RemoveId(Element& element, Atom id);
    void DropTree();
    void ReleaseIfOrphaned();
    void RunDeferredScripts();
    bool HasPendingWork() const;
    void FireLoad();
    void TakeStyleImages();

    // Elements with one id: the first in document order as far as it is known.
    struct IdEntry {
        Element* first = nullptr;
        uint32_t count = 0;
    };
    struct Collections {
        HashMap<css::TagId, qsl::RefPtr<HTMLCollection>, MemoryTag::DOM> by_tag;
        HashMap<Atom, qsl::RefPtr<HTMLCollection>, MemoryTag::DOM> by_class;
    };

    IDocumentHost* host_;
    StringPool* strings_;
    URL url_;
    bool complex_selectors_;
    bool parsed_point_ = false;
    bool load_fired_ = false;
    bool finishing_load_ = false;
    bool unloaded_ = false;
    bool disposed_ = false;   // the last reference from outside has gone
    bool disposing_ = false;  // inside OnBeforeDestroy
    bool releasing_ = false;
    bool needs_full_style_solve_ = true;
    bool layout_tree_built_ = false;
    bool depth_reported_ = false;
    UniquePtr<IStyleEngine, MemoryTag::DOM> style_engine_;
    UniquePtr<IDocumentLoader, MemoryTag::DOM> loader_;
    const css::LayoutStyleRefs* default_style_;
    css::SharedStylePtr default_text_style_;
    script::ScriptingContext* scripting_context_ = nullptr;
    EventTarget* window_ = nullptr;

    UniquePtr<Builder, MemoryTag::DOM> builder_;
    BuildState build_state_ = BuildState::Building;
    script::WeakHandle<Node> pause_owner_;
    Vector<qsl::RefPtr<HTMLScriptElement>, MemoryTag::DOM> deferred_scripts_;
    Element* current_script_ = nullptr;

    Element* html_ = nullptr;
    Element* head_ = nullptr;
    Element* body_ = nullptr;
    qsl::RefPtr<DocumentType> doctype_;
    script::WeakHandle<Node> focused_;
    qsl::RefPtr<StyleSheetList> style_sheets_;

    HashMap<Atom, IdEntry, MemoryTag::DOM> ids_;
    HashMap<const Node*, Collections, MemoryTag::DOM> collections_;
    HashSet<Element*, MemoryTag::DOM> localized_elements_;
    mutable std::array<Atom, css::kTagCount> tag_names_{};

    NodeSet style_dirty_nodes_;
    NodeSet selector_dirty_elements_;
    StyleRunLists run_lists_;
    NodeSet layout_changes_;
    NodeSet transform_changes_;
    NodeSet visual_changes_;
    NodeSet restyle_changes_;
    NodeSet text_commits_;
    NodeSet image_changes_;
    NodeSet image_commits_;
    FontUsage font_usage_;
    Vector<NodeText, MemoryTag::DOM> removed_composition_ids_;
    Vector<LayoutTask, MemoryTag::DOM> layout_tasks_;
    uint32_t view_width_ = 0;
    uint32_t view_height_ = 0;

    ImageClock image_clock_;
    int pending_images_ = 0;
    HashMap<Node*, qsl::RefPtr<Node>, MemoryTag::DOM> waiting_for_images_;

    EventListenerTable listeners_;
    NodeVector doomed_;
    int live_nodes_ = 0;
    // Last, so that it goes first: its handles lead to nodes through links.
    layout::LayoutTree layout_tree_;
};

class HTMLDocument final : public Document {
    QORVEX_SCRIPT_CLASS(HTMLDocument)
  public:
    using Document::Document;
};

}  // namespace qorvex::dom
