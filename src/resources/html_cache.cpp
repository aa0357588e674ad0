#include "resources/html_cache.h"

#include "core/logging/log.h"

namespace qorvex {

void HTMLCache::Request(const URL& url, uint32_t subscriber, OnLoad on_load, OnError on_error) {
    if (!on_load) AssertFailure("Provided OnLoad callback is empty");
    if (!on_error) AssertFailure("Provided OnLoadError callback is empty");
    UrlKey key = MakeUrlKey(url);
    if (RefPtr<dom::ParsedHTML>* html = cached_.get(key)) {
        RefPtr<dom::ParsedHTML> held = *html;
        if (on_load) on_load(url, std::move(held));
        return;
    }
    Subscriber callables{std::move(on_load), std::move(on_error)};
    if (auto* request = in_flight_.get(key)) {
        (*request)->subscribers.insert_or_assign(subscriber, std::move(callables));
        return;
    }
    if (url.IsRelative()) AssertFailure("Provided URL must be absolute");
    auto request = MakeUnique<InFlightRequest, MemoryTag::Resources>();
    request->url = url;
    request->subscribers.insert_or_assign(subscriber, std::move(callables));
    InFlightRequest& entered = *request;
    in_flight_.insert_or_assign(std::move(key), std::move(request));
    StartRequest(url, entered);
}

void HTMLCache::StartRequest(const URL& url, InFlightRequest& request) {
    // The answer may come on any thread, and after the entry has gone: it carries the URL, not the entry.
    auto on_finished = [this, family = family_, url](ResourceRequestJob& job) {
        auto parse = [this, url, held = ResourceJobPtr(&job)](TaskFamilyHandle handle) {
            ParseJob(handle, url, *held);
        };
        family.Push(TaskChannels::Resources, MakeTask("ParseHTML", std::move(parse)));
    };
    TaskPtr task = context_.MakeResourceRequest(DescribeGet(url), std::move(on_finished), {}, false,
                                                &request.request_id);
    family_.Push(TaskChannels::Resources, std::move(task));
}

// Resource thread: touches the job and the family alone.
void HTMLCache::ParseJob(TaskFamilyHandle family, const URL& url, ResourceRequestJob& job) {
    RefPtr<ResourceBuffer> buffer = job.Succeeded() ? job.TakeBuffer() : nullptr;
    if (!buffer) {
        family.Push(TaskChannels::Main, MakeTask("HTMLLoadError", [this, url] { OnFailed(url); }));
        return;
    }
    const URL& response_url = job.GetResponseURL();
    const URL final_url = response_url.IsEmpty() ? url : response_url;
    // The parsed page reads its source in place and keeps the buffer for it.
    const std::string_view text = buffer->Text();
    RefPtr<dom::ParsedHTML> html = dom::ParseHTML(text, [keep = std::move(buffer)] {});
    family.Push(TaskChannels::Main,
                MakeTask("HTMLParsed", [this, url, final_url, html] { OnParsed(url, final_url, html); }));
}

void HTMLCache::OnParsed(const URL& request_url, const URL& final_url, RefPtr<dom::ParsedHTML> html) {
    // Taken out first: a subscriber may ask for the same page again.
    auto request = in_flight_.take(MakeUrlKey(request_url));
    if (!request) return;
    for (auto& [id, subscriber] : request->subscribers)
        subscriber.on_load(final_url, html);
}

void HTMLCache::OnFailed(const URL& request_url) {
    auto request = in_flight_.take(MakeUrlKey(request_url));
    if (!request) return;
    for (auto& [id, subscriber] : request->subscribers)
        subscriber.on_error(request_url);
}

void HTMLCache::Preload(const URL& url) {
    if (cached_.contains(MakeUrlKey(url))) {
        LogWarning("Trying to preload already cached HTML: ", url.GetText());
        return;
    }
    // Stored under the URL that was asked for, which is the one that a view will ask for.
    auto on_load = [this, url](const URL&, RefPtr<dom::ParsedHTML> html) {
        UrlKey key = MakeUrlKey(url);
        if (cached_.contains(key)) AssertFailure("The same HTML was cached twice");
        cached_.insert_or_assign(std::move(key), std::move(html));
    };
    auto on_error = [](const URL& failed) {
        LogWarning("Could not preload HTML with URL: ", failed.GetText());
    };
    Request(url, kPreloadSubscriber, std::move(on_load), std::move(on_error));
}

void HTMLCache::Unsubscribe(uint32_t subscriber, const URL& url) {
    const UrlKey key = MakeUrlKey(url);
    auto* request = in_flight_.get(key);
    if (!request) return;
    const bool removed = (*request)->subscribers.erase(subscriber);
    AbortIfUnwanted(key, removed);
}

void HTMLCache::AbortIfUnwanted(const UrlKey& key, bool was_removed) {
    auto* request = in_flight_.get(key);
    if (!request || !(*request)->subscribers.empty()) return;
    if (!was_removed) AssertFailure("Resource request should have been aborted earlier");
    // Taken out first: the client may answer, or ask for another page, inside the call.
    const uint32_t id = (*request)->request_id;
    in_flight_.erase(key);
    context_.Abort(id);
}

void HTMLCache::AbortUnwanted() {
    Vector<UrlKey, MemoryTag::Resources> unwanted;
    for (auto& [key, request] : in_flight_)
        if (request->subscribers.empty()) unwanted.push_back(key);
    for (const UrlKey& key : unwanted)
        AbortIfUnwanted(key, true);
}

void HTMLCache::UnsubscribeAll(uint32_t subscriber) {
    for (auto& [key, request] : in_flight_)
        request->subscribers.erase(subscriber);
    AbortUnwanted();
}

bool HTMLCache::Remove(const URL& url) {
    return cached_.erase(MakeUrlKey(url));
}

void HTMLCache::Clear() {
    cached_.clear();
    UnsubscribeAll(kPreloadSubscriber);
}

}  // namespace qorvex
