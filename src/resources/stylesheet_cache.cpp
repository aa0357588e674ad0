#include "resources/stylesheet_cache.h"

#include "core/logging/log.h"
#include "resources/parse_css_task.h"

namespace qorvex {

RefPtr<css::Stylesheet> StylesheetCache::Find(const URL& url) const {
    const RefPtr<css::Stylesheet>* sheet = cached_.get(MakeUrlKey(url));
    return sheet ? *sheet : nullptr;
}

void StylesheetCache::Load(const URL& url) {
    UrlKey key = MakeUrlKey(url);
    if (cached_.contains(key) || in_flight_.contains(key)) return;
    in_flight_.try_emplace(key);
    auto deliver = [this, url](RefPtr<css::Stylesheet> sheet) { OnParsed(url, std::move(sheet)); };
    auto on_finished = [family = family_, &strings = strings_, deliver](ResourceRequestJob& job) {
        const bool loaded = job.Succeeded() && !job.GetData().empty();
        if (loaded)
            LogDebug("StylesheetCache | Loaded stylesheet: ", job.GetAbsoluteURL());
        else
            LogDebug("StylesheetCache | Failed loading stylesheet: ", job.GetAbsoluteURL());
        if (loaded)
            PushParseCSS(family, strings, ResourceJobPtr(&job), "NewStyleFromFile", deliver);
        else
            PushSheet(family, "NewStyleFromFile", nullptr, deliver);
    };
    uint32_t id = 0;
    TaskPtr task = context_.MakeResourceRequest(DescribeGet(url), std::move(on_finished), {}, false, &id);
    if (InFlightRequest* request = in_flight_.get(key)) request->request_id = id;
    family_.Push(TaskChannels::Resources, std::move(task));
}

bool StylesheetCache::Join(const URL& url, OnSheet on_sheet) {
    InFlightRequest* request = in_flight_.get(MakeUrlKey(url));
    if (!request) return false;
    request->waiting.push_back(std::move(on_sheet));
    return true;
}

void StylesheetCache::AbandonLoads() {
    const auto abandoned = std::exchange(in_flight_, {});
    for (const auto& [url, request] : abandoned)
        context_.Abort(request.request_id);
}

void StylesheetCache::OnParsed(const URL& url, RefPtr<css::Stylesheet> sheet) {
    UrlKey key = MakeUrlKey(url);
    if (!in_flight_.contains(key)) return;
    const InFlightRequest request = in_flight_.take(key);
    if (sheet) {
        strings_.KeepSoFar();
        cached_.insert_or_assign(std::move(key), sheet);
    }
    for (const OnSheet& on_sheet : request.waiting)
        on_sheet(sheet);
}

}  // namespace qorvex
