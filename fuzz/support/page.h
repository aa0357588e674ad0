// A document without a view, whose loads are answered when the target says so.
#pragma once

#include "core/memory/containers.h"
#include "core/tasks/task_system.h"
#include "dom/document.h"
#include "dom/element.h"
#include "dom/resource_loader.h"
#include "dom/style_engine.h"
#include "tests/support/idle_page.h"

namespace qorvex::fuzz {

/// Stands in for the page's scripts: called with the text of each.
using OnScript = void (*)(dom::Document& document, std::string_view source, void* user);

class PageHost final : public qorvex::test::IdleHost {
  public:
    PageHost() { tasks_.OpenChannel(TaskChannels::Main, kFamily); }
    TaskFamilyHandle GetTaskFamily() override { return {kFamily, &tasks_}; }
    void EvaluateScript(dom::Document& document, std::string_view source, std::string_view) override {
        if (on_script) on_script(document, source, user);
    }

    /// What elements have put off, such as the events of images.
    void RunTasks() { tasks_.Run(TaskChannels::Main, false, nullptr, kFamily); }

    OnScript on_script = nullptr;
    void* user = nullptr;

  private:
    static constexpr uint32_t kFamily = 1;
    TaskSystem tasks_{TaskSystemSettings{}};
};

/// Gathers requests; Answer gives each one what its own address says, or a failure to every third.
class PageLoader final : public dom::IDocumentLoader {
  public:
    uint32_t LoadResource(const URL& url, dom::Element& element, bool deferred) override;
    uint32_t LoadAndParseStylesheet(const URL& url, dom::Element& element, bool deferred) override;
    uint32_t ParseStylesheetText(std::string_view text, dom::Element& element) override;
    void RequestPrefetch(const URL&) override {}
    void RequestStylesheetPrefetch(const URL&) override {}
    bool HasPendingWork() const override { return !requests_.empty(); }
    void StopLoading() override { requests_.clear(); }

    /// False when nothing was left to answer.
    bool Answer(dom::Document& document);

  private:
    enum class Kind { Resource, Sheet, SheetText };
    struct Request {
        Kind kind;
        uint32_t id;
        String text;
        script::WeakHandle<dom::Element> element;
        qsl::RefPtr<dom::Element> blocker;  // held, or nobody could resume it
    };
    uint32_t Add(Kind kind, std::string_view text, dom::Element& element, bool deferred);

    Vector<Request, MemoryTag::General> requests_;
    uint32_t next_id_ = 0;
};

/// Solves nothing: for targets that are about the tree.
class IdleStyleEngine final : public dom::IStyleEngine {
  public:
    const css::LayoutStyleRefs& GetDefaultStyle() const override { return css::DefaultStyles(); }
    void AddStyleSheet(dom::Document&, dom::Element*, css::StylesheetPtr, std::string_view) override {}
    void RemoveStyleSheet(dom::Document&, dom::Element*) override {}
    void SolveStyles(dom::Document&) override {}
    void OnMetricsChanged(dom::Document&) override {}
    bool IsSelectorAttribute(Atom name) const override { return name.size() % 2 != 0; }
    bool IsSelectorDataAttribute(Atom name) const override { return name.size() % 2 != 0; }
    uint32_t SubtreeInvalidatingRules() const override { return 1; }
    uint32_t SiblingInvalidatingRules() const override { return 1; }
    bool Matches(dom::Element&, std::string_view) override { return false; }
    dom::Element* Closest(dom::Element&, std::string_view) override { return nullptr; }
    dom::Element* QuerySelector(dom::Node&, std::string_view) override { return nullptr; }
    void QuerySelectorAll(dom::Node&, std::string_view, Vector<dom::Element*, MemoryTag::DOM>&) override {}
};

class Page {
  public:
    explicit Page(PageHost& host) : host_(host) {}
    ~Page() { document_ = nullptr; }

    /// Builds as far as it goes until everything that was asked for has been answered.
    dom::Document& Load(std::string_view html, std::string_view url,
                        UniquePtr<dom::IStyleEngine, MemoryTag::DOM> style);

  private:
    PageHost& host_;
    qsl::RefPtr<dom::Document> document_;
};

/// What has to hold of any tree.
void CheckTree(dom::Document& document);

}  // namespace qorvex::fuzz
