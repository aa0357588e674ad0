// Parsed pages by URL, one cache for each system. It serves finished pages at once and joins requests for a
// page that is on its way. Only preloaded pages stay: a page that a view loaded for itself belongs to that
// view.
//
// Invariant: all tables are touched on the main thread only; the answer of the client comes in on any thread
// and does nothing but push ParseHTML.
#pragma once

#include "core/memory/containers.h"
#include "core/tasks/task_system.h"
#include "dom/parsed_html.h"
#include "resources/resource_context.h"
#include "resources/url_key.h"

namespace qorvex {

class HTMLCache {
  public:
    // `url` is where the page finally came from.
    using OnLoad = Function<void(const URL& url, RefPtr<dom::ParsedHTML> html)>;
    using OnError = Function<void(const URL& url)>;

    // View ids count up from 0, so this one is never reached.
    static constexpr uint32_t kPreloadSubscriber = 0xFFFFFFFFu;

    HTMLCache(TaskFamilyHandle family, ResourceContext& context) : family_(family), context_(context) {}

    // One of the callables is called once, unless the subscriber is taken off before.
    void Request(const URL& url, uint32_t subscriber, OnLoad on_load, OnError on_error);
    void Preload(const URL& url);
    void Unsubscribe(uint32_t subscriber, const URL& url);
    // From every request: the subscriber goes.
    void UnsubscribeAll(uint32_t subscriber);
    bool Remove(const URL& url);
    void Clear();

  private:
    struct Subscriber {
        OnLoad on_load;
        OnError on_error;
    };
    struct InFlightRequest {
        URL url;
        uint32_t request_id = 0;
        HashMap<uint32_t, Subscriber, MemoryTag::Resources> subscribers;
    };

    void StartRequest(const URL& url, InFlightRequest& request);
    void ParseJob(TaskFamilyHandle family, const URL& url, ResourceRequestJob& job);
    void OnParsed(const URL& request_url, const URL& final_url, RefPtr<dom::ParsedHTML> html);
    void OnFailed(const URL& request_url);
    void AbortIfUnwanted(const UrlKey& key, bool was_removed);
    void AbortUnwanted();

    TaskFamilyHandle family_;
    ResourceContext& context_;
    HashMap<UrlKey, UniquePtr<InFlightRequest, MemoryTag::Resources>, MemoryTag::Resources> in_flight_;
    HashMap<UrlKey, RefPtr<dom::ParsedHTML>, MemoryTag::Resources> cached_;
};

}  // namespace qorvex
