#include "resources/document_loader.h"

#include "core/limits.h"
#include "core/logging/log.h"

namespace qorvex {

DocumentLoader::DocumentLoader(ILoaderHost& host, ResourceContext& context, StylesheetCache& stylesheets)
    : host_(host), context_(context), stylesheet_cache_(stylesheets) {}

DocumentLoader::~DocumentLoader() = default;

void DocumentLoader::SetDocument(dom::Document& document) {
    document_ = &document;
}

script::WeakHandle<dom::Document> DocumentLoader::GetWeakDocument() const {
    return script::WeakHandle<dom::Document>(document_);
}

DocumentLoader& GetLoaderOf(dom::Document& document) {
    return static_cast<DocumentLoader&>(document.GetLoader());
}

URL DocumentLoader::Resolve(const URL& url) const {
    return url.IsRelative() && !url.IsEmpty() ? url.Merge(document_->GetURL()) : url;
}

bool DocumentLoader::IsAllowed(const URL& url) {
    if (host_.IsRequestAllowed(url)) return true;
    LogWarning("Resource request for ", url.GetText(), " is not allowed from this view.");
    return false;
}

DocumentLoader::Waiter DocumentLoader::MakeWaiter(dom::Element& element, bool deferred) {
    Waiter waiter;
    waiter.element = script::WeakHandle<dom::Element>(&element);
    if (deferred || document_->GetBuildState() != dom::BuildState::Building) return waiter;
    document_->PauseDOMBuilding(element);
    waiter.blocker = RefPtr<dom::Element>(&element);
    return waiter;
}

void DocumentLoader::Resume(Waiter& waiter) {
    if (waiter.blocker) document_->ResumeDOMBuilding(*waiter.blocker);
}

void DocumentLoader::DrainResourceEvents() {
    // Each level may run a script that asks for the next resource, so a page decides how deep this nests;
    // what lies deeper waits for the next frame.
    if (context_.AreRequestsOnWorkers() || drain_depth_ >= limits::kMaxNestedResourceEvents) return;
    ++drain_depth_;
    const auto document = GetWeakDocument();
    const TaskFamilyHandle family = host_.GetLoaderFamily();
    family.system->Run(TaskChannels::ResourceEvents, false, nullptr, family.family);
    if (document) --drain_depth_;
}

uint32_t DocumentLoader::MakeTrackedRequest(const URL& url) {
    const TaskFamilyHandle family = host_.GetLoaderFamily();
    auto on_finished = [family, document = GetWeakDocument()](ResourceRequestJob& job) {
        family.Push(
            TaskChannels::ResourceEvents,
            MakeTask("ResolvePendingResourceJob", [document, held = ResourceJobPtr(&job)](TaskFamilyHandle) {
                if (dom::Document* alive = document.get())
                    GetLoaderOf(*alive).ResolveJob(held->GetId(), held);
            }));
    };
    uint32_t id = 0;
    TaskPtr task = context_.MakeResourceRequest(DescribeGet(url), std::move(on_finished), {}, false, &id);
    request_ids_.insert(id);
    family.Push(TaskChannels::Resources, std::move(task));
    return id;
}

uint32_t DocumentLoader::LoadResource(const URL& url, dom::Element& element, bool deferred) {
    LogDebug("DocumentLoader | Load resource request: ", url.GetText());
    Waiter waiter = MakeWaiter(element, deferred);
    const URL absolute = Resolve(url);
    if (!IsAllowed(absolute)) {
        host_.GetLoaderFamily().Push(
            TaskChannels::Main,
            MakeTask("UpdateResourceLoadingState",
                     [document = GetWeakDocument(), waiter = std::move(waiter)](TaskFamilyHandle) mutable {
                         dom::Document* alive = document.get();
                         if (!alive) return;
                         GetLoaderOf(*alive).Resume(waiter);
                         if (dom::Element* target = waiter.element.get())
                             target->OnResourceLoaded(0, nullptr);
                     }));
        return 0;
    }
    const UrlKey key = MakeUrlKey(absolute);
    uint32_t id = 0;
    if (Prefetch* found = prefetched_.get(key)) {
        Prefetch prefetch = std::move(*found);
        prefetched_.erase(key);
        id = prefetch.id;
        prefetch_keys_.erase(id);
        active_loads_.insert_or_assign(id, std::move(waiter));
        if (prefetch.job) AdoptPrefetch(id, std::move(prefetch.job));
    } else {
        id = MakeTrackedRequest(absolute);
        active_loads_.insert_or_assign(id, std::move(waiter));
    }
    DrainResourceEvents();
    return id;
}

// The bytes have been here before the element that wants them.
void DocumentLoader::AdoptPrefetch(uint32_t id, ResourceJobPtr finished) {
    host_.GetLoaderFamily().Push(
        TaskChannels::ResourceEvents,
        MakeTask("UpdateResourceLoadingState",
                 [id, job = std::move(finished), document = GetWeakDocument()](TaskFamilyHandle) {
                     if (dom::Document* alive = document.get()) GetLoaderOf(*alive).ResolveJob(id, job);
                 }));
}

void DocumentLoader::ResolveJob(uint32_t id, ResourceJobPtr job) {
    request_ids_.erase(id);
    const char* outcome = job->GetStatus() == IAsyncResourceResponse::Status::Success ? "Success" : "Failure";
    if (active_loads_.contains(id)) {
        Waiter waiter = active_loads_.take(id);
        LogDebug("DocumentLoader | Got resource load result for: ", job->GetAbsoluteURL(),
                 " with status: ", outcome);
        Resume(waiter);
        if (dom::Element* element = waiter.element.get()) element->OnResourceLoaded(id, job.get());
        return;
    }
    if (prefetched_stylesheets_.contains(id)) {
        ParseStylesheetJob(prefetched_stylesheets_.take(id), std::move(job));
        return;
    }
    if (prefetch_keys_.contains(id)) {
        LogDebug("DocumentLoader | Got resource pre-fetch result for: ", job->GetAbsoluteURL(),
                 " with status: ", outcome);
        Prefetch* prefetch = prefetched_.get(prefetch_keys_.take(id));
        if (prefetch && prefetch->id == id) prefetch->job = std::move(job);
        return;
    }
    // An answer to a request that StopLoading has given up is no mistake.
    if (!stopping_ && !stopped_) AssertFailure("Loaded a resources that is not tracked!");
}

void DocumentLoader::RequestPrefetch(const URL& url) {
    LogDebug("DocumentLoader | Request pre-fetch: ", url.GetText());
    const URL absolute = Resolve(url);
    UrlKey key = MakeUrlKey(absolute);
    if (absolute.IsEmpty() || prefetched_.contains(key) || !IsAllowed(absolute)) return;
    // The id is known only when the request has been made, and it may be finished by then: its answer waits
    // on the channel either way.
    Prefetch prefetch;
    prefetch.id = MakeTrackedRequest(absolute);
    prefetch_keys_.insert_or_assign(prefetch.id, UrlKey(key));
    prefetched_.insert_or_assign(std::move(key), std::move(prefetch));
}

TaskPtr DocumentLoader::Load(ResourceRequestDescription description, ResourceJobCallback on_finished,
                             ResourceJobCallback on_progress, bool binary, uint32_t* id) {
    LogDebug("DocumentLoader | Load request: ", description.url.GetText());
    const TaskFamilyHandle family = host_.GetLoaderFamily();
    auto wrapped = [family, document = GetWeakDocument(),
                    on_finished = std::move(on_finished)](ResourceRequestJob& job) mutable {
        if (on_finished) on_finished(job);
        family.Push(TaskChannels::ResourceEvents,
                    MakeTask("UpdateResourceLoadingState", [document, id = job.GetId()](TaskFamilyHandle) {
                        if (dom::Document* alive = document.get())
                            GetLoaderOf(*alive).CompleteTrackedRequest(id);
                    }));
    };
    uint32_t request_id = 0;
    TaskPtr task = context_.MakeResourceRequest(std::move(description), std::move(wrapped),
                                                std::move(on_progress), binary, &request_id);
    if (!request_ids_.insert(request_id).second)
        AssertFailure("Tried to track resource request job that is already tracked.");
    if (id) *id = request_id;
    return task;
}

void DocumentLoader::CompleteTrackedRequest(uint32_t id) {
    if (aborted_ids_.erase(id)) return;
    if (!request_ids_.erase(id) && !stopped_)
        AssertFailure("Completed a resource request job which wasn't tracked.");
}

void DocumentLoader::Abort(uint32_t id) {
    // Nobody waits for an aborted request, whether it is ever answered or not.
    if (request_ids_.erase(id))
        aborted_ids_.insert(id);
    else
        AssertFailure("Trying to abort a resource job that is not started or has completed.");
    context_.Abort(id);
}

bool DocumentLoader::HasPendingWork() const {
    return !active_loads_.empty() || !active_stylesheets_.empty() || !request_ids_.empty();
}

void DocumentLoader::StopLoading() {
    if (stopping_) return;  // a script that ran below asked for another page
    stopping_ = true;
    const TaskFamilyHandle family = host_.GetLoaderFamily();
    const auto document = GetWeakDocument();
    family.system->Run(TaskChannels::ResourceEvents, false, nullptr, family.family);
    if (!document) return;
    // Taken out first: the client may finish a request inside the call that aborts it.
    const auto ids = std::exchange(request_ids_, {});
    for (uint32_t id : ids)
        if (host_.GiveUpRequest(id, *document_)) context_.Abort(id);
    prefetched_.clear();
    prefetch_keys_.clear();
    prefetched_stylesheets_.clear();
    // The page goes for good: elements that the building waited for must not hold it. Else the page may stay,
    // if nothing comes of the next one, and late answers still find their elements.
    if (document_->IsUnloaded()) {
        active_loads_.clear();
        active_stylesheets_.clear();
        loading_stylesheets_.clear();
    }
    stopping_ = false;
    stopped_ = true;
}

}  // namespace qorvex
