// The rules of one document (or of the user-agent sheet) in a form that is searched per element. A page has
// one index for the default sheet and one for the author's.
//
// A rule is quick when its selector is a single universal, tag, id or class selector: looking it up under its
// key is all the matching there is. Every other rule is complex and goes through MatchSelector. Both kinds
// are filed by what an element must have for them to match: an id, else a class, else a tag of the key
// compound, so that an element meets only the rules that may concern it.
//
// Invariants:
// - positions are unique and decide the cascade; where a rule is stored does not matter;
// - a searchable rule is in exactly one of quickRules_ and complexRules_; rules of inactive media groups are
// in
//   neither;
// - the buckets describe the rule vectors unless indexStale_ is set, and every search refreshes them first;
// - whatever is remembered about rules is good for one generation.
//
// View thread only.
#pragma once

#include <cstdint>
#include <span>

#include "css/parser/stylesheet.h"
#include "css/values/length_context.h"
#include "css/values/shared_value.h"

namespace qorvex::css {

struct IndexedRule : Ruleset {
    uint64_t ruleId = 0;    // unique in its index, never reused
    uint32_t position = 0;  // later positions win ties
};

// The ids that a sheet brought, in order; shared by its owner and its script objects.
struct RuleIdList : SharedValue<RuleIdList> {
    CssVector<uint64_t> ids;
};
using RuleIdListPtr = qsl::RefPtr<RuleIdList>;

// Indices of the rules with one key. Most keys have one rule or two.
struct RuleBucket {
    CssSmallVector<uint32_t, 2> quick;
    CssSmallVector<uint32_t, 2> complex;
};

class RuleIndex {
  public:
    // Takes copies of the sheet's rules (their declarations stay shared). `media` are the conditions of a
    // link's media attribute: the top-level rules then apply while any of them holds. Nothing of a media
    // group applies before the next UpdateMedia.
    RuleIdListPtr AddSheet(const Stylesheet& sheet, std::span<const MediaFeatureList> media = {});
    // Room for the rules of a first sheet, most of which are quick.
    void Reserve(size_t rules) { quickRules_.reserve(rules); }
    uint64_t AddRule(Ruleset rule);
    // The new rule takes the cascade position of the rule `before`, which moves behind it with all later
    // ones.
    uint64_t InsertRule(Ruleset rule, uint64_t before);
    bool RemoveRule(uint64_t ruleId);
    // One pass over the index, however many rules go.
    void RemoveRules(std::span<const uint64_t> ruleIds);
    // Borrowed until the next change of the index; null for an unknown id.
    const IndexedRule* FindRule(uint64_t ruleId) const;
    // Files the rule anew. False for an unknown id.
    bool SetSelector(uint64_t ruleId, ComplexSelector selector);

    // Moves groups between active and inactive; true if any moved. em and rem are the root's font size.
    bool UpdateMedia(const LengthContext& metrics);

    bool IsEmpty() const { return GetSearchableRuleCount() == 0; }
    uint32_t GetSearchableRuleCount() const { return quickRules_.size() + complexRules_.size(); }
    uint32_t GetQuickRuleCount() const { return quickRules_.size(); }
    uint32_t GetComplexRuleCount() const { return complexRules_.size(); }
    uint32_t GetSubtreeInvalidatingRules() const { return subtreeInvalidatingRules_; }
    uint32_t GetSiblingInvalidatingRules() const { return siblingInvalidatingRules_; }
    const CssVector<KeyframesRule>& GetKeyframes() const { return keyframes_; }
    const CssVector<FontFace>& GetFontFaces() const { return fontFaces_; }
    CssVector<uint64_t> GetAllRuleIds() const;  // by position

    // Another number whenever rules came, went, moved or changed.
    uint64_t GetGeneration() const { return generation_; }
    // The declarations of a rule were edited.
    void NoteRuleEdited() { ++generation_; }

    // --- Searching. Call Refresh before a batch of the rest.
    void Refresh() {
        if (indexStale_) [[unlikely]]
            Rebuild();
    }
    const IndexedRule& QuickRule(uint32_t index) const { return quickRules_[index]; }
    const IndexedRule& ComplexRule(uint32_t index) const { return complexRules_[index]; }
    // Null for a name that no rule has as its key.
    const RuleBucket* FindByClass(Atom name) const { return byClass_.get(name); }
    const RuleBucket* FindById(Atom name) const { return byId_.get(name); }
    const RuleBucket& FindByTag(TagId tag) const { return byTag_[static_cast<size_t>(tag)]; }
    // Rules that any element may match.
    const RuleBucket& GetUnkeyed() const { return unkeyed_; }

  private:
    struct MediaGroup {
        MediaFeatureList features;
        CssVector<IndexedRule> rules;
    };
    struct ActiveMediaGroup {
        MediaFeatureList features;
        CssVector<uint64_t> ruleIds;
    };

    IndexedRule Number(Ruleset rule);
    void File(IndexedRule rule);
    RuleBucket& BucketOf(const CompoundSelector& key);
    void CountCombinators(const ComplexSelector& selector, int32_t change);
    void AddMediaGroup(const MediaFeatureList& features, const CssVector<Ruleset>& rules, RuleIdList& ids);
    CssVector<IndexedRule> TakeRules(std::span<const uint64_t> ruleIds);
    void PutToSleep(CssVector<ActiveMediaGroup>& groups);
    void Rebuild();
    template <class Visitor>
    void ForEachRule(Visitor&& visit);
    template <class Visitor>
    void ForEachList(Visitor&& visit);

    uint64_t nextRuleId_ = 0;
    uint32_t nextPosition_ = 0;
    uint64_t generation_ = 0;
    CssVector<IndexedRule> complexRules_;
    CssVector<IndexedRule> quickRules_;
    CssVector<MediaGroup> inactiveMediaGroups_;
    CssVector<ActiveMediaGroup> activeMediaGroups_;
    CssVector<FontFace> fontFaces_;
    CssVector<KeyframesRule> keyframes_;
    uint32_t subtreeInvalidatingRules_ = 0;
    uint32_t siblingInvalidatingRules_ = 0;
    bool indexStale_ = false;

    CssHashMap<Atom, RuleBucket> byId_;
    CssHashMap<Atom, RuleBucket> byClass_;
    RuleBucket byTag_[kTagCount];
    RuleBucket unkeyed_;
};

// Do all conditions hold? An empty list holds.
[[nodiscard]] bool EvaluateMedia(const MediaFeatureList& features, const LengthContext& metrics);

}  // namespace qorvex::css
