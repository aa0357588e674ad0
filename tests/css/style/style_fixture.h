// Documents with the real style engine and no view: text in, computed style out.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "css/style/style_engine.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/resource_loader.h"
#include "support/scoped_library_state.h"

namespace qorvex::css::test {

class StyleHost final : public dom::IDocumentHost {
  public:
    StringPool& GetStringPool() override { return strings; }
    TaskFamilyHandle GetTaskFamily() override { return {}; }
    uint32_t GetViewId() const override { return 0; }
    dom::HostSize GetViewSize() const override { return {800, 600}; }
    bool AreComplexSelectorsEnabled() const override { return true; }
    dom::Node* GetHoveredNode() const override { return hovered; }
    dom::Node* GetActiveNode() const override { return active; }
    layout::IFontResolver* GetFontResolver() override { return fonts; }
    void RequestFrames(uint32_t) override {}
    void OnDOMBuilt(dom::Document&) override {}
    void OnFinishLoad(dom::Document&) override {}
    void EvaluateScript(dom::Document&, std::string_view, std::string_view) override {}
    void NavigateTo(const URL&) override {}

    StringPool strings;
    dom::Node* hovered = nullptr;
    dom::Node* active = nullptr;
    layout::IFontResolver* fonts = nullptr;
};

// Loads nothing: tests hand their sheets to the engine themselves.
class IdleLoader final : public dom::IDocumentLoader {
  public:
    uint32_t LoadResource(const URL&, dom::Element&, bool) override { return 0; }
    uint32_t LoadAndParseStylesheet(const URL&, dom::Element&, bool) override { return 0; }
    uint32_t ParseStylesheetText(std::string_view, dom::Element&) override { return 0; }
    void RequestPrefetch(const URL&) override {}
    void RequestStylesheetPrefetch(const URL&) override {}
    bool HasPendingWork() const override { return false; }
    void StopLoading() override {}
};

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
