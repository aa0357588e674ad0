// One property's value: the first byte picks the property, the rest is its text.
#include <cstdint>

#include "css/parser/convert.h"
#include "css/values/value_text.h"
#include "support/engine.h"
#include "support/style_checks.h"

namespace qorvex::fuzz {
namespace {

void Run(css::PropertyId property, std::string_view text) {
    StringPool strings;
    css::CssVector<css::Declaration> made;
    if (!css::MakeDeclarations(property, text, strings, 0, made)) {
        Require(made.empty(), "a refused value left something behind");
        return;
    }
    Require(!css::IsShorthand(property) || made.size() <= css::LonghandsOf(property).size(),
            "a shorthand gives its longhands");
    for (const css::Declaration& declaration : made) {
        CheckRoundTrip(declaration, strings);
        css::ForEachImageUrl(
            declaration, [](std::string_view, void*) {}, nullptr);
    }
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace qorvex;
    const fuzz::Input input;
    if (size == 0) return 0;
    const size_t number = data[0] % (css::kPropertyEnd - 1);
    const auto property = static_cast<css::PropertyId>(number < css::kLonghandCount ? number : number + 1);
    css::CreateDefaultStyles();
    fuzz::Run(property, {reinterpret_cast<const char*>(data) + 1, size - 1});
    css::DestroyDefaultStyles();
    return 0;
}
