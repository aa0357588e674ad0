#include "css/parser/convert_declaration.h"

#include "core/logging/log.h"
#include "css/parser/convert.h"
#include "css/parser/scanner.h"
#include "css/values/text_reader.h"
#include "css/values/value_text.h"

namespace qorvex::css {

bool IsCustomPropertyName(std::string_view name) {
    return name.size() >= 3 && name.starts_with("--");
}

bool ConvertValue(PropertyId property, std::string_view text, uint8_t flags, StringPool& strings,
                  CssVector<Declaration>& out) {
    if (flags & (kHasVar | kHasCalc)) {
        if (IsShorthand(property)) {
            LogWarning("Custom CSS expressions are not supported in shorthand declaration: ",
                       PropertyName(property), ". Please use the long versions of the CSS property.");
            return false;
        }
        std::optional<CustomExpression> expression = PrepareCustomExpression(text, strings);
        if (!expression) return false;
        out.push_back(Declaration::Expression(property, std::move(*expression), flags));
        return true;
    }
    if (IsShorthand(property)) {
        if (ParseShorthand(property, text, flags, out)) return true;
        LogWarning("Unable to parse shorthand declaration: ", PropertyName(property), ": ", text);
        return false;
    }
    Declaration declaration;
    declaration.set_flags(flags);
    if (!ParseLonghand(property, text, declaration)) {
        LogWarning("Unable to parse declaration: ", PropertyName(property), ": ", text);
        return false;
    }
    declaration.set_flags(flags);
    out.push_back(std::move(declaration));
    return true;
}

void ConvertDeclaration(const DeclarationSyntax& syntax, UnknownProperty whenUnknown,
                        ConversionContext& context, CssVector<Declaration>& out) {
    PropertyId property = FindProperty(syntax.name);
    if (property == PropertyId::kUnknown) {
        if (whenUnknown == UnknownProperty::Log) LogTrace("Unsupported CSS property detected: ", syntax.name);
        return;
    }
    size_t before = out.size();
    if (!ConvertValue(property, syntax.value, syntax.flags, context.strings, out)) return;
    for (size_t i = before; i < out.size(); ++i)
        ResolveImageUrls(out[i], context);
}

static void ConvertCustomProperty(const DeclarationSyntax& syntax, ConversionContext& context,
                                  DeclarationBlock& out) {
    Atom name = context.strings.Intern(syntax.name.substr(2));
    CustomPropertyPtr record = MakeCustomProperty(syntax.value, syntax.flags, context.strings);
    if (!record) return;
    // Within a block a later one wins unless only the earlier one is important.
    const CustomPropertyPtr* existing = out.customProperties.get(name);
    bool blocked = existing && ((*existing)->flags & kImportant) && !(record->flags & kImportant);
    if (!blocked) out.customProperties.insert_or_assign(name, std::move(record));
}

void ConvertBlock(const SyntaxList<DeclarationSyntax>& syntax, ConversionContext& context,
                  DeclarationBlock& out) {
    for (const DeclarationSyntax& declaration : syntax) {
        if (IsCustomPropertyName(declaration.name))
            ConvertCustomProperty(declaration, context, out);
        else
            ConvertDeclaration(declaration, UnknownProperty::Log, context, out.declarations);
    }
}

std::optional<Declaration> MakeDeclaration(PropertyId property, std::string_view valueText,
                                           StringPool& strings, uint8_t flags) {
    if (!IsLonghand(property)) {
        AssertFailure("You can't create css declarations from short hand");
        return std::nullopt;
    }
    CssVector<Declaration> made;
    if (!MakeDeclarations(property, valueText, strings, flags, made)) return std::nullopt;
    return made.take_back();
}

uint8_t FindExpressionFlags(std::string_view valueText) {
    const auto mentions = [](std::string_view text, std::string_view opening) {
        return text.find(opening) != std::string_view::npos;
    };
    if (!mentions(valueText, "var(") && !mentions(valueText, "calc(")) return 0;
    const CssString text(valueText);  // the scanner wants a zero at the end
    Scanner scanner(text.view());
    Token token;
    uint8_t flags = 0;
    for (scanner.Next(token); token.kind != TokenKind::End; scanner.Next(token)) {
        if (token.kind != TokenKind::Function && !token.Is('(')) continue;
        // Written as text, "10px - var(--x)" is a dimension and a parenthesis: the bytes decide, not the
        // token.
        const std::string_view before(text.data(), token.begin + token.size - text.data());
        if (before.ends_with("var(")) flags |= kHasVar;
        if (before.ends_with("calc(")) flags |= kHasCalc;
    }
    return flags;
}

bool MakeDeclarations(PropertyId property, std::string_view valueText, StringPool& strings, uint8_t flags,
                      CssVector<Declaration>& out) {
    valueText = Trim(valueText);
    flags = static_cast<uint8_t>((flags & kImportant) | FindExpressionFlags(valueText));
    return ConvertValue(property, valueText, flags, strings, out);
}

}  // namespace qorvex::css
