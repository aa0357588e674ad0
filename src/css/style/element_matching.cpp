#include "css/style/element_matching.h"

#include <algorithm>

#include "core/limits.h"
#include "dom/element.h"

namespace qorvex::css {

using dom::Element;

// --- Which rules

void ElementMatcher::CollectBucket(const RuleIndex& index, const RuleBucket& bucket, Element& element,
                                   MatchContext& context, bool record) {
    for (const uint32_t i : bucket.quick) {
        const IndexedRule& rule = index.QuickRule(i);
        candidates_.push_back({rule.position, &rule});
    }
    for (const uint32_t i : bucket.complex) {
        const IndexedRule& rule = index.ComplexRule(i);
        if (MatchSelector(rule.selector, element, context, record))
            candidates_.push_back({rule.position, &rule});
    }
}

void ElementMatcher::Collect(RuleIndex& index, Element& element, MatchContext& context, bool record) {
    candidates_.clear();
    if (index.IsEmpty()) return;
    index.Refresh();
    for (const Atom name : element.GetClasses()) {
        if (const RuleBucket* bucket = index.FindByClass(name))
            CollectBucket(index, *bucket, element, context, record);
    }
    if (element.Is(dom::kHasId)) {
        if (const RuleBucket* bucket = index.FindById(element.GetId()))
            CollectBucket(index, *bucket, element, context, record);
    }
    const TagId tag = element.GetTag();
    CollectBucket(index, index.FindByTag(tag), element, context, record);
    if (tag == TagId::Custom) {
        // One bucket serves all custom tags; the quick rules in it were taken without a look at the name.
        const Atom name = element.GetMarkupName();
        candidates_.erase_if([&](const Candidate& candidate) {
            const SimpleSelector& key = candidate.rule->selector.key.simple[0];
            return candidate.rule->selector.IsQuick() && key.type == SelectorType::Tag && key.name != name;
        });
    }
    CollectBucket(index, index.GetUnkeyed(), element, context, record);
    std::sort(candidates_.begin(), candidates_.end(),
              [](const Candidate& a, const Candidate& b) { return a.position < b.position; });
    // An element with the same class twice finds the class's rules twice.
    const auto same = [](const Candidate& a, const Candidate& b) { return a.position == b.position; };
    candidates_.erase(std::unique(candidates_.begin(), candidates_.end(), same), candidates_.end());
}

CssVector<uint64_t> ElementMatcher::GetMatchedRuleIds(RuleIndex& index, Element& element,
                                                      MatchContext& context) {
    Collect(index, element, context, false);
    CssVector<uint64_t> ids;
    for (const Candidate& candidate : candidates_)
        ids.push_back(candidate.rule->ruleId);
    return ids;
}

// --- Which of their declarations

void ElementMatcher::BeginCascade() {
    cascade_.properties.Clear();
    cascade_.own.Clear();
    cascade_.custom.clear();
}

void ElementMatcher::OfferAll(const Candidates& candidates) {
    cascade_.recorded.Clear();
    cascade_.important.Clear();
    cascade_.customOffers.clear();
    for (const Candidate& candidate : candidates)
        OfferRule(*candidate.rule);
}

void ElementMatcher::OfferRule(const IndexedRule& rule) {
    const uint32_t specificity = rule.selector.specificity.AsNumber();
    for (const Declaration& declaration : rule.declarations()) {
        const PropertyId id = declaration.property();
        if (cascade_.recorded.Contains(id)) {
            if (!declaration.important() && cascade_.important.Contains(id)) continue;
            if (cascade_.specificity[IndexOf(id)] > specificity) continue;
        }
        cascade_.properties.Add(id);
        cascade_.own.Remove(id);
        cascade_.winners[IndexOf(id)] = &declaration;
        cascade_.recorded.Add(id);
        cascade_.specificity[IndexOf(id)] = specificity;
        if (declaration.important()) cascade_.important.Add(id);
    }
    for (const auto& entry : rule.customProperties())
        OfferCustom(entry.first, entry.second, specificity);
}

void ElementMatcher::OfferCustom(Atom name, const CustomPropertyPtr& record, uint32_t specificity) {
    const bool important = (record->flags & kImportant) != 0;
    const auto [known, isNew] = cascade_.customOffers.try_emplace(name, Offer{specificity, important});
    if (!isNew) {
        Offer& offer = known->second;
        if ((offer.important && !important) || offer.specificity > specificity) return;
        offer.specificity = specificity;
        offer.important |= important;
    }
    cascade_.custom.insert_or_assign(name, record);
}

void ElementMatcher::StoreSet(const StyleDeclarationSet& set, bool respectImportant) {
    for (const Declaration& declaration : set.declarations()) {
        const PropertyId id = declaration.property();
        if (respectImportant && cascade_.properties.Contains(id) &&
            cascade_.winners[IndexOf(id)]->important() && !declaration.important())
            continue;
        cascade_.properties.Add(id);
        cascade_.own.Add(id);
        cascade_.winners[IndexOf(id)] = &declaration;
    }
    for (const auto& entry : set.customProperties())
        cascade_.custom.insert_or_assign(entry.first, entry.second);
}

// --- The result

MatchStatePtr ElementMatcher::FindKnown(const RuleIndex& defaults, const RuleIndex& author) {
    // Both numbers only grow, and they change one at a time.
    const uint64_t generations = defaults.GetGeneration() + author.GetGeneration();
    if (generations != knownGenerations_ || known_.size() >= limits::kCachedMatches) known_.clear();
    knownGenerations_ = generations;

    const uint32_t count = defaultCandidates_.size() + candidates_.size();
    const auto ruleAt = [&](uint32_t i) {
        return i < defaultCandidates_.size() ? defaultCandidates_[i].rule
                                             : candidates_[i - defaultCandidates_.size()].rule;
    };
    uint64_t hash = count;
    for (uint32_t i = 0; i < count; ++i)
        hash = (hash ^ reinterpret_cast<uintptr_t>(ruleAt(i))) * 0x9E3779B97F4A7C15ull + (hash >> 29);
    Known& known = known_[hash];
    bool same = known.state && known.rules.size() == count;
    for (uint32_t i = 0; same && i < count; ++i)
        same = known.rules[i] == ruleAt(i);
    if (same) return known.state;

    BeginCascade();
    OfferAll(defaultCandidates_);
    OfferAll(candidates_);
    known.rules.clear();
    for (uint32_t i = 0; i < count; ++i)
        known.rules.push_back(ruleAt(i));
    RefPtr<MatchState> state = MakeRef<MatchState>();
    state->Fill(cascade_.properties, cascade_.own, cascade_.winners.data());
    state->FillCustomProperties(cascade_.custom);
    known.state = state;
    return state;
}

RefPtr<MatchState> ElementMatcher::TakeSpare() {
    return spare_ ? std::move(spare_) : MakeRef<MatchState>();
}

void ElementMatcher::MatchElementStyle(Element& element, RuleIndex& defaults, RuleIndex& author,
                                       MatchContext& context) {
    ++counters_.elementsMatched;
    element.pendingStyleBits &= static_cast<uint16_t>(
        ~(dom::kQueuedForMatching | dom::kHoverDependentQueued | dom::kActiveFocusDependentQueued));
    Collect(defaults, element, context, true);
    candidates_.swap(defaultCandidates_);
    Collect(author, element, context, true);

    const StyleDeclarationSet* extra = element.GetExtraStyle();
    const StyleDeclarationSet* inlineStyle = element.GetInlineStyle();
    MatchStatePtr next;
    if (extra || inlineStyle) {
        BeginCascade();
        OfferAll(defaultCandidates_);
        if (extra) StoreSet(*extra, false);
        OfferAll(candidates_);
        if (inlineStyle) StoreSet(*inlineStyle, true);
        RefPtr<MatchState> own = TakeSpare();
        own->Fill(cascade_.properties, cascade_.own, cascade_.winners.data());
        own->FillCustomProperties(cascade_.custom);
        next = std::move(own);
    } else {
        next = FindKnown(defaults, author);
    }
    const MatchState* before = element.GetMatchState();
    element.GetDirtyProperties() |= MatchState::Difference(before ? *before : *nothing_, *next);
    MatchStatePtr old = element.SetMatchState(std::move(next));
    // Nobody else has it any more, so it may be filled anew.
    if (old && old->HasOneRef() && !spare_) spare_ = RefPtr<MatchState>(const_cast<MatchState*>(old.get()));
}

}  // namespace qorvex::css
