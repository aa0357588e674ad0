// The stylesheet half of DocumentLoader: cache first, then a load that is on its way, then a request.
#include "core/logging/log.h"
#include "resources/document_loader.h"
#include "resources/parse_css_task.h"

namespace qorvex {

uint32_t DocumentLoader::LoadAndParseStylesheet(const URL& url, dom::Element& element, bool deferred) {
    LogDebug("DocumentLoader | Load and parse stylesheet request: ", url.GetText());
    Waiter waiter = MakeWaiter(element, deferred);
    const URL absolute = Resolve(url);
    const uint32_t id = next_stylesheet_id_++;
    if (RefPtr<css::Stylesheet> sheet = stylesheet_cache_.Find(absolute)) {
        element.OnStylesheetLoaded(id, std::move(sheet));
        Resume(waiter);
        return id;
    }
    active_stylesheets_.insert_or_assign(id, std::move(waiter));
    const auto document = GetWeakDocument();
    // The cache speaks inside System::Advance; the page's scripts run inside operations of their view alone.
    const TaskFamilyHandle family = host_.GetLoaderFamily();
    const bool joined =
        stylesheet_cache_.Join(absolute, [family, document, id](RefPtr<css::Stylesheet> loaded) {
            PushSheet(family, "NewStyleFromFile", std::move(loaded),
                      [document, id](const RefPtr<css::Stylesheet>& sheet) {
                          if (dom::Document* alive = document.get())
                              GetLoaderOf(*alive).DeliverStylesheet(id, sheet);
                      });
        });
    if (joined) return id;

    UrlKey key = MakeUrlKey(absolute);
    if (auto* waiting = loading_stylesheets_.get(key)) {
        waiting->push_back(id);
        return id;
    }
    if (!IsAllowed(absolute)) {
        PushSheet(family, "NewStyleFromFile", nullptr, [document, id](const RefPtr<css::Stylesheet>& sheet) {
            if (dom::Document* alive = document.get()) GetLoaderOf(*alive).DeliverStylesheet(id, sheet);
        });
        return id;
    }
    loading_stylesheets_[key].push_back(id);
    if (Prefetch* found = prefetched_.get(key)) {
        Prefetch prefetch = std::move(*found);
        prefetched_.erase(key);
        prefetch_keys_.erase(prefetch.id);
        if (prefetch.job)
            ParseStylesheetJob(key, std::move(prefetch.job));
        else
            prefetched_stylesheets_.insert_or_assign(prefetch.id, std::move(key));
        return id;
    }
    LoadStylesheetBytes(absolute);
    return id;
}

void DocumentLoader::LoadStylesheetBytes(const URL& url) {
    const TaskFamilyHandle family = host_.GetLoaderFamily();
    auto on_finished = [family, &strings = document_->GetStrings(), document = GetWeakDocument(),
                        key = MakeUrlKey(url)](ResourceRequestJob& job) {
        auto deliver = [document, key, request_id = job.GetId()](const RefPtr<css::Stylesheet>& sheet) {
            if (dom::Document* alive = document.get())
                GetLoaderOf(*alive).DeliverLoadedStylesheet(key, request_id, sheet);
        };
        if (job.Succeeded() && !job.GetData().empty()) {
            LogDebug("DocumentLoader | Loaded stylesheet: ", job.GetAbsoluteURL());
            PushParseCSS(family, strings, ResourceJobPtr(&job), "NewStyleFromFile", std::move(deliver));
        } else {
            LogWarning("DocumentLoader | Failed loading stylesheet: ", job.GetAbsoluteURL());
            PushSheet(family, "NewStyleFromFile", nullptr, std::move(deliver));
        }
    };
    uint32_t id = 0;
    TaskPtr task = context_.MakeResourceRequest(DescribeGet(url), std::move(on_finished), {}, false, &id);
    request_ids_.insert(id);
    family.Push(TaskChannels::Resources, std::move(task));
}

void DocumentLoader::ParseStylesheetJob(const UrlKey& url, ResourceJobPtr job) {
    const TaskFamilyHandle family = host_.GetLoaderFamily();
    auto deliver = [document = GetWeakDocument(), url,
                    id = job->GetId()](const RefPtr<css::Stylesheet>& sheet) {
        if (dom::Document* alive = document.get())
            GetLoaderOf(*alive).DeliverLoadedStylesheet(url, id, sheet);
    };
    if (job->Succeeded() && !job->GetData().empty())
        PushParseCSS(family, document_->GetStrings(), std::move(job), "NewStyleFromFile", std::move(deliver));
    else
        PushSheet(family, "NewStyleFromFile", nullptr, std::move(deliver));
}

void DocumentLoader::DeliverLoadedStylesheet(const UrlKey& url, uint32_t request_id,
                                             const RefPtr<css::Stylesheet>& sheet) {
    request_ids_.erase(request_id);
    const auto document = GetWeakDocument();
    const auto waiting = loading_stylesheets_.take(url);
    for (uint32_t id : waiting) {
        DeliverStylesheet(id, sheet);
        if (!document) return;
    }
}

void DocumentLoader::DeliverStylesheet(uint32_t id, const RefPtr<css::Stylesheet>& sheet) {
    if (!active_stylesheets_.contains(id)) {
        if (!document_->IsUnloaded()) AssertFailure("Loaded a stylesheet that is not tracked!");
        return;
    }
    Waiter waiter = active_stylesheets_.take(id);
    Resume(waiter);
    if (dom::Element* element = waiter.element.get()) element->OnStylesheetLoaded(id, sheet);
}

uint32_t DocumentLoader::ParseStylesheetText(std::string_view text, dom::Element& element) {
    const uint32_t id = next_stylesheet_id_++;
    Waiter waiter;
    waiter.element = script::WeakHandle<dom::Element>(&element);
    waiter.blocker = RefPtr<dom::Element>(&element);  // the caller has paused the building
    active_stylesheets_.insert_or_assign(id, std::move(waiter));
    PushParseCSS(host_.GetLoaderFamily(), document_->GetStrings(), text, document_->GetURL(),
                 "NewStyleFromString",
                 [document = GetWeakDocument(), id](const RefPtr<css::Stylesheet>& sheet) {
                     if (dom::Document* alive = document.get())
                         GetLoaderOf(*alive).DeliverStylesheet(id, sheet);
                 });
    return id;
}

void DocumentLoader::RequestStylesheetPrefetch(const URL& url) {
    const URL absolute = Resolve(url);
    if (absolute.IsEmpty() || !IsAllowed(absolute)) return;
    LogDebug("DocumentLoader | Request pre-fetch: ", absolute.GetText());
    stylesheet_cache_.Load(absolute);
}

}  // namespace qorvex
