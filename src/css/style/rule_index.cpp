#include "css/style/rule_index.h"

#include <algorithm>

namespace qorvex::css {
namespace {

// The simple selector that the fewest elements fulfil: an id, else a class, else a tag; null for a compound
// that has none of these.
const SimpleSelector* FindKey(const CompoundSelector& compound) {
    const SimpleSelector* best = nullptr;
    const auto rank = [](SelectorType type) {
        return type == SelectorType::Id      ? 3
               : type == SelectorType::Class ? 2
               : type == SelectorType::Tag   ? 1
                                             : 0;
    };
    for (const SimpleSelector& simple : compound.simple) {
        if (rank(simple.type) > (best ? rank(best->type) : 0)) best = &simple;
    }
    return best;
}

bool IsBefore(const IndexedRule& a, const IndexedRule& b) {
    return a.position < b.position;
}

}  // namespace

// Calls visit(list) for every list of searchable rules.
template <class Visitor>
void RuleIndex::ForEachList(Visitor&& visit) {
    visit(quickRules_);
    visit(complexRules_);
}

template <class Visitor>
void RuleIndex::ForEachRule(Visitor&& visit) {
    ForEachList([&](CssVector<IndexedRule>& list) {
        for (IndexedRule& rule : list)
            visit(rule);
    });
    for (MediaGroup& group : inactiveMediaGroups_) {
        for (IndexedRule& rule : group.rules)
            visit(rule);
    }
}

IndexedRule RuleIndex::Number(Ruleset rule) {
    IndexedRule indexed{std::move(rule)};
    indexed.ruleId = nextRuleId_++;
    indexed.position = nextPosition_++;
    return indexed;
}

void RuleIndex::CountCombinators(const ComplexSelector& selector, int32_t change) {
    if (!selector.HasCombinators()) return;
    subtreeInvalidatingRules_ += static_cast<uint32_t>(change);
    const bool reachesSiblings =
        std::any_of(selector.combinators.begin(), selector.combinators.end(),
                    [](auto c) { return c == Combinator::Adjacent || c == Combinator::Sibling; });
    if (reachesSiblings) siblingInvalidatingRules_ += static_cast<uint32_t>(change);
}

RuleBucket& RuleIndex::BucketOf(const CompoundSelector& compound) {
    const SimpleSelector* key = FindKey(compound);
    if (!key) return unkeyed_;
    if (key->type == SelectorType::Id) return byId_[key->name];
    if (key->type == SelectorType::Class) return byClass_[key->name];
    return byTag_[static_cast<size_t>(key->tag)];
}

void RuleIndex::File(IndexedRule rule) {
    ++generation_;
    CountCombinators(rule.selector, +1);
    const bool quick = rule.selector.IsQuick();
    CssVector<IndexedRule>& list = quick ? quickRules_ : complexRules_;
    if (!indexStale_) {
        RuleBucket& bucket = BucketOf(rule.selector.key);
        (quick ? bucket.quick : bucket.complex).push_back(list.size());
    }
    list.push_back(std::move(rule));
}

void RuleIndex::Rebuild() {
    const auto empty = [](RuleBucket& bucket) {
        bucket.quick.clear();
        bucket.complex.clear();
    };
    for (auto& entry : byId_)
        empty(entry.second);
    for (auto& entry : byClass_)
        empty(entry.second);
    for (RuleBucket& bucket : byTag_)
        empty(bucket);
    empty(unkeyed_);
    for (uint32_t i = 0; i < quickRules_.size(); ++i)
        BucketOf(quickRules_[i].selector.key).quick.push_back(i);
    for (uint32_t i = 0; i < complexRules_.size(); ++i)
        BucketOf(complexRules_[i].selector.key).complex.push_back(i);
    indexStale_ = false;
}

uint64_t RuleIndex::AddRule(Ruleset rule) {
    IndexedRule indexed = Number(std::move(rule));
    const uint64_t id = indexed.ruleId;
    File(std::move(indexed));
    return id;
}

RuleIdListPtr RuleIndex::AddSheet(const Stylesheet& sheet, std::span<const MediaFeatureList> media) {
    auto ids = MakeRef<RuleIdList>();
    keyframes_.append(sheet.keyframes.begin(), sheet.keyframes.end());
    fontFaces_.append(sheet.fontFaces.begin(), sheet.fontFaces.end());
    for (const MediaFeatureList& features : media)
        AddMediaGroup(features, sheet.rules, *ids);
    if (media.empty()) {
        if (quickRules_.empty()) Reserve(sheet.rules.size());
        ids->ids.reserve(sheet.rules.size());
        for (const Ruleset& rule : sheet.rules)
            ids->ids.push_back(AddRule(rule));
    }
    for (const MediaBlock& block : sheet.mediaBlocks)
        AddMediaGroup(block.features, block.rules, *ids);
    return ids;
}

void RuleIndex::AddMediaGroup(const MediaFeatureList& features, const CssVector<Ruleset>& rules,
                              RuleIdList& ids) {
    MediaGroup& group = inactiveMediaGroups_.emplace_back();
    group.features = features;
    for (const Ruleset& rule : rules) {
        group.rules.push_back(Number(rule));
        ids.ids.push_back(group.rules.back().ruleId);
    }
}

// The older position of `before` goes to the new rule; all rules from there on get fresh ones, in their
// order.
uint64_t RuleIndex::InsertRule(Ruleset rule, uint64_t before) {
    const IndexedRule* found = FindRule(before);
    if (!found) return AddRule(std::move(rule));
    const uint32_t place = found->position;
    IndexedRule inserted = Number(std::move(rule));
    const uint64_t id = inserted.ruleId;
    CssVector<IndexedRule*> later;
    ForEachRule([&](IndexedRule& other) {
        if (other.position >= place) later.push_back(&other);
    });
    // The standard asks that the rest keep their order among themselves, so renumbering follows positions.
    std::sort(later.begin(), later.end(),
              [](const IndexedRule* a, const IndexedRule* b) { return IsBefore(*a, *b); });
    for (IndexedRule* other : later)
        other->position = nextPosition_++;
    inserted.position = place;
    File(std::move(inserted));
    return id;
}

const IndexedRule* RuleIndex::FindRule(uint64_t ruleId) const {
    const IndexedRule* found = nullptr;
    const_cast<RuleIndex*>(this)->ForEachRule([&](IndexedRule& rule) {
        if (rule.ruleId == ruleId) found = &rule;
    });
    return found;
}

// Moves the rules out of the searchable lists in one pass; they come back in the order of their ids.
CssVector<IndexedRule> RuleIndex::TakeRules(std::span<const uint64_t> ruleIds) {
    CssVector<uint64_t> wanted;
    wanted.append(ruleIds);
    std::sort(wanted.begin(), wanted.end());
    CssVector<IndexedRule> taken;
    ForEachList([&](CssVector<IndexedRule>& list) {
        list.erase_if([&](IndexedRule& rule) {
            if (!std::binary_search(wanted.begin(), wanted.end(), rule.ruleId)) return false;
            CountCombinators(rule.selector, -1);
            taken.push_back(std::move(rule));
            return true;
        });
    });
    if (!taken.empty()) {
        indexStale_ = true;
        ++generation_;
    }
    std::sort(taken.begin(), taken.end(), [](const auto& a, const auto& b) { return a.ruleId < b.ruleId; });
    return taken;
}

bool RuleIndex::RemoveRule(uint64_t ruleId) {
    if (!FindRule(ruleId)) return false;
    RemoveRules({&ruleId, 1});
    return true;
}

void RuleIndex::RemoveRules(std::span<const uint64_t> ruleIds) {
    TakeRules(ruleIds);
    CssVector<uint64_t> gone;
    gone.append(ruleIds);
    std::sort(gone.begin(), gone.end());
    const auto isGone = [&](uint64_t id) { return std::binary_search(gone.begin(), gone.end(), id); };
    for (MediaGroup& group : inactiveMediaGroups_)
        group.rules.erase_if([&](const IndexedRule& rule) { return isGone(rule.ruleId); });
    for (ActiveMediaGroup& group : activeMediaGroups_)
        group.ruleIds.erase_if(isGone);
    inactiveMediaGroups_.erase_if([](const MediaGroup& group) { return group.rules.empty(); });
    activeMediaGroups_.erase_if([](const ActiveMediaGroup& group) { return group.ruleIds.empty(); });
}

bool RuleIndex::SetSelector(uint64_t ruleId, ComplexSelector selector) {
    for (MediaGroup& group : inactiveMediaGroups_) {
        for (IndexedRule& rule : group.rules) {
            if (rule.ruleId != ruleId) continue;
            rule.selector = std::move(selector);
            return true;
        }
    }
    CssVector<IndexedRule> taken = TakeRules({&ruleId, 1});
    if (taken.empty()) return false;
    taken[0].selector = std::move(selector);
    File(std::move(taken[0]));
    return true;
}

CssVector<uint64_t> RuleIndex::GetAllRuleIds() const {
    CssVector<const IndexedRule*> rules;
    const_cast<RuleIndex*>(this)->ForEachRule([&](IndexedRule& rule) { rules.push_back(&rule); });
    std::sort(rules.begin(), rules.end(), [](const auto* a, const auto* b) { return IsBefore(*a, *b); });
    CssVector<uint64_t> ids;
    for (const IndexedRule* rule : rules)
        ids.push_back(rule->ruleId);
    return ids;
}

// One pass over the index, however many groups there are.
void RuleIndex::PutToSleep(CssVector<ActiveMediaGroup>& groups) {
    CssVector<uint64_t> ids;
    for (const ActiveMediaGroup& group : groups)
        ids.append(group.ruleIds.begin(), group.ruleIds.end());
    CssVector<IndexedRule> taken = TakeRules({ids.data(), ids.size()});
    for (ActiveMediaGroup& group : groups) {
        MediaGroup& sleeping = inactiveMediaGroups_.emplace_back();
        sleeping.features = std::move(group.features);
        for (const uint64_t id : group.ruleIds) {
            IndexedRule* rule =
                std::lower_bound(taken.begin(), taken.end(), id,
                                 [](const auto& rule, uint64_t id) { return rule.ruleId < id; });
            if (rule != taken.end() && rule->ruleId == id) sleeping.rules.push_back(std::move(*rule));
        }
    }
}

bool RuleIndex::UpdateMedia(const LengthContext& metrics) {
    bool moved = false;
    CssVector<ActiveMediaGroup> activated;
    inactiveMediaGroups_.erase_if([&](MediaGroup& group) {
        if (!EvaluateMedia(group.features, metrics)) return false;
        ActiveMediaGroup& active = activated.emplace_back();
        active.features = std::move(group.features);
        for (IndexedRule& rule : group.rules) {
            active.ruleIds.push_back(rule.ruleId);
            File(std::move(rule));
        }
        return moved = true;
    });
    CssVector<ActiveMediaGroup> ended;
    activeMediaGroups_.erase_if([&](ActiveMediaGroup& group) {
        if (EvaluateMedia(group.features, metrics)) return false;
        ended.push_back(std::move(group));
        return moved = true;
    });
    PutToSleep(ended);
    for (ActiveMediaGroup& group : activated)
        activeMediaGroups_.push_back(std::move(group));
    return moved;
}

}  // namespace qorvex::css
