// A document without a view: hosts, style engine and loader that keep what they are asked.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "dom/element.h"
#include "dom/event.h"
#include "dom/resource_loader.h"
#include "dom/style_engine.h"
#include "script/make_handle.h"
#include "support/scoped_library_state.h"

namespace qorvex::dom::test {

class TestHost final : public IDocumentHost {
  public:
    StringPool& GetStringPool() override { return strings; }
    TaskFamilyHandle GetTaskFamily() override { return {}; }
    uint32_t GetViewId() const override { return 0; }
    HostSize GetViewSize() const override { return {800, 600}; }
    bool AreComplexSelectorsEnabled() const override { return true; }
    ILocalizationManager* GetLocalizationManager() override { return localization; }
    ITextTransformationManager* GetTextTransformationManager() override { return transformation; }
    void RequestFrames(uint32_t) override {}
    void OnDOMBuilt(Document&) override { journal.push_back("built"); }
    void OnFinishLoad(Document&) override { journal.push_back("finish"); }
    void EvaluateScript(Document& document, std::string_view source, std::string_view url) override;
    void NavigateTo(const URL&) override {}

    StringPool strings;
    ILocalizationManager* localization = nullptr;
    ITextTransformationManager* transformation = nullptr;
    // What happened, in order: "run <source>", "built", "finish" and whatever a test adds.
    std::vector<std::string> journal;
    // Stands in for the page's code; gets the source.
    std::function<void(std::string_view)> on_script;
};

class TestStyleEngine final : public IStyleEngine {
  public:
    const css::LayoutStyleRefs& GetDefaultStyle() const override { return css::DefaultStyles(); }
    void AddStyleSheet(Document&, Element*, css::StylesheetPtr, std::string_view media) override {
        sheets.push_back(std::string(media));
    }
    void RemoveStyleSheet(Document&, Element*) override { sheets.pop_back(); }
    void SolveStyles(Document& document) override;
    void OnMetricsChanged(Document&) override {}
    bool IsSelectorAttribute(Atom name) const override { return name.view() == "watched"; }
    bool IsSelectorDataAttribute(Atom name) const override { return name.view() == "watched"; }
    uint32_t SubtreeInvalidatingRules() const override { return subtree_rules; }
    uint32_t SiblingInvalidatingRules() const override { return sibling_rules; }
    bool Matches(Element&, std::string_view) override { return false; }
    Element* Closest(Element&, std::string_view) override { return nullptr; }
    Element* QuerySelector(Node&, std::string_view) override { return nullptr; }
    void QuerySelectorAll(Node&, std::string_view, Vector<Element*, MemoryTag::DOM>&) override {}

    std::vector<std::string> sheets;
    uint32_t subtree_rules = 0;
    uint32_t sibling_rules = 0;
};

class TestLoader final : public IDocumentLoader {
  public:
    struct Request {
        std::string kind;  // "script", "sheet", "style", "prefetch", "sheet prefetch"
        std::string what;  // address or text
        bool deferred = false;
        qsl::RefPtr<Element> element;
    };

    uint32_t LoadResource(const URL& url, Element& element, bool deferred) override;
    uint32_t LoadAndParseStylesheet(const URL& url, Element& element, bool deferred) override;
    uint32_t ParseStylesheetText(std::string_view text, Element& element) override;
    void RequestPrefetch(const URL& url) override;
    void RequestStylesheetPrefetch(const URL& url) override;
    bool HasPendingWork() const override { return pending != 0; }
    void StopLoading() override { pending = 0; }

    // Answers the request with this number.
    void FinishScript(size_t index, std::string_view source);
    void FinishSheet(size_t index, bool success = true);
    void Fail(size_t index);

    std::vector<Request> requests;
    size_t pending = 0;
    Document* document = nullptr;

  private:
    uint32_t Add(const char* kind, std::string_view what, Element& element, bool deferred);
    qsl::RefPtr<Element> Take(size_t index);
};

class TestListener final : public EventListener {
  public:
    explicit TestListener(std::function<void(Event&)> function) : function_(std::move(function)) {}
    void HandleEvent(Event& event) override { function_(event); }

  private:
    std::function<void(Event&)> function_;
};

class DomTest : public qorvex::test::QorvexTest {
  protected:
    DomTest();
    ~DomTest() override;

    // A fresh document of this page, built as far as it goes without waiting.
    Document& Load(std::string_view html, const char* url = "file:///page.html");
    // The same without looking into the text.
    Document& LoadEmpty() { return Load("<body></body>"); }
    void DropDocument();
    qsl::RefPtr<Element> Make(std::string_view name, std::string_view id = {});
    Element& Body() { return *document_->GetBodyElement(); }
    Element& Find(std::string_view id);
    void Listen(EventTarget& target, std::string_view type, std::function<void(Event&)> function,
                bool capture = false);

    // "div#id(text,span())": tag, id and content of a subtree.
    static std::string Shape(const Node& node);
    std::string BodyShape() { return Shape(Body()); }

    TestHost* host_ = nullptr;
    TestStyleEngine* style_ = nullptr;
    TestLoader* loader_ = nullptr;
    qsl::RefPtr<Document> document_;

  private:
    std::unique_ptr<TestHost> owned_host_;
};

}  // namespace qorvex::dom::test
