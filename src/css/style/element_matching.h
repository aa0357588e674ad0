// Collects the rules that match an element and finds the winning declaration of each property.
//
// Elements that the same rules match, and that have no declarations of their own, get one shared match state:
// the cascade among those rules is worked out once, and that two elements have the same winners is seen by
// address.
#pragma once

#include <array>

#include "css/style/property_solver.h"
#include "css/style/rule_index.h"
#include "css/style/selector_matching.h"
#include "css/values/match_state.h"
#include "css/values/style_declaration_set.h"

namespace qorvex::css {

class ElementMatcher {
  public:
    explicit ElementMatcher(StyleCounters& counters) : counters_(counters) {}

    // The whole order for one element: default sheet, extra style, author sheets, inline style. Marks as
    // dirty what is won by another declaration than before, and all that the element declares for itself.
    void MatchElementStyle(dom::Element& element, RuleIndex& defaults, RuleIndex& author,
                           MatchContext& context);

    // By position, for the inspector; what depends on pseudo classes is not recorded.
    CssVector<uint64_t> GetMatchedRuleIds(RuleIndex& index, dom::Element& element, MatchContext& context);

    // For the passes of matching.
    SiblingMemo& GetSiblingMemo() { return siblings_; }

    // What an element has that was never matched.
    const MatchState& GetNothing() const { return *nothing_; }

  private:
    // A rule that matched. Sorted by position, since that is what the cascade goes by.
    struct Candidate {
        uint32_t position;
        const IndexedRule* rule;
    };
    using Candidates = CssVector<Candidate>;
    struct Offer {
        uint32_t specificity;
        bool important;
    };
    // What the offers to one element have come to. `recorded`, `important` and the specificities belong to
    // one index: nothing of them is carried from the default sheet to the author's, so any declaration of the
    // author replaces a default one.
    struct Cascade {
        PropertySet properties;
        PropertySet own;
        PropertySet recorded;
        PropertySet important;
        std::array<const Declaration*, kLonghandCount> winners;
        std::array<uint32_t, kLonghandCount> specificity;
        CustomPropertyMap custom;
        CssHashMap<Atom, Offer> customOffers;
    };
    // The match state of the elements that exactly these rules match.
    struct Known {
        CssVector<const IndexedRule*> rules;
        MatchStatePtr state;
    };

    void Collect(RuleIndex& index, dom::Element& element, MatchContext& context, bool record);
    void CollectBucket(const RuleIndex& index, const RuleBucket& bucket, dom::Element& element,
                       MatchContext& context, bool record);
    MatchStatePtr FindKnown(const RuleIndex& defaults, const RuleIndex& author);
    void BeginCascade();
    void OfferAll(const Candidates& candidates);
    void OfferRule(const IndexedRule& rule);
    void OfferCustom(Atom name, const CustomPropertyPtr& record, uint32_t specificity);
    void StoreSet(const StyleDeclarationSet& set, bool respectImportant);
    RefPtr<MatchState> TakeSpare();

    StyleCounters& counters_;
    SiblingMemo siblings_;
    RefPtr<MatchState> nothing_ = MakeRef<MatchState>();
    // The rest is kept between elements for its memory.
    Candidates candidates_;
    Candidates defaultCandidates_;
    Cascade cascade_;
    // Of an element with declarations of its own; each match swaps it against the one that the element had.
    RefPtr<MatchState> spare_;
    CssHashMap<uint64_t, Known> known_;
    uint64_t knownGenerations_ = 0;
};

}  // namespace qorvex::css
