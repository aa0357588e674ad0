#include "css/style/element_matching.h"

#include <algorithm>

#include "dom/element.h"

namespace qorvex::css {

using dom::Element;

void ElementMatcher::CollectQuick(const RuleIndex& index, const RuleIndex::Indices* indices) {
    if (!indices) return;
    for (const uint32_t i : *indices) {
        const IndexedRule& rule = index.QuickRule(i);
        candidates_.push_back({rule.ruleId, rule.position, &rule});
    }
}

void ElementMatcher::Consider(const IndexedRule& rule, Element& element, MatchContext& context, bool record) {
    if (MatchSelector(rule.selector, element, context, record))
        candidates_.push_back({rule.ruleId, rule.position, &rule});
}

void ElementMatcher::Collect(RuleIndex& index, Element& element, MatchContext& context, bool record) {
    candidates_.clear();
    index.Refresh();
    const TagId tag = element.GetTag();
    for (const Atom name : element.GetClasses()) {
        CollectQuick(index, index.FindQuickByClass(name));
        if (const auto* rules = index.FindComplexByClass(name)) {
            for (const IndexedRule& rule : *rules)
                Consider(rule, element, context, record);
        }
    }
    const bool hasId = element.Is(dom::kHasId);
    if (hasId) CollectQuick(index, index.FindQuickById(element.GetId()));
    if (tag != TagId::Custom) {
        CollectQuick(index, &index.FindQuickByTag(tag));
    } else {
        const Atom name = element.GetNodeName();
        for (const uint32_t i : index.FindQuickByTag(tag)) {
            const IndexedRule& rule = index.QuickRule(i);
            if (rule.selector.key.simple[0].name == name)
                candidates_.push_back({rule.ruleId, rule.position, &rule});
        }
    }
    CollectQuick(index, &index.GetQuickUniversal());

    const std::span<const SelectorKey> keys = index.GetComplexKeys();
    const Atom id = element.GetId();
    for (size_t i = 0; i < keys.size(); ++i) {
        const SelectorKey& key = keys[i];
        if (key.type == SelectorType::Tag ? key.tag != tag
                                          : key.type == SelectorType::Id && (!hasId || key.name != id))
            continue;
        Consider(index.ComplexRule(i), element, context, record);
    }

    // An element with the same class twice finds the class's rules twice; they are the same rules, and once
    // is enough.
    std::sort(candidates_.begin(), candidates_.end(),
              [](const MatchedRule& a, const MatchedRule& b) { return a.position < b.position; });
}

void ElementMatcher::OfferRule(const IndexedRule& rule, Element& element) {
    MatchState& state = element.GetMatchState();
    PropertySet& dirty = element.GetDirtyProperties();
    const uint32_t specificity = rule.selector.specificity.AsNumber();
    for (const Declaration& declaration : rule.declarations()) {
        const PropertyId id = declaration.property();
        if (offers_.recorded.Contains(id)) {
            if (!declaration.important() && offers_.important.Contains(id)) continue;
            if (offers_.specificity[IndexOf(id)] > specificity) continue;
        }
        state.Store(declaration);
        dirty.Add(id);
        offers_.recorded.Add(id);
        offers_.specificity[IndexOf(id)] = specificity;
        if (declaration.important()) offers_.important.Add(id);
    }
    for (const auto& entry : rule.customProperties())
        OfferCustom(entry.first, entry.second, specificity, element);
}

void ElementMatcher::OfferCustom(Atom name, const CustomPropertyPtr& record, uint32_t specificity,
                                 Element& element) {
    const bool important = (record->flags & kImportant) != 0;
    Offers::CustomOffer* known = offers_.custom.get(name);
    if (!known) {
        offers_.custom.insert_or_assign(name, Offers::CustomOffer{specificity, important});
    } else {
        if (known->important && !important) return;
        if (known->specificity > specificity) return;
        known->specificity = specificity;
        known->important |= important;
    }
    element.GetMatchState().customProperties().insert_or_assign(name, record);
    element.GetDirtyProperties() = PropertySet::All();  // any property may depend on it
}

bool ElementMatcher::Apply(RuleIndex& index, Element& element, MatchContext& context) {
    if (index.IsEmpty()) return false;
    Collect(index, element, context, true);
    offers_.recorded.Clear();
    offers_.important.Clear();
    offers_.custom.clear();
    for (const MatchedRule& matched : candidates_)
        OfferRule(*matched.rule, element);
    return !candidates_.empty();
}

void ElementMatcher::StoreSet(const StyleDeclarationSet& set, Element& element, bool respectImportant) {
    MatchState& state = element.GetMatchState();
    for (const Declaration& declaration : set.declarations()) {
        const MatchState::Slot* slot = respectImportant ? state.Find(declaration.property()) : nullptr;
        if (slot && (slot->flags & kImportant) && !declaration.important()) continue;
        state.Store(declaration);
        element.GetDirtyProperties().Add(declaration.property());
    }
    for (const auto& entry : set.customProperties()) {
        state.customProperties().insert_or_assign(entry.first, entry.second);
        element.GetDirtyProperties() = PropertySet::All();
    }
}

void ElementMatcher::MatchElementStyle(Element& element, RuleIndex& defaults, RuleIndex& author,
                                       MatchContext& context) {
    ++counters_.elementsMatched;
    element.pendingStyleBits &= static_cast<uint16_t>(
        ~(dom::kQueuedForMatching | dom::kHoverDependentQueued | dom::kActiveFocusDependentQueued));
    MatchState& state = element.GetMatchState();
    PropertySet& dirty = element.GetDirtyProperties();
    for (const MatchState::Slot& slot : state.slots())
        dirty.Add(slot.property);
    if (!state.customProperties().empty()) dirty = PropertySet::All();
    state.Reset();
    Apply(defaults, element, context);
    if (const StyleDeclarationSet* extra = element.GetExtraStyle()) StoreSet(*extra, element, false);
    Apply(author, element, context);
    if (const StyleDeclarationSet* inlineStyle = element.GetInlineStyle())
        StoreSet(*inlineStyle, element, true);
}

CssVector<uint64_t> ElementMatcher::GetMatchedRuleIds(RuleIndex& index, Element& element,
                                                      MatchContext& context) {
    Collect(index, element, context, false);
    CssVector<uint64_t> ids;
    for (const MatchedRule& matched : candidates_)
        ids.push_back(matched.ruleId);
    return ids;
}

}  // namespace qorvex::css
