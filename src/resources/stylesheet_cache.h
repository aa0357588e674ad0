// Parsed stylesheets by URL, one cache for each system. Loads that the cache starts itself (preloads) stay in
// it; a document joins such a load, and otherwise loads for itself.
//
// Invariant: main thread only, but for the client's answer, which only pushes ParseCSS; when the cache's
// family is closed, a late answer reaches nobody.
#pragma once

#include "core/memory/containers.h"
#include "core/memory/string_pool.h"
#include "core/tasks/task_system.h"
#include "css/parser/stylesheet.h"
#include "resources/resource_context.h"
#include "resources/url_key.h"

namespace qorvex {

class StylesheetCache {
  public:
    // A null sheet means failure.
    using OnSheet = Function<void(RefPtr<css::Stylesheet> sheet)>;

    StylesheetCache(TaskFamilyHandle family, ResourceContext& context, StringPool& strings)
        : family_(family), context_(context), strings_(strings) {}

    RefPtr<css::Stylesheet> Find(const URL& url) const;
    // Starts a load unless the sheet is there or on its way.
    void Load(const URL& url);
    // True when a load is on its way, whose result `on_sheet` will get.
    bool Join(const URL& url, OnSheet on_sheet);
    bool Remove(const URL& url) { return cached_.erase(MakeUrlKey(url)); }
    void Clear() { cached_.clear(); }

    bool IsLoading() const { return !in_flight_.empty(); }
    // Tells the client that nobody wants the sheets that are on their way.
    void AbandonLoads();

  private:
    struct InFlightRequest {
        uint32_t request_id = 0;
        Vector<OnSheet, MemoryTag::Resources> waiting;
    };

    void OnParsed(const URL& url, RefPtr<css::Stylesheet> sheet);

    TaskFamilyHandle family_;
    ResourceContext& context_;
    StringPool& strings_;
    HashMap<UrlKey, RefPtr<css::Stylesheet>, MemoryTag::Resources> cached_;
    HashMap<UrlKey, InFlightRequest, MemoryTag::Resources> in_flight_;
};

}  // namespace qorvex
