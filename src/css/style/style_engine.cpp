#include "css/style/style_engine.h"

#include "core/logging/log.h"
#include "css/parser/convert.h"
#include "css/style/default_sheet.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "layout/fonts/font_resolver.h"

namespace qorvex::css {

DefaultRules::DefaultRules(StringPool& strings) {
    const StylesheetPtr sheet = MakeStylesheet(DefaultSheetText(), {}, strings);
    if (!sheet) return;
    index_.Reserve(sheet->rules.size());
    for (Ruleset& rule : sheet->rules)
        index_.AddRule(std::move(rule));
}

StyleEngine::StyleEngine(StringPool& strings, DefaultRulesPtr defaults)
    : defaults_(std::move(defaults)), solver_({defaults_->index(), author_}, counters_), queries_(strings) {}

// --- Sheets

void StyleEngine::NoteDependencies(const CompoundSelector& compound) {
    for (const SimpleSelector& simple : compound.simple) {
        if (simple.type != SelectorType::Attribute) continue;
        (simple.isData ? selectorDataAttributes_ : selectorAttributes_).insert(simple.name);
    }
}

void StyleEngine::NoteDependencies(const ComplexSelector& selector) {
    NoteDependencies(selector.key);
    for (const CompoundSelector& compound : selector.compounds)
        NoteDependencies(compound);
}

void StyleEngine::AddStyleSheet(dom::Document& document, dom::Element* owner, StylesheetPtr sheet,
                                std::string_view media) {
    if (!sheet) return;
    MediaFeatureList features;
    std::span<const MediaFeatureList> conditions;
    if (!media.empty()) {
        const ParserContextPtr context = ParseMediaQuery(media);
        std::optional<MediaFeatureList> parsed = context ? ConvertMediaQuery(*context) : std::nullopt;
        if (!parsed) {
            LogWarning("Link Stylesheet with unrecognized media encountered - will ignore the whole sheet!");
            return;
        }
        features = std::move(*parsed);
        conditions = {&features, 1};
    }
    sheets_.push_back({owner, author_.AddSheet(*sheet, conditions)});
    for (const Ruleset& rule : sheet->rules)
        NoteDependencies(rule.selector);
    for (const MediaBlock& block : sheet->mediaBlocks) {
        for (const Ruleset& rule : block.rules)
            NoteDependencies(rule.selector);
    }
    if (layout::IFontResolver* fonts = document.GetHost().GetFontResolver()) {
        for (const FontFace& face : sheet->fontFaces)
            fonts->AddFontFace(face);
    }
    author_.UpdateMedia(document.GetLengthContext());
    LogTrace("Style added in document!");
    document.RequestFullStyleSolve();
}

void StyleEngine::RemoveStyleSheet(dom::Document& document, dom::Element* owner) {
    bool removed = false;
    sheets_.erase_if([&](const SheetEntry& entry) {
        if (entry.owner != owner) return false;
        author_.RemoveRules({entry.ids->ids.data(), entry.ids->ids.size()});
        return removed = true;
    });
    // Elements still point at declarations of the removed rules until they are matched again.
    if (removed) document.RequestFullStyleSolve();
}

RuleIdListPtr StyleEngine::FindRuleIds(const dom::Element* owner) const {
    for (const SheetEntry& entry : sheets_) {
        if (entry.owner == owner) return entry.ids;
    }
    return nullptr;
}

uint32_t StyleEngine::SubtreeInvalidatingRules() const {
    return author_.GetSubtreeInvalidatingRules() + defaults_->index().GetSubtreeInvalidatingRules();
}

uint32_t StyleEngine::SiblingInvalidatingRules() const {
    return author_.GetSiblingInvalidatingRules() + defaults_->index().GetSiblingInvalidatingRules();
}

// --- Solving

void StyleEngine::SolveStyles(dom::Document& document) {
    solver_.Solve(document, animations_);
    // Media lengths in em and rem follow the root's font size, which this solve may have made; a group that
    // comes into force may change it again, and that is left to the next frame.
    if (!solver_.RootFontSizeChanged() || !author_.UpdateMedia(document.GetLengthContext())) return;
    document.RequestFullStyleSolve();
    solver_.Solve(document, animations_);
}

void StyleEngine::OnMetricsChanged(dom::Document& document) {
    author_.UpdateMedia(document.GetLengthContext());
    // Viewport units are in any length of any group, and layout resolves most of them.
    document.RequestFullStyleSolve();
}

// --- Queries

bool StyleEngine::Matches(dom::Element& element, std::string_view selector) {
    return queries_.Matches(element, selector);
}
dom::Element* StyleEngine::Closest(dom::Element& element, std::string_view selector) {
    return queries_.Closest(element, selector);
}
dom::Element* StyleEngine::QuerySelector(dom::Node& root, std::string_view selector) {
    return queries_.QuerySelector(root, selector);
}
void StyleEngine::QuerySelectorAll(dom::Node& root, std::string_view selector,
                                   Vector<dom::Element*, MemoryTag::DOM>& matches) {
    queries_.QuerySelectorAll(root, selector, matches);
}

void StyleEngine::AppendRuleCountsReport(const dom::Document& document, CssString& out) const {
    const auto line = [&](std::string_view label, std::string_view value) {
        out.append(label);
        out.append(value);
        out.append("\n");
    };
    const auto count = [&](std::string_view label, uint32_t value) {
        char text[16];
        line(label, {text, static_cast<size_t>(std::snprintf(text, sizeof text, "%u", value))});
    };
    line("Complex CSS Selectors Styling: ", document.AreComplexSelectorsEnabled() ? "true" : "false");
    count("Quick Rules (fast to match): ", author_.GetQuickRuleCount());
    count("All Complex Rules (slower to match): ", author_.GetComplexRuleCount());
    count("Rules invalidating subtrees (slow): ", author_.GetSubtreeInvalidatingRules());
}

}  // namespace qorvex::css
