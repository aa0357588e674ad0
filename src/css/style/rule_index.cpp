#include "css/style/rule_index.h"

#include <algorithm>

namespace qorvex::css {
namespace {

const SimpleSelector* FindClass(const CompoundSelector& compound) {
    for (const SimpleSelector& simple : compound.simple) {
        if (simple.type == SelectorType::Class) return &simple;
    }
    return nullptr;
}

// Ids refuse more elements than tags do.
SelectorKey MakeKey(const ComplexSelector& selector) {
    SelectorKey key;
    for (const SimpleSelector& simple : selector.key.simple) {
        if (simple.type == SelectorType::Id) return {SelectorType::Id, TagId::Any, simple.name};
        if (simple.type == SelectorType::Tag) key = {SelectorType::Tag, simple.tag, simple.name};
    }
    return key;
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
    for (auto& entry : complexRulesByClass_)
        visit(entry.second);
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

uint32_t RuleIndex::GetSearchableRuleCount() const {
    return quickRules_.size() + complexRules_.size() + complexByClassCount_;
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

void RuleIndex::NoteQuickRule(uint32_t index) {
    const SimpleSelector& key = quickRules_[index].selector.key.simple[0];
    switch (key.type) {
        case SelectorType::Id:
            quickById_[key.name].push_back(index);
            break;
        case SelectorType::Class:
            quickByClass_[key.name].push_back(index);
            break;
        case SelectorType::Tag:
            quickByTag_[static_cast<size_t>(key.tag)].push_back(index);
            break;
        default:
            quickUniversal_.push_back(index);
            break;
    }
}

void RuleIndex::File(IndexedRule rule) {
    CountCombinators(rule.selector, +1);
    if (rule.selector.IsQuick()) {
        quickRules_.push_back(std::move(rule));
        if (!indexStale_) NoteQuickRule(quickRules_.size() - 1);
    } else if (const SimpleSelector* key = FindClass(rule.selector.key)) {
        const Atom name = key->name;
        complexRulesByClass_[name].push_back(std::move(rule));
        ++complexByClassCount_;
    } else {
        complexKeys_.push_back(MakeKey(rule.selector));
        complexRules_.push_back(std::move(rule));
    }
}

void RuleIndex::Rebuild() {
    for (auto& entry : quickById_)
        entry.second.clear();
    for (auto& entry : quickByClass_)
        entry.second.clear();
    for (Indices& indices : quickByTag_)
        indices.clear();
    quickUniversal_.clear();
    for (uint32_t i = 0; i < quickRules_.size(); ++i)
        NoteQuickRule(i);
    complexKeys_.clear();
    for (const IndexedRule& rule : complexRules_)
        complexKeys_.push_back(MakeKey(rule.selector));
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
    complexByClassCount_ = 0;
    for (const auto& entry : complexRulesByClass_)
        complexByClassCount_ += entry.second.size();
    if (!taken.empty()) indexStale_ = true;
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
    activeMediaGroups_.erase_if([&](ActiveMediaGroup& group) {
        if (EvaluateMedia(group.features, metrics)) return false;
        CssVector<IndexedRule> rules = TakeRules({group.ruleIds.data(), group.ruleIds.size()});
        inactiveMediaGroups_.push_back({std::move(group.features), std::move(rules)});
        return moved = true;
    });
    for (ActiveMediaGroup& group : activated)
        activeMediaGroups_.push_back(std::move(group));
    return moved;
}

}  // namespace qorvex::css
