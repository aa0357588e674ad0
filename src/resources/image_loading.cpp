// The way of an image: request, response, decoding, upload, and the news about it.
#include <fresco/library.h>

#include "core/logging/log.h"
#include "dom/document.h"
#include "resources/cached_images_manager.h"
#include "resources/document_loader.h"
#include "resources/reload.h"

#define IMAGE_LOG "CachedImagesManager: "

namespace qorvex {

using dom::ImageInfo;
using dom::ImageState;

namespace {

// The delay of a frame in a file is in hundredths of a second; files that ask for none, or for less than
// screens can show, mean a tenth of a second (as browsers read them).
double FrameDuration(uint32_t delay) {
    return 10.0 * (delay < 2 ? 10 : delay);
}

RefPtr<ImageInfo> Describe(const DecodedImage& pixels) {
    auto info = MakeRef<ImageInfo>();
    info->description = pixels.GetDescription();
    const auto& frames = pixels.GetFrames();
    if (frames.size() == 1) {
        info->resource = fresco::Library::GetImageName();
        return info;
    }
    for (const DecodedImage::Frame& frame : frames)
        info->frames.push_back({fresco::Library::GetImageName(), FrameDuration(frame.delay)});
    return info;
}

}  // namespace

// --- Request

void CachedImagesManager::StartLoad(uint32_t id, const URL& url, DocumentLoader& loader) {
    if (url.IsBlob()) {
        AssertFailure("Unable to create image from blob because blob registry is null!");
        return;
    }
    LogTrace(IMAGE_LOG "Scheduling resource request for image ", id);
    {
        qsl::MutexLock lock(mutex_);
        pending_requests_.push_back({kNone, id});
    }
    uint32_t request = 0;
    RefPtr<CachedImagesManager> self(this);
    TaskPtr task = loader.Load(
        DescribeGet(url), [self, id](ResourceRequestJob& job) { self->OnResponse(id, job); }, {}, true,
        &request);
    {
        qsl::MutexLock lock(mutex_);
        // The answer may have come already.
        for (PendingRequest& pending : pending_requests_)
            if (pending.image_id == id) pending.request_id = request;
    }
    family_.Push(TaskChannels::Resources, std::move(task));
}

// --- Response. Any thread.

void CachedImagesManager::OnResponse(uint32_t id, ResourceRequestJob& job) {
    UpdateCachedImageState(id, no_info_, ImageState::Decoding);
    {
        qsl::MutexLock lock(mutex_);
        pending_requests_.erase_if([id](const PendingRequest& pending) { return pending.image_id == id; });
    }
    if (job.GetPayloadKind() == ResourceRequestJob::PayloadKind::UserImage && job.Succeeded())
        return TakeUserImage(id, job.GetUserImage());
    RefPtr<CachedImagesManager> self(this);
    family_.Push(TaskChannels::Resources,
                 MakeTask("DecodeImageTask", [self, id, held = ResourceJobPtr(&job)](TaskFamilyHandle) {
                     LogTrace(IMAGE_LOG "Resource response received for image ", id);
                     // An error page is no image.
                     self->Decode(id, held->Succeeded() ? held->GetData() : std::span<const uint8_t>());
                 }));
}

void CachedImagesManager::Decode(uint32_t id, std::span<const uint8_t> bytes) {
    if (bytes.empty()) {
        LogTrace(IMAGE_LOG "Bad response data for image ", id);
        return UpdateCachedImageState(id, no_info_, ImageState::LoadFailed);
    }
    LogTrace(IMAGE_LOG "Decoding image ", id);
    PendingImageUpload upload;
    upload.image_id = id;
    upload.pixels = DecodedImage::Decode(bytes);
    if (upload.pixels.GetFrames().empty()) {
        LogTrace(IMAGE_LOG "Decode error for image ", id);
        return UpdateCachedImageState(id, no_info_, ImageState::DecodeFailed);
    }
    const dom::ImageInfoPtr info = upload.info = Describe(upload.pixels);
    ScheduleUpload(std::move(upload), ImageKind::Cached);
    UpdateCachedImageState(id, info, ImageState::Decoded);
}

void CachedImagesManager::TakeUserImage(uint32_t id, const UserImageData& user) {
    LogTrace(IMAGE_LOG "User image response received for image ", id);
    auto info = MakeRef<ImageInfo>();
    fresco::Image& description = info->description;
    description.width = user.Width;
    description.height = user.Height;
    description.format = static_cast<fresco::PixelFormat>(user.Format);
    if (!user.PlainPixels) description.flags |= fresco::kImageUserObject;
    if (!user.TopDown) description.flags |= fresco::kImageFlippedVertically;
    info->content = {static_cast<float>(user.ContentRect[0]), static_cast<float>(user.ContentRect[1]), 0,
                     static_cast<float>(user.ContentRect[2]), static_cast<float>(user.ContentRect[3])};
    if (!user.Texture || user.Width == 0 || user.Height == 0) {
        LogTrace(IMAGE_LOG "Bad response data for image ", id);
        return UpdateCachedImageState(id, no_info_, ImageState::LoadFailed);
    }
    {
        qsl::MutexLock lock(mutex_);
        if (CachedImage* image = images_.get(id); image && user.UserImageId != 0) {
            image->user_image_id = user.UserImageId;
            user_image_ids_.insert_or_assign(user.UserImageId, id);
        }
    }
    info->resource = fresco::Library::GetImageName();
    PendingImageUpload upload;
    upload.image_id = id;
    upload.info = info;
    upload.user_image = description;
    upload.user_image.pixels = user.Texture;
    ScheduleUpload(std::move(upload), ImageKind::User);
    UpdateCachedImageState(id, info, ImageState::Decoded);
}

// --- Upload

void CachedImagesManager::ScheduleUpload(PendingImageUpload upload, ImageKind kind) {
    const uint32_t id = upload.image_id;
    qsl::MutexLock lock(mutex_);
    if (CachedImage* image = images_.get(id)) {
        if (kind == ImageKind::User) {
            LogTrace(IMAGE_LOG "Marking image ", id, " as user image and scheduling its upload to GPU.");
        } else {
            LogTrace(IMAGE_LOG "Marking image ", id, " as cached and scheduling upload to GPU.");
        }
        image->kind = kind;
        uploads_.Add(std::move(upload));
        return;
    }
    lock.Unlock();
    // The pixels go with the record.
    if (kind == ImageKind::User) {
        LogTrace(IMAGE_LOG "Image ", id, " is no longer alive, dropping user image info.");
    } else {
        LogTrace(IMAGE_LOG "Freeing decoded data as image ", id, " is no longer alive.");
    }
}

void CachedImagesManager::ProcessUploads(fresco::IScene& scene) {
    for (auto& [id, info] : uploads_.Process(scene))
        UpdateCachedImageState(id, info, ImageState::OnGPU);
}

void CachedImagesManager::ForgetGPUResources() {
    uploads_.Forget();
    lost_resources_.store(true, std::memory_order_release);
}

void CachedImagesManager::ReloadAll() {
    if (!lost_resources_.exchange(false, std::memory_order_acq_rel)) return;
    LogDebug(IMAGE_LOG "Force reloading all image resources.");
    Reloads reloads;
    {
        qsl::MutexLock lock(mutex_);
        uploads_.Forget();
        for (const auto& [id, orphan] : orphans_.GetAll())
            image_ids_by_url_.erase(MakeUrlKey(orphan.url));
        orphans_.Clear();
        reloads = CollectReloads(images_, [&](CachedImage& image) {
            // What is on its way goes on: it has nothing to lose yet.
            if (image.state < ImageState::Decoded) return false;
            image.state = ImageState::Loading;
            image.kind = ImageKind::Unknown;
            image.info = no_info_;
            return true;
        });
    }
    StartReloads(reloads, [this](uint32_t id, const URL& url, dom::Document& document) {
        StartLoad(id, url, GetLoaderOf(document));
    });
}

// --- News

void CachedImagesManager::UpdateCachedImageState(uint32_t id, dom::ImageInfoPtr info, ImageState state) {
    qsl::MutexLock lock(mutex_);
    CachedImage* image = images_.get(id);
    // Loaded again meanwhile: what was uploaded is not what the image will be.
    const bool outdated = image && state == ImageState::OnGPU && image->info != info;
    if (!image || outdated) {
        if (state != ImageState::OnGPU) return;
        LogTrace(
            IMAGE_LOG "Image ", id,
            " has just been uploaded to the GPU, but it is no longer alive. Scheduling to be freed with GPU "
            "resource id ",
            info->FirstResource());
        uploads_.Free(*info);
        return;
    }
    image->info = info;
    image->state = state;
    if (state == ImageState::OnGPU)
        LogTrace(IMAGE_LOG, image->kind == ImageKind::User ? "User image " : "Cached image ", id,
                 " now on GPU with resource id ", info->FirstResource());
    for (const auto& [key, holder] : image->holders.GetAll()) {
        RefPtr<CachedImagesManager> self(this);
        holder.family.Push(TaskChannels::Main, MakeTask("UpdateCachedImageState",
                                                        [self, node = holder.node, serial = holder.serial, id,
                                                         info, state](TaskFamilyHandle) {
                                                            dom::Node* alive = node.get();
                                                            if (alive && self->IsHolder(id, *alive, serial))
                                                                alive->OnImageLoaded(id, info, state);
                                                        }));
    }
}

bool CachedImagesManager::IsHolder(uint32_t id, const dom::Node& node, uint32_t serial) {
    qsl::MutexLock lock(mutex_);
    const CachedImage* image = images_.get(id);
    return image && image->holders.Holds(node, serial);
}

void CachedImagesManager::UserImagesChanged(const unsigned* ids, unsigned count) {
    Vector<script::WeakHandle<dom::Node>, MemoryTag::Resources> nodes;
    for (unsigned i = 0; i < count; ++i) {
        if (ids[i] == 0) {
            LogWarning("Trying to update image with ID - 0 (index in provided list ", i, " out of ", count,
                       "). Skipped.");
            continue;
        }
        qsl::MutexLock lock(mutex_);
        const uint32_t* id = user_image_ids_.get(ids[i]);
        const CachedImage* image = id ? images_.get(*id) : nullptr;
        if (!image) {
            LogWarning("Trying to update image with ID ", ids[i], ". Skipped.");
            continue;
        }
        for (const auto& [key, holder] : image->holders.GetAll())
            nodes.push_back(holder.node);
    }
    for (const auto& weak : nodes) {
        dom::Node* node = weak.get();
        if (node && node->GetLayoutHandle()) node->GetDocument()->QueueImageChange(*node);
    }
}

}  // namespace qorvex
