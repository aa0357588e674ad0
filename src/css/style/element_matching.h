// Collects the rules of an index that match an element and records the winning declaration of each property.
#pragma once

#include <array>

#include "css/style/property_solver.h"
#include "css/style/rule_index.h"
#include "css/style/selector_matching.h"
#include "css/values/property_set.h"
#include "css/values/style_declaration_set.h"

namespace qorvex::css {

class ElementMatcher {
  public:
    explicit ElementMatcher(StyleCounters& counters) : counters_(counters) {}

    // The whole order for one element: default sheet, extra style, author sheets, inline style. Marks as
    // dirty whatever was matched before or is matched now. Both indexes are refreshed.
    void MatchElementStyle(dom::Element& element, RuleIndex& defaults, RuleIndex& author,
                           MatchContext& context);

    // By position, for the inspector; what depends on pseudo classes is not recorded.
    CssVector<uint64_t> GetMatchedRuleIds(RuleIndex& index, dom::Element& element, MatchContext& context);

  private:
    // What one Apply knows besides the element's match state. Nothing of it is carried to the next one, so
    // any declaration of the author replaces one of the default sheet.
    struct Offers {
        PropertySet recorded;  // properties whose entry in `specificity` belongs to this Apply
        PropertySet important;
        std::array<uint32_t, kLonghandCount> specificity;
        struct CustomOffer {
            uint32_t specificity;
            bool important;
        };
        CssHashMap<Atom, CustomOffer> custom;  // one element may have thousands
    };

    bool Apply(RuleIndex& index, dom::Element& element, MatchContext& context);
    void Collect(RuleIndex& index, dom::Element& element, MatchContext& context, bool record);
    void CollectQuick(const RuleIndex& index, const RuleIndex::Indices* indices);
    void Consider(const IndexedRule& rule, dom::Element& element, MatchContext& context, bool record);
    void OfferRule(const IndexedRule& rule, dom::Element& element);
    void OfferCustom(Atom name, const CustomPropertyPtr& record, uint32_t specificity, dom::Element& element);
    static void StoreSet(const StyleDeclarationSet& set, dom::Element& element, bool respectImportant);

    StyleCounters& counters_;
    CssVector<MatchedRule> candidates_;  // kept between elements for their memory
    Offers offers_;
};

}  // namespace qorvex::css
