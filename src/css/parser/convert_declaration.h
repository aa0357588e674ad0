// Declarations of the syntax tree to value records, and the URLs in them.
#pragma once

#include <string_view>

#include "core/url/url.h"
#include "css/parser/stylesheet.h"
#include "css/parser/syntax.h"
#include "css/values/css_containers.h"

namespace qorvex::css {

// What a conversion works with.
struct ConversionContext {
    URL base;  // of relative URLs; when it is not valid these stay as written
    StringPool& strings;
    HashSet<CssString, MemoryTag::CSS>* imageUrls = nullptr;  // collected when set
};

enum class UnknownProperty : uint8_t { Log, Skip };

// Appends what the declaration gives: one longhand, the longhands of a shorthand, or nothing with a log line.
void ConvertDeclaration(const DeclarationSyntax& syntax, UnknownProperty whenUnknown,
                        ConversionContext& context, CssVector<Declaration>& out);
// As above for a known property and a value text.
[[nodiscard]] bool ConvertValue(PropertyId property, std::string_view text, uint8_t flags,
                                StringPool& strings, CssVector<Declaration>& out);
// All declarations of a block, custom properties included.
void ConvertBlock(const SyntaxList<DeclarationSyntax>& syntax, ConversionContext& context,
                  DeclarationBlock& out);

// "--name" with a name.
[[nodiscard]] bool IsCustomPropertyName(std::string_view name);

// Makes the URLs of a value absolute and collects those of images.
void ResolveImageUrls(Declaration& declaration, ConversionContext& context);
// The absolute form, or the text itself where there is none.
[[nodiscard]] CssString ResolveUrl(std::string_view url, const URL& base);

}  // namespace qorvex::css
