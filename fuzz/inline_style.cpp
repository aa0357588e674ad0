// The text of a style attribute and of a media attribute: what is read prints to a text that reads back the
// same.
#include <cstdint>

#include "css/parser/convert.h"
#include "support/engine.h"
#include "support/style_checks.h"

namespace qorvex::fuzz {
namespace {

void CheckSame(const css::StyleDeclarationSet& one, const css::StyleDeclarationSet& other) {
    RequireSame(one.ToText().view(), other.ToText().view(), "an inline style printed and read again");
    Require(one.declarations().size() == other.declarations().size(), "as many declarations");
}

void Run(std::string_view text) {
    StringPool strings;
    const css::StyleDeclarationSet style =
        css::ConvertInlineStyle(*css::ParseInlineStyle(text), "ui://page/", strings);
    for (const css::Declaration& declaration : style.declarations())
        CheckRoundTrip(declaration, strings);
    CheckSame(style,
              css::ConvertInlineStyle(*css::ParseInlineStyle(style.ToText().view()), "ui://page/", strings));
    if (const auto features = css::ConvertMediaQuery(*css::ParseMediaQuery(text)))
        (void)css::EvaluateMedia(*features, {8, 6, 16, 16, 0});
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const qorvex::fuzz::Input input;
    qorvex::css::CreateDefaultStyles();
    qorvex::fuzz::Run({reinterpret_cast<const char*>(data), size});
    qorvex::css::DestroyDefaultStyles();
    return 0;
}
