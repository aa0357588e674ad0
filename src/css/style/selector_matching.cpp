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
    return simple.tag != TagId::Custom || element.GetNodeName() == simple.name;
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
                    break;
                case Combinator::Child:
                    at = ParentElement(*at);
                    if (at && !Test(index, *at)) at = nullptr;
                    break;
                case Combinator::Adjacent:
                    at = AdjacentRun(*at, index, index);
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
        const auto children = element.GetParent()->GetChildren();
        if (context_.hintParent == element.GetParent()) {
            // Matching goes through siblings in order, so the element is where the last one was or soon
            // behind it.
            const size_t end = std::min(context_.hintIndex + 4, children.size());
            for (size_t i = context_.hintIndex; i < end; ++i) {
                if (children[i].get() == &element) return context_.hintIndex = i;
            }
        }
        size_t index = 0;
        while (children[index].get() != &element)
            ++index;
        context_.hintParent = element.GetParent();
        return context_.hintIndex = index;
    }

    static Element* PreviousElement(std::span<const RefPtr<Node>> children, size_t& index) {
        while (index > 0) {
            Node* node = children[--index].get();
            if (node->IsElement()) return static_cast<Element*>(node);
        }
        return nullptr;
    }

    // The compounds first to last, joined by "+", must match the elements straight before `from`.
    Element* AdjacentRun(Element& from, size_t first, size_t last) {
        if (!from.GetParent()) return nullptr;
        const auto children = from.GetParent()->GetChildren();
        size_t place = IndexOf(from);
        Element* at = nullptr;
        for (size_t index = first; index <= last; ++index) {
            at = PreviousElement(children, place);
            if (!at || !Test(index, *at)) return nullptr;
        }
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
        size_t place = IndexOf(from);
        while (Element* candidate = PreviousElement(children, place)) {
            if (!Test(first, *candidate)) continue;
            size_t runPlace = place;
            Element* at = candidate;
            for (size_t next = first + 1; next <= index && at; ++next) {
                at = PreviousElement(children, runPlace);
                if (at && !Test(next, *at)) at = nullptr;
            }
            if (at) return at;
        }
        return nullptr;
    }

    const ComplexSelector& selector_;
    MatchContext& context_;
    const bool record_;
};

}  // namespace

bool MatchSelector(const ComplexSelector& selector, dom::Element& element, MatchContext& context,
                   bool recordDependencies) {
    if (!Matches(selector.key, element, context, recordDependencies)) return false;
    if (!selector.HasCombinators()) return true;
    return LeftwardWalk(selector, context, recordDependencies).Run(element);
}

}  // namespace qorvex::css
