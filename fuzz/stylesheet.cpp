// A sheet's text through scanner, grammar and conversion, then onto a small page: matched, solved, resized
// and taken away again.
#include <cstdint>

#include "core/limits.h"
#include "css/parser/convert.h"
#include "support/engine.h"
#include "support/style_checks.h"

namespace qorvex::fuzz {
namespace {

constexpr std::string_view kBody =
    "<div id=a class='a b'><p class=b>x<i>y</i></p><a href=x data-x=1>z</a></div><p id=p>w";
constexpr size_t kMaxRulesOnPage = 64;

void CheckWork(const css::ParserContext& context, size_t bytes) {
    Require(context.GetTokenCount() <= bytes + 2, "more tokens than bytes");
    Require(const_cast<css::ParserContext&>(context).arena().BytesReserved() <= 96 * bytes + (1 << 20),
            "memory out of proportion to the text");
}

void CheckRules(const css::CssVector<css::Ruleset>& rules, StringPool& strings) {
    // The selectors of one rule share their declarations.
    const css::Declaration* last = nullptr;
    for (const css::Ruleset& rule : rules) {
        Require(!rule.declarations().empty() || !rule.customProperties().empty(), "an empty rule was kept");
        if (rule.declarations().data() == last) continue;
        last = rule.declarations().data();
        for (const css::Declaration& declaration : rule.declarations())
            CheckRoundTrip(declaration, strings);
    }
}

void UseOnPage(StyledPage& page, const css::StylesheetPtr& sheet) {
    dom::Element* owner = page.document().GetElementById("p");
    page.AddSheet(sheet, owner);
    page.Solve();
    page.CheckMatchedRules();
    CheckComputedStyle(page.document().GetElementById("a")->GetStyle());
    page.document().SetViewSize(320, 900);
    page.Solve();
    page.document().GetElementById("a")->SetAttribute("class", "b c");
    page.Solve();
    page.CheckMatchedRules();
    page.engine().RemoveStyleSheet(page.document(), owner);
    page.Solve();
    Require(page.engine().GetAuthorRules().GetSearchableRuleCount() == 0, "rules outlive their sheet");
}

void Run(std::string_view text) {
    StyledPage page(kBody);
    const css::ParserContextPtr context = css::ParseStylesheet(text);
    CheckWork(*context, text.size());
    const css::StylesheetPtr sheet =
        css::ConvertStylesheet(*context, "ui://page/style/sheet.css", page.strings());
    CheckRules(sheet->rules, page.strings());
    for (const css::MediaBlock& block : sheet->mediaBlocks)
        CheckRules(block.rules, page.strings());
    for (const css::KeyframesRule& rule : sheet->keyframes)
        for (const css::KeyframeTrack& track : rule.tracks)
            for (const css::KeyframeTrack::Frame& frame : track.frames)
                CheckRoundTrip(frame.value, page.strings());
    if (sheet->rules.size() <= kMaxRulesOnPage) UseOnPage(page, sheet);
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const qorvex::fuzz::Input input;
    qorvex::fuzz::Run({reinterpret_cast<const char*>(data), size});
    return 0;
}
