#include "support/style_checks.h"

#include "css/parser/convert.h"
#include "css/style/computed_serializer.h"
#include "css/style/selector_matching.h"
#include "css/values/value_text.h"
#include "support/engine.h"

namespace qorvex::fuzz {

using namespace qorvex::css;

void CheckRoundTrip(const Declaration& declaration, StringPool& strings) {
    CssString text;
    SerialiseDeclaration(declaration, text);
    const std::optional<Declaration> again =
        MakeDeclaration(declaration.property(), text.view(), strings, declaration.flags() & kImportant);
    // Texts are compared: a colour prints fewer digits than it holds.
    CssString twice;
    if (again) SerialiseDeclaration(*again, twice);
    RequireSame(text.view(), twice.view(), PropertyName(declaration.property()).data());
}

void CheckComputedStyle(const LayoutStyleRefs& style) {
    for (size_t i = 0; i < kLonghandCount; ++i) {
        const auto id = static_cast<PropertyId>(i);
        CssString text;
        SerialiseComputed(id, style, text);
        Declaration declaration;
        // What a shorter text means is inherited or the initial value; everything else has to read back.
        if (!ParseLonghand(id, text.view(), declaration))
            RequireSame(text.view(), {}, PropertyName(id).data());
        // "user-select: auto" takes the parent's value.
        if (declaration.kind() == DeclarationKind::Inherit) continue;
        CssString again;
        SerialiseDeclaration(declaration, again);
        RequireSame(text.view(), again.view(), PropertyName(id).data());
    }
}

StyledPage::StyledPage(std::string_view body) {
    CreateDefaultStyles();
    host_ = std::make_unique<PageHost>();
    defaults_ = MakeRef<DefaultRules>(host_->strings);
    page_ = std::make_unique<Page>(*host_);
    auto engine = MakeUnique<StyleEngine, MemoryTag::DOM>(host_->strings, defaults_);
    engine_ = engine.get();
    document_ = &page_->Load(body, "ui://page/index.html", std::move(engine));
}

StyledPage::~StyledPage() {
    page_.reset();
    defaults_ = nullptr;
    host_.reset();
    DestroyDefaultStyles();
}

void StyledPage::AddSheet(StylesheetPtr sheet, dom::Element* owner) {
    engine_->AddStyleSheet(*document_, owner, std::move(sheet), {});
}

void StyledPage::Solve() {
    document_->SolveStyles();
}

void StyledPage::CheckMatchedRules() {
    RuleIndex& rules = engine_->GetAuthorRules();
    rules.Refresh();
    const CssVector<uint64_t> all = rules.GetAllRuleIds();
    // Rules of media blocks that do not hold are among them.
    const bool some_sleep = all.size() != rules.GetSearchableRuleCount();
    const PseudoState pseudo(*document_);
    document_->ForEachElement([&](dom::Element& element) {
        MatchContext context(pseudo);
        const CssVector<uint64_t> found = engine_->GetMatcher().GetMatchedRuleIds(rules, element, context);
        MatchContext plain(pseudo);
        size_t next = 0;
        for (const uint64_t id : all) {
            if (!MatchSelector(rules.FindRule(id)->selector, element, plain, false)) continue;
            if (some_sleep && (next == found.size() || found[next] != id)) continue;
            Require(next < found.size() && found[next] == id, "a rule that the index does not find");
            // An element with a class twice finds the rules of that class twice.
            while (next < found.size() && found[next] == id)
                ++next;
        }
        Require(next == found.size(), "the index finds a rule that does not match");
    });
}

}  // namespace qorvex::fuzz
