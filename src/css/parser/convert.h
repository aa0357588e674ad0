// Syntax trees to records: selectors in matching form, declarations with values. Names are interned in the
// pool of the System that the records will belong to; the pool may be used by several threads at once.
#pragma once

#include <optional>
#include <string_view>

#include "css/parser/parser_context.h"
#include "css/parser/stylesheet.h"
#include "css/values/style_declaration_set.h"

namespace qorvex {
class StringPool;
class URL;
}  // namespace qorvex

namespace qorvex::css {

// `baseUrl` is the URL that relative URLs in the sheet refer to; empty leaves them as written.
[[nodiscard]] StylesheetPtr ConvertStylesheet(const ParserContext& context, std::string_view baseUrl,
                                              StringPool& strings);
// Parse and conversion in one go, for <style> text and for tasks.
[[nodiscard]] StylesheetPtr MakeStylesheet(std::string_view text, std::string_view baseUrl,
                                           StringPool& strings);

// The declarations of a style attribute.
[[nodiscard]] StyleDeclarationSet ConvertInlineStyle(const ParserContext& context, std::string_view baseUrl,
                                                     StringPool& strings);

// The features of a media attribute; nothing when it holds no usable one. The caller says what that means for
// it.
[[nodiscard]] std::optional<MediaFeatureList> ConvertMediaQuery(const ParserContext& context);

// The selectors of a script query; nothing when the text is not exactly one rule with a usable selector.
[[nodiscard]] std::optional<CssVector<ComplexSelector>> ConvertSelector(const ParserContext& context,
                                                                        StringPool& strings);

// One declaration from the object model, data binding or the inspector: property and value text as script
// gives them, with var() and calc() allowed. A shorthand is refused with an assertion.
[[nodiscard]] std::optional<Declaration> MakeDeclaration(PropertyId property, std::string_view valueText,
                                                         StringPool& strings, uint8_t flags = 0);
// As above, but a shorthand gives all of its longhands. False, with nothing appended, when it does not parse.
[[nodiscard]] bool MakeDeclarations(PropertyId property, std::string_view valueText, StringPool& strings,
                                    uint8_t flags, CssVector<Declaration>& out);

// The kHasVar and kHasCalc bits of a value text; what stands in quotes or in a comment does not count.
[[nodiscard]] uint8_t FindExpressionFlags(std::string_view valueText);

// Makes relative image URLs of a value absolute; a base that is not valid leaves them as written. Conversion
// does it for sheets and style attributes, who makes a declaration otherwise calls this.
void ResolveImageUrls(Declaration& declaration, const URL& base);

// Calls visit(url) for each image URL in the declaration's value.
void ForEachImageUrl(const Declaration& declaration, void (*visit)(std::string_view url, void* user),
                     void* user);

}  // namespace qorvex::css
