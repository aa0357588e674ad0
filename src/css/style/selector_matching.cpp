#include "css/style/selector_matching.h"

#include "css/style/attribute_matching.h"
#include "dom/element.h"

namespace qorvex::css {
namespace {

using dom::Element;
using dom::Node;

enum class CompoundResult : uint8_t { NoMatch, Match, MatchApartFromPseudoState };

bool MatchesTag(const SimpleSelector& simple, const Element& element) {
    if (element.GetTag() != simple.tag) return false;
    return simple.tag != TagId::Custom || element.GetMarkupName() == simple.name;
}

void RecordDependencies(Element& element, uint8_t usedPseudoBits) {
    uint16_t flags = 0;
    if (usedPseudoBits & kPseudoHover) flags |= dom::kHoverDependent;
    if (usedPseudoBits & (kPseudoActive | kPseudoFocus)) flags |= dom::kActiveFocusDependent;
    if (element.pendingStyleBits & dom::kQueuedForMatching) {
        if (flags & dom::kHoverDependent) flags |= dom::kHoverDependentQueued;
        if (flags & dom::kActiveFocusDependent) flags |= dom::kActiveFocusDependentQueued;
    }
    element.pendingStyleBits |= flags;
}

// What most compounds consist of.
inline bool TestName(const SimpleSelector& simple, const Element& element) {
    if (simple.type == SelectorType::Class) return element.HasClass(simple.name);
    if (simple.type == SelectorType::Tag) return MatchesTag(simple, element);
    return element.Is(dom::kHasId) && element.GetId() == simple.name;
}
inline bool IsName(const CompoundSelector& compound) {
    if (compound.simple.size() != 1) return false;
    const SelectorType type = compound.simple[0].type;
    return type == SelectorType::Class || type == SelectorType::Tag || type == SelectorType::Id;
}

// Whether a pseudo class is missing is settled last: an element that would match on hover must be known as
// depending on it even while the pointer is elsewhere.
CompoundResult TestCompound(const CompoundSelector& compound, Element& element, const MatchContext& context,
                            bool record) {
    uint8_t usedPseudoBits = 0;
    for (const SimpleSelector& simple : compound.simple) {
        bool matches = true;
        switch (simple.type) {
            case SelectorType::Universal:
                break;
            case SelectorType::Tag:
            case SelectorType::Id:
            case SelectorType::Class:
                matches = TestName(simple, element);
                break;
            case SelectorType::Pseudo:
                usedPseudoBits |= uint8_t(1u << static_cast<unsigned>(simple.pseudo));
                break;
            case SelectorType::Attribute:
                matches = MatchAttribute(simple, element);
                break;
        }
        if (!matches) return CompoundResult::NoMatch;
    }
    if (usedPseudoBits == 0) return CompoundResult::Match;
    if (record) RecordDependencies(element, usedPseudoBits);
    const bool holds = (context.pseudo.BitsOf(element) & usedPseudoBits) == usedPseudoBits;
    return holds ? CompoundResult::Match : CompoundResult::MatchApartFromPseudoState;
}

inline bool Matches(const CompoundSelector& compound, Element& element, const MatchContext& context,
                    bool record) {
    if (IsName(compound)) return TestName(compound.simple[0], element);
    return TestCompound(compound, element, context, record) == CompoundResult::Match;
}

inline Element* ParentElement(const Element& element) {
    Node* parent = element.GetParent();
    if (!parent || (parent->GetFlags() & (dom::kIsElement | dom::kIsDocument)) != dom::kIsElement)
        return nullptr;
    return static_cast<Element*>(parent);
}

// Walks a selector from the key leftward. `index` counts compounds and the combinators to their right.
class LeftwardWalk {
  public:
    LeftwardWalk(const ComplexSelector& selector, MatchContext& context, bool record)
        : selector_(selector), context_(context), record_(record) {}

    bool Run(Element& start) {
        Element* at = &start;
        for (size_t index = 0; index < selector_.combinators.size();) {
            switch (selector_.combinators[index]) {
                case Combinator::Descendant:
                    at = NearestAncestor(*at, index);
                    place_ = kUnknown;
                    break;
                case Combinator::Child:
                    at = ParentElement(*at);
                    place_ = kUnknown;
                    if (at && !Test(index, *at)) at = nullptr;
                    break;
                case Combinator::Adjacent:
                    at = Adjacent(*at, index);
                    break;
                case Combinator::Sibling:
                    at = NearestSiblingRun(*at, index);
                    break;
            }
            if (!at) return false;
            ++index;
        }
        return true;
    }

  private:
    using Siblings = std::span<const RefPtr<Node>>;
    // Where the first compound of a run matches, and where the last one does.
    struct RunPlace {
        uint32_t match = SiblingMemo::kNowhere;
        uint32_t start = SiblingMemo::kNowhere;
    };

    bool Test(size_t index, Element& element) const {
        return Matches(selector_.compounds[index], element, context_, record_);
    }

    Element* NearestAncestor(Element& from, size_t index) const {
        for (Element* ancestor = ParentElement(from); ancestor; ancestor = ParentElement(*ancestor)) {
            if (Test(index, *ancestor)) return ancestor;
        }
        return nullptr;
    }

    // Where the element stands among its parent's children.
    size_t IndexOf(const Element& element) {
        // Known where the last step went along siblings.
        if (place_ != kUnknown) return place_;
        if (context_.siblings) return context_.siblings->IndexOf(element);
        const auto children = element.GetParent()->GetChildren();
        size_t index = 0;
        while (children[index].get() != &element)
            ++index;
        return index;
    }

    Element* PreviousElement(Siblings children, size_t& index) const {
        while (index > 0) {
            if (context_.siblings) context_.siblings->CountStep();
            Node* node = children[--index].get();
            if (node->IsElement()) return static_cast<Element*>(node);
        }
        return nullptr;
    }

    // The compounds first to last, joined by "+", must match the elements straight before `place`, which ends
    // at the leftmost of them.
    Element* AdjacentRun(Siblings children, size_t& place, size_t first, size_t last) const {
        Element* at = nullptr;
        for (size_t index = first; index <= last; ++index) {
            at = PreviousElement(children, place);
            if (!at || !Test(index, *at)) return nullptr;
        }
        return at;
    }

    Element* Adjacent(Element& from, size_t index) {
        if (!from.GetParent()) return nullptr;
        size_t place = IndexOf(from);
        Element* at = AdjacentRun(from.GetParent()->GetChildren(), place, index, index);
        place_ = place;
        return at;
    }

    // A "~" and the run of "+" to its left are taken together: the nearest place where the whole run matches
    // decides, since all that may follow (a parent, or an earlier sibling) is within reach from there if it
    // is from any farther place. `index` ends at the last compound of the run.
    Element* NearestSiblingRun(Element& from, size_t& index) {
        if (!from.GetParent()) return nullptr;
        const size_t first = index;
        while (index + 1 < selector_.combinators.size() &&
               selector_.combinators[index + 1] == Combinator::Adjacent)
            ++index;
        const auto children = from.GetParent()->GetChildren();
        const size_t place = IndexOf(from);
        const RunPlace run = context_.siblings && place > kFew
                                 ? RememberedRun(*from.GetParent(), place, first, index)
                                 : NearestRun(children, place, 0, first, index);
        if (run.match == SiblingMemo::kNowhere) return nullptr;
        place_ = run.start;
        return static_cast<Element*>(children[run.start].get());
    }

    // The run whose first compound matches nearest before `place`, but not before `end`.
    RunPlace NearestRun(Siblings children, size_t place, size_t end, size_t first, size_t last) const {
        while (place > end) {
            Element* candidate = PreviousElement(children, place);
            if (!candidate || place < end) break;
            if (!Test(first, *candidate)) continue;
            size_t start = place;
            if (first == last || AdjacentRun(children, start, first + 1, last))
                return {static_cast<uint32_t>(place), static_cast<uint32_t>(start)};
        }
        return {};
    }

    // The same from `place` to the first child, of which only what this pass has not yet seen is walked.
    RunPlace RememberedRun(const Node& parent, size_t place, size_t first, size_t last) const {
        SiblingMemo::Scan& scan = context_.siblings->Find(&selector_.compounds[first], parent);
        const RunPlace known{scan.match, scan.runStart};
        const bool reaches = place >= scan.scannedTo;
        // The match nearest to a farther place, if it lies before this one, is the nearest to this one too.
        if (!reaches && (known.match == SiblingMemo::kNowhere || known.match < place)) return known;
        RunPlace run = NearestRun(parent.GetChildren(), place, reaches ? scan.scannedTo : 0, first, last);
        if (reaches && run.match == SiblingMemo::kNowhere) run = known;
        scan.scannedTo = static_cast<uint32_t>(place);
        scan.match = run.match;
        scan.runStart = run.start;
        return run;
    }

    static constexpr size_t kUnknown = SIZE_MAX;
    // So few siblings are walked sooner than looked up.
    static constexpr size_t kFew = 16;

    const ComplexSelector& selector_;
    MatchContext& context_;
    const bool record_;
    size_t place_ = kUnknown;  // of the element that the walk has come to
};

}  // namespace

bool MatchSelector(const ComplexSelector& selector, dom::Element& element, MatchContext& context,
                   bool recordDependencies) {
    if (!Matches(selector.key, element, context, recordDependencies)) return false;
    if (!selector.HasCombinators()) return true;
    return LeftwardWalk(selector, context, recordDependencies).Run(element);
}

}  // namespace qorvex::css
