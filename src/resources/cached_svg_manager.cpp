#include "resources/cached_svg_manager.h"

#include <cstdio>

#include "core/logging/log.h"
#include "resources/document_loader.h"
#include "resources/reload.h"

namespace qorvex {

using dom::SVGImagePtr;

void CachedSVGManager::Close() {
    Vector<uint32_t, MemoryTag::Resources> requests;
    qsl::MutexLock lock(mutex_);
    for (const auto& [id, entry] : svgs_)
        if (entry.request != kNone) requests.push_back(entry.request);
    svgs_.clear();
    orphans_.Clear();
    ids_by_url_.clear();
    lock.Unlock();
    for (uint32_t request : requests)
        context_->Abort(request);
}

void CachedSVGManager::RegisterSVG(const URL& url, dom::Node& node, uint32_t* id) {
    qsl::MutexLock lock(mutex_);
    UrlKey key = MakeUrlKey(url);
    const uint32_t* known = ids_by_url_.get(key);
    *id = known ? *known : next_id_++;
    CachedSVG& entry = svgs_[*id];
    if (!known) {
        LogTrace("Creating SVG  ", url.GetText(), " assigned id ", *id);
        ids_by_url_.insert_or_assign(std::move(key), *id);
        entry.url = url;
    } else if (entry.holders.IsEmpty()) {
        LogTrace("Resurrecting SVG: ", url.GetText(), " assigned id ", *id);
        entry.url = url;
        entry.svg = orphans_.Take(*id).payload;
        entry.state = State::Loaded;
    } else {
        LogTrace("Will reuse SVG: ", url.GetText(), " with id ", *id);
    }
    entry.holders.Add(node, next_holder_++);
    const bool finished = entry.state != State::Loading;
    const SVGImagePtr svg = entry.svg;
    lock.Unlock();
    if (finished) node.OnSVGLoaded(*id, svg);
    if (!known) StartLoad(*id, url, *node.GetDocument());
}

void CachedSVGManager::StartLoad(uint32_t id, const URL& url, dom::Document& document) {
    RefPtr<CachedSVGManager> self(this);
    auto on_finished = [self, id](ResourceRequestJob& job) {
        {
            qsl::MutexLock lock(self->mutex_);
            if (CachedSVG* entry = self->svgs_.get(id)) {
                entry->request = kNone;
                entry->answered = true;
            }
        }
        self->family_.Push(
            TaskChannels::Resources,
            MakeTask("BuildSVGTask", [self, id, held = ResourceJobPtr(&job)](TaskFamilyHandle) {
                self->Build(id, held->Succeeded() ? held->GetData() : std::span<const uint8_t>());
            }));
    };
    uint32_t request = 0;
    TaskPtr task = GetLoaderOf(document).Load(DescribeGet(url), std::move(on_finished), {}, false, &request);
    {
        qsl::MutexLock lock(mutex_);
        // The answer may have come already.
        CachedSVG* entry = svgs_.get(id);
        if (entry && !entry->answered) entry->request = request;
    }
    family_.Push(TaskChannels::Resources, std::move(task));
}

void CachedSVGManager::Build(uint32_t id, std::span<const uint8_t>) {
    if (!reported_.exchange(true)) LogWarning("SVG images are not available in this build");
    Finish(id, nullptr);
}

void CachedSVGManager::Finish(uint32_t id, SVGImagePtr svg) {
    qsl::MutexLock lock(mutex_);
    CachedSVG* entry = svgs_.get(id);
    if (!entry) return;
    LogTrace("SVG : ", entry->url.GetText(), svg ? " loaded sucessfully" : " load FAILED");
    entry->svg = svg;
    entry->state = svg ? State::Loaded : State::Failed;
    for (const auto& [key, holder] : entry->holders.GetAll()) {
        RefPtr<CachedSVGManager> self(this);
        holder.family.Push(TaskChannels::Main,
                           MakeTask("UpdateCachedSVGState", [self, node = holder.node, serial = holder.serial,
                                                             id, svg](TaskFamilyHandle) {
                               dom::Node* alive = node.get();
                               if (alive && self->IsHolder(id, *alive, serial)) alive->OnSVGLoaded(id, svg);
                           }));
    }
}

bool CachedSVGManager::IsHolder(uint32_t id, const dom::Node& node, uint32_t serial) {
    qsl::MutexLock lock(mutex_);
    const CachedSVG* entry = svgs_.get(id);
    return entry && entry->holders.Holds(node, serial);
}

void CachedSVGManager::UnregisterSVG(uint32_t id, const dom::Node& node) {
    qsl::MutexLock lock(mutex_);
    CachedSVG* entry = svgs_.get(id);
    if (!entry) {
        char text[64];
        std::snprintf(text, sizeof text, "Trying to destroy missing cached SVG with ID: %u", id);
        AssertFailure(text);
        return;
    }
    if (!entry->holders.Remove(node) || !entry->holders.IsEmpty()) return;
    const uint32_t request = Relinquish(id);
    lock.Unlock();
    if (request != kNone) GetLoaderOf(*node.GetDocument()).AbortShared(request);
}

void CachedSVGManager::ForgetDocument(const dom::Document& document) {
    Vector<uint32_t, MemoryTag::Resources> unused;
    Vector<uint32_t, MemoryTag::Resources> requests;
    {
        qsl::MutexLock lock(mutex_);
        for (auto& [id, entry] : svgs_)
            if (entry.holders.RemoveAllOf(document) && entry.holders.IsEmpty()) unused.push_back(id);
        for (uint32_t id : unused) {
            const uint32_t request = Relinquish(id);
            if (request != kNone) requests.push_back(request);
        }
    }
    for (uint32_t request : requests)
        GetLoaderOf(const_cast<dom::Document&>(document)).AbortShared(request);
}

uint32_t CachedSVGManager::Relinquish(uint32_t id) {
    CachedSVG entry = svgs_.take(id);
    if (entry.state == State::Loaded) {
        LogTrace("Orphaning SVG ", id);
        PruneOrphans(limits_);
        orphans_.Add(id, entry.url, entry.svg, entry.svg->GetBytes());
    } else {
        ids_by_url_.erase(MakeUrlKey(entry.url));
    }
    return entry.request;
}

void CachedSVGManager::PruneOrphans(const CacheLimits& limits) {
    for (const auto& orphan : orphans_.TakeBeyond(limits)) {
        LogTrace("Pruned SVG ", orphan.url.GetText(), " from cache ");
        ids_by_url_.erase(MakeUrlKey(orphan.url));
    }
}

void CachedSVGManager::PruneAllOrphans() {
    qsl::MutexLock lock(mutex_);
    PruneOrphans(CacheLimits());
}

void CachedSVGManager::ReloadAll() {
    LogDebug("Force reloading all svg resources.");
    Reloads reloads;
    {
        qsl::MutexLock lock(mutex_);
        PruneOrphans(CacheLimits());
        reloads = CollectReloads(svgs_, [](CachedSVG& entry) {
            if (entry.state == State::Loading) return false;
            entry.state = State::Loading;
            entry.svg = nullptr;
            entry.answered = false;
            return true;
        });
    }
    StartReloads(reloads, [this](uint32_t id, const URL& url, dom::Document& document) {
        StartLoad(id, url, document);
    });
}

}  // namespace qorvex
