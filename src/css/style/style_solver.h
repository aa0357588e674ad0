// The frame's style step: who is looked at, in which order, and where the changes go.
//
// The walk goes down level by level from the dirty nodes, and below an element only as far as what it changed
// may reach: a new background on the body costs the body, a new colour on it costs all who inherit it.
//
// Invariants: parents are solved before their children; dirty properties stay on an element until its
// children have read them; the lists below are kept from frame to frame for their memory, so that a steady
// page allocates nothing here.
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
    // How much of the tree below the dirty nodes is looked at.
    enum class Extent { WhatChanged, All };
    void SolveBelow(dom::Document& document, Extent extent);
    void AddRoots(dom::Document& document, Extent extent);
    void AddRoot(dom::Node& node);
    void TakeRootsOfLevel(int32_t depth);
    void AddChildren(const dom::Node& node);
    void FinishLevel();
    void GiveBackRoom();
    void MatchAfresh(dom::Element& element, MatchContext& context);
    void Prefetch(uint32_t from) const;
    // `anew` when more may be different for the node than what is dirty on its parent.
    bool SolveNode(dom::Node& node, bool anew, StyleRun& run);
    void SolveText(dom::Node& text, bool anew, StyleRun& run);
    void UpdateLayoutPresence(dom::Document& document);
    void ExpandEntered(dom::Document& document);
    void RunAnimations(dom::Document& document, IAnimationSide* animations);

    Rules rules_;
    StyleCounters& counters_;
    ElementMatcher matcher_;
    PseudoState pseudo_;  // empty outside of a batch
    StyleSharingTable sharing_;
    TextStyleCache textStyles_;
    TextStep textStep_;
    RootStyles rootStyles_;
    bool rootFontSizeChanged_ = false;

    // The dirty nodes by depth, and how many of them were taken.
    NodeList roots_;
    uint32_t rootsTaken_ = 0;
    NodeList level_;
    NodeList nextLevel_;
    // Elements with dirty properties: of the level in hand, and of the one above it.
    CssVector<dom::Element*> solved_;
    CssVector<dom::Element*> solvedAbove_;
    // The most that any of the lists held in this run.
    uint32_t widest_ = 0;
    NodeSet<dom::Node*, MemoryTag::DOM> taken_;
};

}  // namespace qorvex::css
