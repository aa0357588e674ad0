// The style side of one document: its rules, who depends on which attribute, the queries, and the solver.
// View thread only.
#pragma once

#include "css/style/animation_side.h"
#include "css/style/rule_index.h"
#include "css/style/selector_queries.h"
#include "css/style/style_solver.h"
#include "dom/style_engine.h"

namespace qorvex::css {

// The user-agent sheet in searchable form. Parsed once and shared by the documents of a System, whose atoms
// it holds.
class DefaultRules : public SharedValue<DefaultRules> {
  public:
    explicit DefaultRules(StringPool& strings);
    RuleIndex& index() { return index_; }

  private:
    RuleIndex index_;
};
using DefaultRulesPtr = qsl::RefPtr<DefaultRules>;

class StyleEngine final : public dom::IStyleEngine {
  public:
    // `strings` is the pool of the System that the sheets and documents belong to.
    StyleEngine(StringPool& strings, DefaultRulesPtr defaults);

    const LayoutStyleRefs& GetDefaultStyle() const override { return DefaultStyles(); }
    void AddStyleSheet(dom::Document& document, dom::Element* owner, StylesheetPtr sheet,
                       std::string_view media) override;
    void RemoveStyleSheet(dom::Document& document, dom::Element* owner) override;
    void SolveStyles(dom::Document& document) override;
    void OnMetricsChanged(dom::Document& document) override;

    bool IsSelectorAttribute(Atom name) const override { return selectorAttributes_.contains(name); }
    bool IsSelectorDataAttribute(Atom name) const override { return selectorDataAttributes_.contains(name); }
    uint32_t SubtreeInvalidatingRules() const override;
    uint32_t SiblingInvalidatingRules() const override;

    bool Matches(dom::Element& element, std::string_view selector) override;
    dom::Element* Closest(dom::Element& element, std::string_view selector) override;
    dom::Element* QuerySelector(dom::Node& root, std::string_view selector) override;
    void QuerySelectorAll(dom::Node& root, std::string_view selector,
                          Vector<dom::Element*, MemoryTag::DOM>& matches) override;

    // --- For the object model, the inspector and the animation side.
    RuleIndex& GetAuthorRules() { return author_; }
    RuleIndex& GetDefaultRules() { return defaults_->index(); }
    // The ids of the rules that a sheet's owner brought; null for an owner without a sheet.
    RuleIdListPtr FindRuleIds(const dom::Element* owner) const;
    // Selectors may have come into the author rules: what they ask of attributes is noted.
    void NoteDependencies(const ComplexSelector& selector);
    void SetAnimationSide(IAnimationSide* animations) { animations_ = animations; }
    ElementMatcher& GetMatcher() { return solver_.matcher(); }
    const StyleCounters& GetCounters() const { return counters_; }
    // For the debug dump.
    void AppendRuleCountsReport(const dom::Document& document, CssString& out) const;

  private:
    struct SheetEntry {
        const dom::Element* owner;
        RuleIdListPtr ids;
    };
    void NoteDependencies(const CompoundSelector& compound);

    DefaultRulesPtr defaults_;
    RuleIndex author_;
    CssVector<SheetEntry> sheets_;
    HashSet<Atom, MemoryTag::CSS> selectorAttributes_;
    HashSet<Atom, MemoryTag::CSS> selectorDataAttributes_;  // names without "data-"
    StyleCounters counters_;
    StyleSolver solver_;
    SelectorQueries queries_;
    IAnimationSide* animations_ = nullptr;
};

}  // namespace qorvex::css
