// The frame's style step: who is looked at, in which order, and where the changes go.
//
// Invariants: parents are solved before their children; dirty properties stay on an element until the pass is
// over, because its children read them; the lists below are kept from frame to frame for their memory, so
// that a steady page allocates nothing here.
#pragma once

#include "css/style/element_matching.h"
#include "css/style/style_run.h"

namespace qorvex::css {

class StyleSolver {
  public:
    struct Rules {
        RuleIndex& defaults;
        RuleIndex& author;
    };

    StyleSolver(const Rules& rules, StyleCounters& counters)
        : rules_(rules), counters_(counters), matcher_(counters) {}

    void Solve(dom::Document& document, IAnimationSide* animations);
    // The root's font size changed in the last Solve: lengths in media conditions may hold otherwise now.
    bool RootFontSizeChanged() const { return rootFontSizeChanged_; }
    ElementMatcher& matcher() { return matcher_; }

  private:
    using NodeList = CssVector<dom::Node*>;

    void MatchDirtyElements(dom::Document& document);
    void GatherAll(dom::Document& document);
    void MatchAll(dom::Document& document);
    void Gather(dom::Document& document);
    void Visit(dom::Node& node);
    void WalkGathered();
    void SolveGathered(dom::Document& document);
    void SolveText(dom::Node& text, StyleRun& run);
    void UpdateLayoutPresence(dom::Document& document);
    void ExpandEntered(dom::Document& document);
    void RunAnimations(dom::Document& document, IAnimationSide* animations);
    void ClearDirtyProperties();

    Rules rules_;
    StyleCounters& counters_;
    ElementMatcher matcher_;
    StyleSharingTable sharing_;
    TextStyleCache textStyles_;
    RootStyles rootStyles_;
    bool rootFontSizeChanged_ = false;

    NodeList queue_;
    CssVector<dom::Element*> elements_;
    NodeList texts_;
    CssVector<dom::Element*> solved_;
    NodeSet<dom::Node*, MemoryTag::DOM> taken_;
};

}  // namespace qorvex::css
