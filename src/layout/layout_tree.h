// The tree of layout handles of one document, kept by value in the document. DOM thread.
//
// Edits change LayoutData only and enter handles in the changed set; Commit carries them to the layout side.
// The document finds the place of a new child (its index among the siblings that have handles) and tells it;
// the tree knows no DOM node but through its link.
#pragma once

#include "layout/handle_set.h"
#include "layout/layout_handle.h"
#include "layout/layout_store.h"
#include "layout/layout_update.h"

#include <span>

namespace qorvex::layout {

// What a node brings along when its handle is made. The display element tells whether it is a text.
struct NewNode {
    // Stays where it is until the node has left the document; the commit reads it.
    const css::LaidOutStyle& style;
    dsp::DisplayElementPtr display;
    NodeLinkPtr link;
    ScrollPosition scroll;
    bool isImage = false;
};

// Names of nodes by handle, for diagnostics and metadata; kept by the view.
class DebugNames;

class LayoutTree {
  public:
    LayoutTree();
    LayoutTree(const LayoutTree&) = delete;
    LayoutTree& operator=(const LayoutTree&) = delete;
    ~LayoutTree();

    // Before the first layout.
    void SetTextServices(const TextServices& services) { store_->text = services; }

    LayoutHandle* Root() const { return root_.get(); }
    HandlePtr CreateRoot(NewNode&& node);
    // Index counts layout children; one past the end appends.
    HandlePtr AddChild(LayoutHandle& parent, uint32_t index, NewNode&& node);
    // Places a handle that Remove has taken out, without its former children.
    void Attach(LayoutHandle& handle, LayoutHandle& parent, uint32_t index);
    // Takes the subtree out and adds what it covered to the dirty region. Twice is the same as once.
    void Remove(LayoutHandle& handle, dsp::DirtyRegion* dirty);
    // Drops the whole tree; the document's next style pass builds it anew.
    void Clear(dsp::DirtyRegion* dirty);

    // The next commit copies the handle.
    void MarkChanged(LayoutHandle& handle);
    // The next commit takes over the element's groups; the caller clears the element's written flags after
    // it.
    void UpdateStyle(LayoutHandle& handle, const css::LaidOutStyle& style) {
        UpdateStyle(handle, style, style.written);
    }
    void UpdateStyle(LayoutHandle& handle, const css::LaidOutStyle& style, css::WrittenGroups written);
    void SetScroll(LayoutHandle& handle, ScrollPosition scroll);
    void SetDisplayElement(LayoutHandle& handle, dsp::DisplayElementPtr display);

    const HandleSet& Changed() const { return changed_; }
    const HandleSet& Removed() const { return removed_; }

    // Carries all changes over while no layout task runs. With a dirty region, the area that each changed
    // node occupied is added to it; a full layout finds its areas for itself and passes null.
    void Commit(LayoutUpdateData& update, dsp::DirtyRegion* dirty, DebugNames* names);

  private:
    HandlePtr Create(NewNode&& node);

    qsl::RefPtr<LayoutStore> store_;
    HandlePtr root_;
    HandleSet changed_;
    HandleSet removed_;
    // A text was taken out and placed again since the last commit.
    bool textsMoved_ = false;
};

}  // namespace qorvex::layout
