// Who uses which image, and what becomes of those that nobody uses.
#include "resources/cached_images_manager.h"

#include <fresco/rendering_library.h>

#include <cstdio>

#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/document_host.h"
#include "resources/document_loader.h"

#define IMAGE_LOG "CachedImagesManager: "

namespace qorvex {

using dom::ImageInfo;
using dom::ImageState;

namespace {

uint64_t BytesOf(const ImageInfo& info) {
    return static_cast<uint64_t>(info.description.width) * info.description.height * 4;
}

}  // namespace

CachedImagesManager::CachedImagesManager(TaskFamilyHandle family, RefPtr<ResourceContext> context,
                                         fresco::IRenderingLibrary& rendering, const CacheLimits& limits)
    : family_(family),
      context_(std::move(context)),
      rendering_(rendering),
      limits_(limits),
      no_info_(MakeRef<ImageInfo>()) {}

CachedImagesManager::~CachedImagesManager() = default;

void CachedImagesManager::Close() {
    qsl::MutexLock lock(mutex_);
    const auto requests = std::exchange(pending_requests_, {});
    const auto images = std::exchange(images_, {});
    for (const auto& [id, image] : images)
        uploads_.Free(*image.info);
    for (const auto& [id, orphan] : orphans_.GetAll())
        uploads_.Free(*orphan.payload);
    orphans_.Clear();
    image_ids_by_url_.clear();
    user_image_ids_.clear();
    lock.Unlock();
    // No renderer of this system may come by any more.
    const auto names = uploads_.TakePendingFrees();
    uploads_.Forget();
    if (!names.empty()) rendering_.RetireImages(names.data(), names.size());
    for (const PendingRequest& request : requests)
        context_->Abort(request.request_id);
}

// --- Uses

void CachedImagesManager::RegisterImage(const URL& url, dom::Node& node, uint32_t* id) {
    qsl::MutexLock lock(mutex_);
    UrlKey key = MakeUrlKey(url);
    CachedImage* image = nullptr;
    if (const uint32_t* known = image_ids_by_url_.get(key)) {
        *id = *known;
        image = images_.get(*known);
        if (image) {
            LogTrace(IMAGE_LOG "Will reuse image: ", url.GetText(), " with id ", *id);
        } else {
            image = &Resurrect(*known);
            LogTrace(IMAGE_LOG "Resurrecting image: ", url.GetText(), " assigned id ", *id);
        }
        image->holders.Add(node, next_holder_++);
        const dom::ImageInfoPtr info = image->info;
        const ImageState state = image->state;
        const bool again = std::exchange(image->given_up, false) && state == ImageState::Loading;
        lock.Unlock();
        Replay(node, *id, info, state);
        if (again) StartLoad(*id, url, GetLoaderOf(*node.GetDocument()));
        return;
    }
    *id = next_image_id_++;
    image_ids_by_url_.insert_or_assign(std::move(key), *id);
    image = &images_[*id];
    image->info = no_info_;
    image->url = url;
    image->holders.Add(node, next_holder_++);
    LogTrace(IMAGE_LOG "Started image load: ", url.GetText(), " assigned id ", *id);
    lock.Unlock();
    StartLoad(*id, url, GetLoaderOf(*node.GetDocument()));
}

void CachedImagesManager::Replay(dom::Node& node, uint32_t id, const dom::ImageInfoPtr& info,
                                 ImageState state) {
    const auto tell = [&](ImageState reached) {
        node.OnImageLoaded(id, reached < ImageState::Decoded ? no_info_ : info, reached);
    };
    tell(ImageState::Loading);
    if (state == ImageState::LoadFailed) return tell(state);
    if (state >= ImageState::Decoding) tell(ImageState::Decoding);
    if (state == ImageState::DecodeFailed) return tell(state);
    if (state >= ImageState::Decoded) tell(ImageState::Decoded);
    if (state == ImageState::OnGPU) tell(state);
}

void CachedImagesManager::UnregisterImage(uint32_t id, const dom::Node& node) {
    LogTrace(IMAGE_LOG "Relinquishing image ", id);
    qsl::MutexLock lock(mutex_);
    CachedImage* image = images_.get(id);
    if (!image) {
        char text[64];
        std::snprintf(text, sizeof text, "Relinquishing cached image that is not tracked! %u", id);
        AssertFailure(text);
        return;
    }
    if (!image->holders.Remove(node) || !image->holders.IsEmpty()) return;
    const uint32_t request = Relinquish(id);
    lock.Unlock();
    if (request == kNone) return;
    GetLoaderOf(*node.GetDocument()).AbortShared(request);
}

uint32_t CachedImagesManager::Relinquish(uint32_t id) {
    CachedImage image = images_.take(id);
    uint32_t request = kNone;
    pending_requests_.erase_if([&](const PendingRequest& pending) {
        if (pending.image_id != id) return false;
        request = pending.request_id;
        return true;
    });
    if (image.user_image_id != 0) user_image_ids_.erase(image.user_image_id);
    if (image.kind == ImageKind::User && image.info->HasResource()) {
        LogTrace(IMAGE_LOG "User image ", id, " scheduled to be freed with GPU resource id ",
                 image.info->resource);
        uploads_.Free(*image.info);
    }
    if (image.kind != ImageKind::Cached || !Orphan(id, image)) image_ids_by_url_.erase(MakeUrlKey(image.url));
    LogTrace(IMAGE_LOG "Image ", id, " relinquished.");
    return request;
}

void CachedImagesManager::ForgetDocument(const dom::Document& document) {
    Vector<uint32_t, MemoryTag::Resources> unused;
    Vector<uint32_t, MemoryTag::Resources> requests;
    {
        qsl::MutexLock lock(mutex_);
        for (auto& [id, image] : images_)
            if (image.holders.RemoveAllOf(document) && image.holders.IsEmpty()) unused.push_back(id);
        for (uint32_t id : unused) {
            const uint32_t request = Relinquish(id);
            if (request != kNone) requests.push_back(request);
        }
    }
    for (uint32_t request : requests)
        GetLoaderOf(const_cast<dom::Document&>(document)).AbortShared(request);
}

// --- Orphans

CachedImagesManager::CachedImage& CachedImagesManager::Resurrect(uint32_t id) {
    const OrphanedImages::Orphan orphan = orphans_.Take(id);
    CachedImage& image = images_[id];
    image.info = orphan.payload;
    image.state = ImageState::OnGPU;
    image.kind = ImageKind::Cached;
    image.url = orphan.url;
    return image;
}

bool CachedImagesManager::Orphan(uint32_t id, CachedImage& image) {
    if (uploads_.Cancel(id)) {
        LogTrace(IMAGE_LOG "Cached image ", id, " upload to GPU canceled.");
        return false;
    }
    if (image.state != ImageState::OnGPU || !image.info->HasResource()) {
        LogDebug(IMAGE_LOG "Tried to orphan image that is not uploaded to GPU with Id: ", id);
        return false;
    }
    LogTrace(IMAGE_LOG "Orphaning image ", id);
    PruneOrphans(limits_);
    const uint64_t bytes = BytesOf(*image.info);
    orphans_.Add(id, image.url, std::move(image.info), bytes);
    return true;
}

void CachedImagesManager::PruneOrphans(const CacheLimits& limits) {
    for (const OrphanedImages::Orphan& orphan : orphans_.TakeBeyond(limits)) {
        LogTrace(IMAGE_LOG "Pruned image ", orphan.url.GetText(), " from cache (GPU resource id is ",
                 orphan.payload->FirstResource());
        uploads_.Free(*orphan.payload);
        image_ids_by_url_.erase(MakeUrlKey(orphan.url));
    }
}

void CachedImagesManager::PruneAllOrphans() {
    qsl::MutexLock lock(mutex_);
    PruneOrphans(CacheLimits());
}

}  // namespace qorvex
