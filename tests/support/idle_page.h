// The surroundings of a document without a view: a host that lets everything pass and a loader that loads
// nothing. For tests, benchmarks and fuzzers, which override what they look at.
#pragma once

#include <string_view>

#include "core/memory/string_pool.h"
#include "core/url/url.h"
#include "dom/document_host.h"
#include "dom/resource_loader.h"

namespace qorvex::test {

class IdleHost : public dom::IDocumentHost {
  public:
    explicit IdleHost(dom::HostSize size = {800, 600}) : size_(size) {}
    StringPool& GetStringPool() override { return strings; }
    TaskFamilyHandle GetTaskFamily() override { return {}; }
    uint32_t GetViewId() const override { return 0; }
    dom::HostSize GetViewSize() const override { return size_; }
    bool AreComplexSelectorsEnabled() const override { return true; }
    void RequestFrames(uint32_t) override {}
    void OnDOMBuilt(dom::Document&) override {}
    void OnFinishLoad(dom::Document&) override {}
    void EvaluateScript(dom::Document&, std::string_view, std::string_view) override {}
    void NavigateTo(const URL&) override {}

    StringPool strings;

  private:
    dom::HostSize size_;
};

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

}  // namespace qorvex::test
