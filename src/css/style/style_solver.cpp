#include "css/style/style_solver.h"

#include <algorithm>

#include "core/logging/log.h"
#include "css/style/element_solver.h"
#include "css/style/element_walk.h"
#include "css/style/text_node_solver.h"
#include "dom/document_host.h"

namespace qorvex::css {

using dom::Document;
using dom::Element;
using dom::Node;

namespace {

bool IsShallower(const Node* a, const Node* b) {
    return a->GetDepth() != b->GetDepth() ? a->GetDepth() < b->GetDepth() : a < b;
}

// A walk from one dirty node finds its subtree in order of depth already.
template <class List>
void SortByDepth(List& list) {
    const bool inOrder = std::is_sorted(
        list.begin(), list.end(), [](const Node* a, const Node* b) { return a->GetDepth() < b->GetDepth(); });
    if (!inOrder) std::sort(list.begin(), list.end(), IsShallower);
}

// Siblings behind one another in the list stand so in the tree.
bool HasSiblingsInOrder(const Node* a, const Node* b) {
    return a->GetParent() != b->GetParent() || a->GetIndexInParent() < b->GetIndexInParent();
}

// Parents before their children and siblings in the order of the tree, in which each finds its place in the
// layout behind the one that came before it, and backwards each is the last of those that are left. The dirty
// nodes of a frame come in no order.
template <class List>
void SortForLayout(List& list) {
    bool inOrder = true;
    for (uint32_t i = 1; i < list.size() && inOrder; ++i)
        inOrder = list[i - 1]->GetDepth() <= list[i]->GetDepth() && HasSiblingsInOrder(list[i - 1], list[i]);
    if (inOrder) return;
    std::sort(list.begin(), list.end(), [](const Node* a, const Node* b) {
        if (a->GetDepth() != b->GetDepth()) return a->GetDepth() < b->GetDepth();
        if (a->GetParent() != b->GetParent()) return a->GetParent() < b->GetParent();
        return a->GetIndexInParent() < b->GetIndexInParent();
    });
}

bool HasDisplay(const Node& node) {
    return node.GetLaidOutStyle().layout->display != CSSDisplay::None;
}

}  // namespace

void StyleSolver::Solve(Document& document, IAnimationSide* animations) {
    rootFontSizeChanged_ = false;
    const bool full = document.NeedsFullStyleSolve();
    if (!full && document.GetStyleDirtyNodes().empty()) return;
    dom::StyleRunLists& lists = document.GetStyleRunLists();
    if (!lists.leftLayout.empty() || !lists.enteredLayout.empty() || !lists.textTransform.empty())
        AssertFailure("Error! There shouldn't be any changed nodes here!");
    lists.Clear();

    taken_.swap(document.GetStyleDirtyNodes());
    if (full) {
        document.GetSelectorDirtyElements().clear();
        SolveBelow(document, Extent::All);
        document.ClearFullStyleSolve();
    } else {
        MatchDirtyElements(document);
        SolveBelow(document, Extent::WhatChanged);
    }
    if (rootStyles_.IsPending()) rootStyles_.Propagate(document);
    for (Node* node : lists.textTransform)
        node->OnComputedStyleChanged();
    UpdateLayoutPresence(document);
    RunAnimations(document, animations);
    lists.Clear();
    GiveBackRoom();
}

// --- Who is matched

void StyleSolver::MatchDirtyElements(Document& document) {
    dom::NodeSet& dirty = document.GetSelectorDirtyElements();
    if (dirty.empty()) return;
    pseudo_.Take(document);
    MatchContext context(pseudo_, &matcher_.GetSiblingMemo());
    const auto match = [&](Node& node) {
        matcher_.MatchElementStyle(static_cast<Element&>(node), rules_.defaults, rules_.author, context);
    };
    // The set has no order. Where rules look at siblings, order spares walks along them; a few elements are
    // not worth a way through the document.
    constexpr size_t kFew = 64;
    const bool inOrder = dirty.size() > kFew && (rules_.author.GetSiblingInvalidatingRules() > 0 ||
                                                 rules_.defaults.GetSiblingInvalidatingRules() > 0);
    if (inOrder) {
        size_t left = dirty.size();
        ForEachElementBelow(document, [&](Element& element) {
            if (!dirty.contains(&element)) return true;
            match(element);
            return --left > 0;
        });
    }
    for (Node* node : dirty) {
        if (!inOrder || !node->IsInDocument()) match(*node);
    }
    dirty.clear();
    pseudo_.Forget();
}

// In a full solve every element is matched where it is solved: the walk comes to it once.
void StyleSolver::MatchAfresh(Element& element, MatchContext& context) {
    constexpr uint16_t kDependencies = dom::kHoverDependent | dom::kActiveFocusDependent;
    element.pendingStyleBits &= static_cast<uint16_t>(~kDependencies);
    element.GetDirtyProperties() = PropertySet::All();
    matcher_.MatchElementStyle(element, rules_.defaults, rules_.author, context);
}

// --- Who is solved

void StyleSolver::AddRoot(Node& node) {
    if (!node.IsInDocument() || (node.pendingStyleBits & dom::kGathered)) return;
    node.pendingStyleBits |= dom::kGathered;
    roots_.push_back(&node);
}

void StyleSolver::AddRoots(Document& document, Extent extent) {
    roots_.clear();
    rootsTaken_ = 0;
    for (Node* node : taken_) {
        if (node != &document) AddRoot(*node);
    }
    if (extent == Extent::All || taken_.contains(&document)) {
        for (const auto& child : document.GetChildren())
            AddRoot(*child);
    }
    taken_.clear();
    SortByDepth(roots_);
    widest_ = std::max(widest_, roots_.size());
}

// Those that the walk has come to from above are done already.
void StyleSolver::TakeRootsOfLevel(int32_t depth) {
    for (; rootsTaken_ < roots_.size() && roots_[rootsTaken_]->GetDepth() == depth; ++rootsTaken_) {
        Node* root = roots_[rootsTaken_];
        if (root->pendingStyleBits & dom::kGathered) level_.push_back(root);
    }
}

void StyleSolver::AddChildren(const Node& node) {
    for (const auto& child : node.GetChildren())
        nextLevel_.push_back(child.get());
}

// The children of the level above have read what was dirty there.
void StyleSolver::FinishLevel() {
    for (Element* element : solvedAbove_)
        element->GetDirtyProperties().Clear();
    solvedAbove_.clear();
    solvedAbove_.swap(solved_);
    widest_ = std::max(widest_, nextLevel_.size());
    level_.swap(nextLevel_);
    nextLevel_.clear();
}

// A page that was once solved whole and then changes in small steps does not keep the room of that one run;
// it goes step by step, so that a page with large changes now and then keeps some.
void StyleSolver::GiveBackRoom() {
    constexpr uint32_t kSmall = 256;
    const uint32_t wanted = std::max(std::exchange(widest_, 0u), kSmall);
    const auto halve = [&](auto& list) {
        if (list.capacity() / 4 < wanted) return;
        list.clear();
        const uint32_t half = list.capacity() / 2;
        list.shrink_to_fit();
        list.reserve(half);
    };
    halve(roots_);
    halve(level_);
    halve(nextLevel_);
    halve(solved_);
    halve(solvedAbove_);
}

// --- Solving

void StyleSolver::SolveBelow(Document& document, Extent extent) {
    AddRoots(document, extent);
    if (roots_.empty()) return;
    sharing_.BeginRun();
    StyleRun run{document,
                 counters_,
                 sharing_,
                 textStyles_,
                 textStep_,
                 rootStyles_,
                 matcher_.GetNothing(),
                 document.GetHost().GetFontResolver(),
                 document.GetLengthContext()};
    if (extent == Extent::All) pseudo_.Take(document);
    MatchContext matching(pseudo_, &matcher_.GetSiblingMemo());
    level_.clear();
    const auto visitFrom = [&](uint32_t first) {
        for (uint32_t i = first; i < level_.size(); ++i) {
            Prefetch(i);
            Node& node = *level_[i];
            const bool isRoot = (node.pendingStyleBits & dom::kGathered) != 0;
            node.pendingStyleBits &= static_cast<uint16_t>(~dom::kGathered);
            if (extent == Extent::All) {
                node.styleSolved = 0;
                if (node.IsElement()) MatchAfresh(static_cast<Element&>(node), matching);
            }
            const bool anew = isRoot || extent == Extent::All || run.rootFontSizeChanged;
            if (SolveNode(node, anew, run) || extent == Extent::All) AddChildren(node);
        }
    };
    for (int32_t depth = roots_[0]->GetDepth();; ++depth) {
        visitFrom(0);
        const uint32_t reached = level_.size();
        TakeRootsOfLevel(depth);
        visitFrom(reached);
        FinishLevel();
        if (!level_.empty()) continue;
        if (rootsTaken_ == roots_.size()) break;
        depth = roots_[rootsTaken_]->GetDepth() - 1;
    }
    FinishLevel();
    textStep_.Forget();
    pseudo_.Forget();
    rootFontSizeChanged_ |= run.rootFontSizeChanged;
}

// The walk waits for memory more than for anything else, and knows where it goes next.
void StyleSolver::Prefetch(uint32_t from) const {
    constexpr uint32_t kFar = 8, kNear = 4, kLine = 64;
    if (from + kFar < level_.size()) {
        const char* node = reinterpret_cast<const char*>(level_[from + kFar]);
        for (size_t line = 0; line < sizeof(Element); line += kLine)
            __builtin_prefetch(node + line, 1);
    }
    if (from + kNear < level_.size()) __builtin_prefetch(level_[from + kNear]->GetChildren().data());
}

// Must the children be looked at?
bool StyleSolver::SolveNode(Node& node, bool anew, StyleRun& run) {
    if (!node.IsElement()) {
        if (node.IsText()) SolveText(node, anew, run);
        return false;
    }
    auto& element = static_cast<Element&>(node);
    const SolvedElement solved = SolveElement(element, run);
    if (solved.changeMask != 0) {
        solved_.push_back(&element);
        if (solved.changeMask != dom::kChangeSolved) run.document.NoteStyleChange(element, solved.changeMask);
    }
    return solved.reachesChildren || run.rootFontSizeChanged;
}

void StyleSolver::SolveText(Node& text, bool anew, StyleRun& run) {
    anew |= text.timesSolved == 0;
    if (text.timesSolved < 2) ++text.timesSolved;
    const PropertySet& parentDirty = static_cast<Element&>(*text.GetParent()).GetDirtyProperties();
    uint32_t mask =
        SolveTextNode(static_cast<dom::Text&>(text), anew ? PropertySet::All() : parentDirty, run);
    if (!text.styleSolved) {
        text.styleSolved = 1;
        mask |= dom::kChangeLayout;
    }
    if (text.textTransformFlag) {
        text.textTransformFlag = 0;
        mask |= dom::kChangeVisual;
    }
    if (mask != dom::kChangeSolved) run.document.NoteStyleChange(text, mask);
}

// --- Who comes into the layout, and who leaves it

// Everything displayed below a node that comes back comes back with it; each node stands in the list once,
// parents before their children.
void StyleSolver::ExpandEntered(Document& document) {
    auto& entered = document.GetStyleRunLists().enteredLayout;
    for (Node* node : entered)
        node->pendingStyleBits |= dom::kGathered;
    for (uint32_t i = 0; i < entered.size(); ++i) {
        Node* node = entered[i];
        for (const auto& child : node->GetChildren()) {
            if ((child->pendingStyleBits & dom::kGathered) || !HasDisplay(*child)) continue;
            child->pendingStyleBits |= dom::kGathered;
            entered.push_back(child.get());
        }
    }
    for (Node* node : entered)
        node->pendingStyleBits &= static_cast<uint16_t>(~dom::kGathered);
    SortForLayout(entered);
}

void StyleSolver::UpdateLayoutPresence(Document& document) {
    if (!document.IsLayoutTreeBuilt()) return;
    dom::StyleRunLists& lists = document.GetStyleRunLists();
    const auto notifyAnimations = [&](Node* node) {
        if (!node->IsElement()) return;
        lists.animation.push_back(node);
        lists.transition.push_back(node);
    };
    ExpandEntered(document);
    SortForLayout(lists.leftLayout);
    for (uint32_t i = lists.leftLayout.size(); i-- > 0;) {
        Node* node = lists.leftLayout[i];
        document.DetachLayoutNode(*node);
        notifyAnimations(node);
    }
    for (Node* node : lists.enteredLayout) {
        if (document.AttachLayoutNode(*node)) notifyAnimations(node);
    }
}

// --- Animations

// What starts in this solve shows in this frame: the nodes that the animation side touches are solved at
// once.
void StyleSolver::RunAnimations(Document& document, IAnimationSide* animations) {
    if (!animations) return;
    dom::StyleRunLists& lists = document.GetStyleRunLists();
    const auto view = [](const dom::StyleRunLists::NodeList& list) {
        return std::span<Node* const>(list.data(), list.size());
    };
    if (!lists.transitionTargets.empty()) animations->RetargetTransitions(view(lists.transitionTargets));
    if (lists.animation.empty() && lists.transition.empty()) return;
    animations->UpdateAnimations(document, view(lists.animation), view(lists.transition));
    taken_.swap(document.GetStyleDirtyNodes());
    SolveBelow(document, Extent::WhatChanged);
    if (rootStyles_.IsPending()) rootStyles_.Propagate(document);
}

}  // namespace qorvex::css
