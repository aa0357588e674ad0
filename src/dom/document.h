// The document of a page: the root of its tree, its lookup caches, its build state, the marks that tell style
// and layout what changed, and the seats of those who watch it.
//
// Invariants:
// - the tree hangs below the document; all its nodes point at it and die before its memory does;
// - the lookup caches never show: whatever was inserted, removed or renamed, an answer equals a fresh walk;
// - styleDirtyNodes and selectorDirtyElements hold nodes of the document only.
#pragma once

#include "core/url/url.h"
#include "css/values/length_context.h"
#include "dom/builder.h"
#include "dom/change_mask.h"
#include "dom/element.h"
#include "dom/event_listeners.h"
#include "dom/observer_hooks.h"
#include "layout/layout_tree.h"

namespace qorvex {
class ITextTransformationManager;
}

namespace qorvex::dom {

class DocumentFragment;
class DocumentType;
class HTMLBodyElement;
class HTMLElement;
class HTMLScriptElement;
class IDocumentHost;
class IDocumentLoader;
class IStyleEngine;
class StyleSheetList;

enum class BuildState : uint32_t { Building = 0, Paused = 1, Built = 2 };
// How much of the layout a frame has to do.
enum class LayoutWork : uint32_t { None = 0, Layout = 1, Transforms = 2, Visual = 3 };

// What a document is made with. All pointers outlive it but the two that it owns.
struct DocumentParams {
    IDocumentHost* host = nullptr;
    URL url;
    UniquePtr<IStyleEngine, MemoryTag::DOM> style_engine;
    UniquePtr<IDocumentLoader, MemoryTag::DOM> loader;
};

class Document : public Element {
  public:
    explicit Document(DocumentParams params);

    IDocumentHost& GetHost() const { return *host_; }
    IStyleEngine& GetStyleEngine() const { return *style_engine_; }
    IDocumentLoader& GetLoader() const { return *loader_; }
    StringPool& GetStrings() const;
    Atom Intern(std::string_view text) const;
    const URL& GetURL() const { return url_; }
    script::ScriptingContext* GetScriptingContext() override { return scripting_context_; }
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
    DocumentType* GetDoctype() const { return doctype_.get(); }
    Element* GetFocusedElement() const;
    void SetFocusedElement(Element* element);
    Element* GetFocusedElementOrBody() const;
    Element* GetActiveElement() const { return GetFocusedElementOrBody(); }

    // --- Making nodes
    RefPtr<Element> CreateElement(std::string_view name);
    RefPtr<Text> CreateTextNode(std::string_view text);
    RefPtr<Comment> CreateComment(std::string_view text);
    RefPtr<DocumentFragment> CreateDocumentFragment();
    RefPtr<Attr> CreateAttribute(std::string_view name);
    // An empty event for one of the names that script may ask for; null for any other.
    RefPtr<Event> CreateEvent(std::string_view name);
    RefPtr<Node> ImportNode(Node* node, bool deep);
    void Write(std::string_view text);

    // --- Lookups
    Element* GetElementById(std::string_view id);
    RefPtr<HTMLCollection> GetElementsByName(std::string_view name);
    RefPtr<HTMLCollection> GetElementsByTagName(Node& root, std::string_view name);
    RefPtr<HTMLCollection> GetElementsByClassName(Node& root, std::string_view name);
    // Document order, from the document's first child on. `visit` returns false to stop.
    void ForEachElement(qsl::function_ref<bool(Element&)> visit);

    // --- Building
    BuildState GetBuildState() const { return build_state_; }
    // Makes the root of a parsed page and the builder of the rest; false when the page has no html root.
    [[nodiscard]] bool BuildRoot(RefPtr<ParsedHTML> parsed);
    BuildResult IterateDOMBuilding();
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
    // Stops everything: loading, animations, observers, lists. The view calls it when it unloads the page.
    void Unload();

    // --- Style
    void AddStyleSheet(Element& owner, RefPtr<css::Stylesheet> sheet, std::string_view media);
    StyleSheetList& GetStyleSheets();
    void SolveStyles();
    void RequestFullStyleSolve() { needs_full_style_solve_ = true; }
    bool NeedsFullStyleSolve() const { return needs_full_style_solve_; }
    void ClearFullStyleSolve() { needs_full_style_solve_ = false; }
    void MarkNodeDirty(Node& node);
    void MarkSelectorDirty(Element& element);
    using NodeSet = qorvex::NodeSet<Node, MemoryTag::DOM>;
    NodeSet& GetStyleDirtyNodes() { return style_dirty_nodes_; }
    NodeSet& GetSelectorDirtyElements() { return selector_dirty_elements_; }
    // Files a node in the lists that its change asks for.
    void NoteStyleChange(Node& node, uint32_t change_mask);
    StyleRunLists& GetStyleRunLists() { return run_lists_; }
    void AddRemovedCompositionId(std::string_view id);

    // --- Layout
    void SetViewSize(uint32_t width, uint32_t height);
    css::LengthContext GetLengthContext() const;
    layout::LayoutTree& GetLayoutTree() { return layout_tree_; }
    bool IsLayoutTreeBuilt() const { return layout_tree_built_; }
    void RequestLayoutTreeRebuild() { layout_tree_built_ = false; }
    void RebuildLayoutTree();
    void AttachLayoutNode(Node& node);
    void DetachLayoutNode(Node& node);
    // Brings the data halves of all changed nodes up to date and says how far the frame's layout has to go.
    LayoutWork UpdateLayoutStyles(bool force_full_layout);
    void QueueLayoutChange(Node& node);
    void QueueTransformChange(Node& node);
    void QueueVisualChange(Node& node);
    void QueueRestyle(Node& node);

    // --- Notifications from the tree
    void NodeInserted(Node& node);
    void NodeRemoved(Node& node);
    void OnIdChanged(Element& element, Atom old_id);
    void OnClassChanged(Element& element);
    void ReleaseLater(NodeVector& children);

    // --- Seats
    EventListenerTable& GetEventListenerTable() { return listeners_; }
    uint8_t mutationObserverKinds = 0;
    IMutationRegistry* mutationRegistry = nullptr;
    IDomInspector* inspector = nullptr;
    IDataBindingScanner* dataBinding = nullptr;
    INodeLifetimeObserver* lifetimeObservers[2] = {nullptr, nullptr};  // animations, then SVG animations

    HashSet<Element*, MemoryTag::DOM>& GetLocalizedElements() { return localized_elements_; }

    NodeText DumpDOM();

    // --- Node
    Atom GetNodeName() const override;
    void ToDebugString(NodeText& out) const override;
    RefPtr<Node> CloneNode(bool deep) override;
    RefPtr<layout::LayoutHandle> CreateLayoutNode(layout::LayoutTree&, layout::LayoutHandle&) override;
    void OnBeforeDestroy() override;

  protected:
    ~Document() override;

  private:
    // (fields are listed in the final header; style, core and bindings use the operations above)
    IDocumentHost* host_;
    URL url_;
    script::ScriptingContext* scripting_context_ = nullptr;
    EventTarget* window_ = nullptr;
    UniquePtr<IStyleEngine, MemoryTag::DOM> style_engine_;
    UniquePtr<IDocumentLoader, MemoryTag::DOM> loader_;
    UniquePtr<Builder, MemoryTag::DOM> builder_;
    RefPtr<DocumentType> doctype_;
    Element* html_ = nullptr;
    Element* head_ = nullptr;
    Element* body_ = nullptr;
    Element* current_script_ = nullptr;
    BuildState build_state_ = BuildState::Building;
    bool parsed_point_ = false;
    bool load_fired_ = false;
    bool needs_full_style_solve_ = false;
    bool layout_tree_built_ = false;
    NodeSet style_dirty_nodes_;
    NodeSet selector_dirty_elements_;
    StyleRunLists run_lists_;
    layout::LayoutTree layout_tree_;
    EventListenerTable listeners_;
    HashSet<Element*, MemoryTag::DOM> localized_elements_;
};

class HTMLDocument final : public Document {
  public:
    using Document::Document;
};

}  // namespace qorvex::dom
