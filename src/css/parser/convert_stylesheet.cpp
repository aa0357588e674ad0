// Syntax trees to sheets, inline styles and selector lists.
#include "core/limits.h"
#include "core/logging/log.h"
#include "css/parser/convert.h"
#include "css/parser/convert_at_rules.h"
#include "css/parser/convert_declaration.h"
#include "css/parser/convert_media.h"
#include "css/parser/convert_selector.h"
#include "css/values/text_reader.h"
#include "css/values/value_text.h"

namespace qorvex::css {

namespace {

// What a rule gives to its ::selection selectors: the two colours, under the names that they have there.
RefPtr<DeclarationBlock> ConvertSelectionBlock(const SyntaxList<DeclarationSyntax>& syntax,
                                               ConversionContext& context) {
    RefPtr<DeclarationBlock> block = MakeRef<DeclarationBlock>();
    for (const DeclarationSyntax& declaration : syntax) {
        PropertyId target = PropertyId::kUnknown;
        if (EqualsIgnoreCase(declaration.name, "color")) target = PropertyId::SelectionColor;
        if (EqualsIgnoreCase(declaration.name, "background-color"))
            target = PropertyId::SelectionBackgroundColor;
        if (target == PropertyId::kUnknown) continue;
        // A value that does not parse has been logged.
        (void)ConvertValue(target, declaration.value, declaration.flags, context.strings,
                           block->declarations);
    }
    return block;
}

void ConvertRule(const RulesetSyntax& syntax, ConversionContext& context, CssVector<Ruleset>& out) {
    if (syntax.declarations.empty()) return;
    RefPtr<DeclarationBlock> normal, selection;
    for (const SelectorSyntax& selectorSyntax : syntax.selectors) {
        std::optional<ComplexSelector> selector = ConvertComplexSelector(selectorSyntax, context.strings);
        if (!selector) continue;
        bool isSelection = SelectsSelection(*selector);
        RefPtr<DeclarationBlock>& block = isSelection ? selection : normal;
        if (!block) {
            if (isSelection) {
                block = ConvertSelectionBlock(syntax.declarations, context);
            } else {
                block = MakeRef<DeclarationBlock>();
                ConvertBlock(syntax.declarations, context, *block);
            }
        }
        if (!block->empty()) out.emplace_back(std::move(*selector), block);
    }
}

// Each query makes a block of its own with the same rules.
void ConvertMedia(const MediaSyntax& syntax, ConversionContext& context, size_t& copiesLeft,
                  CssVector<MediaBlock>& out) {
    CssVector<Ruleset> rules;
    bool converted = false;
    for (const MediaQuerySyntax& query : syntax.queries) {
        MediaFeatureList features = ConvertMediaFeatures(query);
        if (features.empty()) continue;
        if (!converted) {
            for (const RulesetSyntax& ruleset : syntax.rulesets)
                ConvertRule(ruleset, context, rules);
            converted = true;
        } else if (rules.size() > copiesLeft) {
            LogWarning("Too many queries in a @media block, the rest is left out");
            return;
        } else {
            copiesLeft -= rules.size();
        }
        MediaBlock& block = out.emplace_back();
        block.features = std::move(features);
        block.rules = rules;
    }
}

}  // namespace

StylesheetPtr ConvertStylesheet(const ParserContext& context, std::string_view baseUrl, StringPool& strings) {
    StylesheetPtr sheet = MakeRef<Stylesheet>();
    ConversionContext conversion{URL(baseUrl), strings, &sheet->imageUrls};
    size_t count = 0;
    for (const RulesetSyntax& ruleset : context.GetRulesets())
        count += ruleset.selectors.size();
    sheet->rules.reserve(count);
    for (const RulesetSyntax& ruleset : context.GetRulesets())
        ConvertRule(ruleset, conversion, sheet->rules);
    size_t copiesLeft = limits::kMaxMediaRuleCopies;
    for (const MediaSyntax& media : context.GetMediaBlocks())
        ConvertMedia(media, conversion, copiesLeft, sheet->mediaBlocks);
    for (const FontFaceSyntax& face : context.GetFontFaces())
        if (std::optional<FontFace> converted = ConvertFontFace(face, conversion))
            sheet->fontFaces.push_back(std::move(*converted));
    size_t keyframeBudget = limits::kMaxKeyframeValues;
    for (const KeyframesSyntax& keyframes : context.GetKeyframes())
        sheet->keyframes.push_back(ConvertKeyframes(keyframes, conversion, keyframeBudget));
    return sheet;
}

StylesheetPtr MakeStylesheet(std::string_view text, std::string_view baseUrl, StringPool& strings) {
    return ConvertStylesheet(*ParseStylesheet(text), baseUrl, strings);
}

StyleDeclarationSet ConvertInlineStyle(const ParserContext& context, std::string_view baseUrl,
                                       StringPool& strings) {
    StyleDeclarationSet set;
    // A "}" in the text would start rules of its own: such a text has no single rule and no declarations.
    if (context.GetRulesets().size() != 1) return set;
    DeclarationBlock block;
    ConversionContext conversion{URL(baseUrl), strings, nullptr};
    ConvertBlock(context.GetRulesets().front().declarations, conversion, block);
    for (Declaration& declaration : block.declarations) {
        const Declaration* earlier = declaration.important() ? nullptr : set.Find(declaration.property());
        if (!earlier || !earlier->important()) set.Set(std::move(declaration));
    }
    for (const auto& [name, record] : block.customProperties)
        set.SetCustomProperty(name, record);
    return set;
}

std::optional<CssVector<ComplexSelector>> ConvertSelector(const ParserContext& context, StringPool& strings) {
    if (context.GetRuleCount() != 1 || context.HasError()) return std::nullopt;
    CssVector<ComplexSelector> selectors;
    for (const SelectorSyntax& syntax : context.GetRulesets().front().selectors)
        if (std::optional<ComplexSelector> selector = ConvertComplexSelector(syntax, strings))
            selectors.push_back(std::move(*selector));
    if (selectors.empty()) return std::nullopt;
    return selectors;
}

}  // namespace qorvex::css
