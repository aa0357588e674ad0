// Walks a parsed tree and makes nodes of it, one Step at a time. The walk keeps its own stack, so it can stop
// in front of any element while a script or sheet has to come first, and go on from there.
//
// Invariant: between two steps every parent on `stack_` is in place already, except for the one element that
// is held back in `pending_child_`.
#pragma once

#include "core/memory/containers.h"
#include "dom/parsed_html.h"
#include "qsl/ref_ptr.h"

namespace qorvex::dom {

class Document;
class Element;
class Node;

enum class BuildResult { Finished = 0, Paused = 1, Failed = 2 };

class Builder {
  public:
    // Makes the html element below `document` and a builder for its content; null when the parsed root is no
    // html element.
    static UniquePtr<Builder, MemoryTag::DOM> BuildRoot(RefPtr<ParsedHTML> parsed, Document& document);
    // A builder for the content of the parsed body below `target`; null when there is nothing to walk.
    static UniquePtr<Builder, MemoryTag::DOM> BuildFragment(RefPtr<ParsedHTML> parsed, Document& document,
                                                            Node& target);

    Builder(RefPtr<ParsedHTML> parsed, Document& document);
    ~Builder();
    Builder(const Builder&) = delete;
    Builder& operator=(const Builder&) = delete;

    BuildResult Step();

  private:
    struct StackEntry {
        RefPtr<Node> parent;
        const GumboInternalNode* node;
        uint32_t depth;  // of the parent, counted from the root of its tree
    };

    void PushChildren(const GumboInternalNode& node, Node& parent, uint32_t depth);
    // True when the building has to stop in front of the element.
    bool BuildElement(const StackEntry& entry);
    void PushContent(const StackEntry& entry, Node& element);
    // Once a builder.
    void ReportDepth();
    void AppendText(const StackEntry& entry);
    void FlushText();
    void FlushReactions();
    bool IsPaused() const;

    RefPtr<ParsedHTML> parsed_;
    Document& document_;
    Vector<StackEntry, MemoryTag::DOM> stack_;
    RefPtr<Node> pending_child_;
    RefPtr<Node> pending_parent_;
    bool text_active_ = false;
    // Fragments are built whole: the page's pauses are not theirs.
    bool stops_at_pause_ = true;
    bool depth_reported_ = false;
    TaggedString<MemoryTag::DOM> text_run_;
    RefPtr<Node> text_parent_;
};

// Parses `text` as HTML and builds its content below `target` at once.
void ParseFragment(std::string_view text, Document& document, Node& target);

}  // namespace qorvex::dom
