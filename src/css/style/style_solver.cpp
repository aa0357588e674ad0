#include "css/style/style_solver.h"

#include <algorithm>

#include "core/logging/log.h"
#include "css/style/element_solver.h"
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

bool HasDisplay(const Node& node) {
    return node.GetStyle().layout->display != CSSDisplay::None;
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
        GatherAll(document);
        MatchAll(document);
        document.ClearFullStyleSolve();
    } else {
        MatchDirtyElements(document);
        Gather(document);
    }
    taken_.clear();
    SolveGathered(document);
    if (rootStyles_.IsPending()) rootStyles_.Propagate(document);
    for (Node* node : lists.textTransform)
        node->OnComputedStyleChanged();
    UpdateLayoutPresence(document);
    ClearDirtyProperties();
    RunAnimations(document, animations);
    lists.Clear();
}

// --- Who is matched

void StyleSolver::MatchDirtyElements(Document& document) {
    dom::NodeSet& dirty = document.GetSelectorDirtyElements();
    if (dirty.empty()) return;
    const PseudoState pseudo(document);
    MatchContext context(pseudo);
    for (Node* node : dirty)
        matcher_.MatchElementStyle(static_cast<Element&>(*node), rules_.defaults, rules_.author, context);
    dirty.clear();
}

void StyleSolver::GatherAll(Document& document) {
    queue_.clear();
    elements_.clear();
    texts_.clear();
    for (const auto& child : document.GetChildren())
        Visit(*child);
    WalkGathered();
    for (Node* node : queue_)
        node->styleSolved = 0;
}

void StyleSolver::MatchAll(Document& document) {
    const PseudoState pseudo(document);
    MatchContext context(pseudo);
    constexpr uint16_t kDependencies = dom::kHoverDependent | dom::kActiveFocusDependent;
    for (Element* element : elements_) {
        element->pendingStyleBits &= static_cast<uint16_t>(~kDependencies);
        element->GetDirtyProperties() = PropertySet::All();
    }
    for (Element* element : elements_)
        matcher_.MatchElementStyle(*element, rules_.defaults, rules_.author, context);
}

// --- Who is solved

void StyleSolver::Gather(Document& document) {
    queue_.clear();
    elements_.clear();
    texts_.clear();
    for (Node* node : taken_) {
        if (node != &document) {
            Visit(*node);
            continue;
        }
        for (const auto& child : document.GetChildren())
            Visit(*child);
    }
    WalkGathered();
    SortByDepth(elements_);
}

void StyleSolver::Visit(Node& node) {
    if ((node.pendingStyleBits & dom::kGathered) || !node.IsInDocument()) return;
    node.pendingStyleBits |= dom::kGathered;
    queue_.push_back(&node);
}

// Breadth first, from what stands in the queue. A child is visited even if nothing of its own is dirty: it
// may take a change from its parent.
void StyleSolver::WalkGathered() {
    for (uint32_t i = 0; i < queue_.size(); ++i) {
        Node& node = *queue_[i];
        if (node.IsElement()) {
            elements_.push_back(static_cast<Element*>(&node));
        } else if (node.IsText()) {
            texts_.push_back(&node);
        } else {
            node.pendingStyleBits &= static_cast<uint16_t>(~dom::kGathered);
        }
        for (const auto& child : node.GetChildren())
            Visit(*child);
    }
}

// --- Solving

void StyleSolver::SolveGathered(Document& document) {
    sharing_.BeginRun();
    StyleRun run{document,
                 counters_,
                 sharing_,
                 textStyles_,
                 rootStyles_,
                 document.GetHost().GetFontResolver(),
                 document.GetLengthContext()};
    for (Element* element : elements_) {
        element->pendingStyleBits &= static_cast<uint16_t>(~dom::kGathered);
        const uint32_t mask = SolveElement(*element, run);
        if (mask == 0) continue;
        solved_.push_back(element);
        if (mask != dom::kChangeSolved) document.NoteStyleChange(*element, mask);
    }
    for (Node* text : texts_)
        SolveText(*text, run);
    rootFontSizeChanged_ |= run.rootFontSizeChanged;
}

void StyleSolver::SolveText(Node& text, StyleRun& run) {
    text.pendingStyleBits &= static_cast<uint16_t>(~dom::kGathered);
    if (text.timesSolved < 2) ++text.timesSolved;
    uint32_t mask = SolveTextNode(text, run);
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

void StyleSolver::ClearDirtyProperties() {
    for (Element* element : solved_)
        element->GetDirtyProperties().Clear();
    solved_.clear();
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
    SortByDepth(entered);
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
    Gather(document);
    taken_.clear();
    SolveGathered(document);
    if (rootStyles_.IsPending()) rootStyles_.Propagate(document);
    ClearDirtyProperties();
}

}  // namespace qorvex::css
