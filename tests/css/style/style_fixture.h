// Documents with the real style engine and no view: text in, computed style out.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "css/style/style_engine.h"
#include "dom/document.h"
#include "support/idle_page.h"
#include "support/scoped_library_state.h"

namespace qorvex::css::test {

class StyleHost final : public qorvex::test::IdleHost {
  public:
    dom::Node* GetHoveredNode() const override { return hovered; }
    dom::Node* GetActiveNode() const override { return active; }
    layout::IFontResolver* GetFontResolver() override { return fonts; }
    layout::FontManager* GetFontManager() override { return fontManager; }

    dom::Node* hovered = nullptr;
    dom::Node* active = nullptr;
    layout::IFontResolver* fonts = nullptr;
    layout::FontManager* fontManager = nullptr;
};

using qorvex::test::IdleLoader;  // tests hand their sheets to the engine themselves

class StyleTest : public qorvex::test::QorvexTest {
  protected:
    StyleTest();
    ~StyleTest() override;

    // A document of this body, with this author sheet, unsolved.
    dom::Document& Load(std::string_view body, std::string_view sheet = {});
    void AddSheet(std::string_view text, dom::Element* owner = nullptr, std::string_view media = {});
    void Drop();
    void Solve() { document_->SolveStyles(); }
    // The computed value, after solving what is dirty.
    std::string Computed(std::string_view id, std::string_view property);
    std::string Computed(const dom::Element& element, std::string_view property);
    // All computed styles of the document, one element or text after the other.
    std::string DumpAll();

    dom::Element& Find(std::string_view id) { return *document_->GetElementById(id); }
    dom::Element& Body() { return *document_->GetBodyElement(); }
    qsl::RefPtr<dom::Element> Append(dom::Node& parent, std::string_view tag,
                                     std::string_view className = {});
    StyleCounters Counted(const std::function<void()>& action);

    std::unique_ptr<StyleHost> host_;
    DefaultRulesPtr defaults_;
    StyleEngine* engine_ = nullptr;
    qsl::RefPtr<dom::Document> document_;
};

}  // namespace qorvex::css::test
