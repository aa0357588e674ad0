// What has to hold of declarations and computed styles, however they came about.
#pragma once

#include <memory>

#include "css/style/style_engine.h"
#include "css/values/declaration.h"
#include "support/page.h"

namespace qorvex::fuzz {

/// The declaration's text reads back to a declaration with the same text.
void CheckRoundTrip(const css::Declaration& declaration, StringPool& strings);

/// Every computed value of the node prints to a text that reads back and prints the same.
void CheckComputedStyle(const css::LayoutStyleRefs& style);

/// A page with the engine's own style side.
class StyledPage {
  public:
    explicit StyledPage(std::string_view body);
    ~StyledPage();

    dom::Document& document() { return *document_; }
    css::StyleEngine& engine() { return *engine_; }
    StringPool& strings() { return host_->strings; }
    void AddSheet(css::StylesheetPtr sheet, dom::Element* owner = nullptr);
    void Solve();
    /// Each element is matched by the rules that a walk over all of them finds.
    void CheckMatchedRules();

  private:
    std::unique_ptr<PageHost> host_;
    css::DefaultRulesPtr defaults_;
    std::unique_ptr<Page> page_;
    css::StyleEngine* engine_ = nullptr;
    dom::Document* document_ = nullptr;
};

}  // namespace qorvex::fuzz
