// A document with the real style engine and no view, and the pages and sheets that the style benchmarks
// measure: a screen of game panels, styled class by class as such screens are.
#pragma once

#include <memory>
#include <string>
#include <string_view>

#include "css/style/style_engine.h"
#include "dom/document.h"
#include "tests/support/idle_page.h"

namespace qorvex::bench {

// Ten rules for each of `panels` kinds of panels: quick ones, states, and descendants.
[[nodiscard]] std::string PanelSheet(int panels);
// At least `elements` elements of those panels, in sections, with texts and a few inline styles.
[[nodiscard]] std::string PanelMarkup(int elements, int panels);

class StylePage {
  public:
    StylePage(std::string_view body, std::string_view sheet);
    ~StylePage();
    StylePage(const StylePage&) = delete;
    StylePage& operator=(const StylePage&) = delete;

    // What a frame does with style, and the hand-over to layout without the layout.
    void Solve();
    dom::Document& document() { return *document_; }
    css::StyleEngine& engine() { return *engine_; }
    StringPool& strings();
    [[nodiscard]] size_t CountElements() const;

  private:
    std::unique_ptr<test::IdleHost> host_;
    css::StyleEngine* engine_ = nullptr;
    qsl::RefPtr<dom::Document> document_;
};

// Allocations ever made through the process's allocator.
[[nodiscard]] uint64_t CountAllocations();

}  // namespace qorvex::bench
