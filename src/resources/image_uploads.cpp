#include "resources/image_uploads.h"

#include "core/logging/log.h"

namespace qorvex {

namespace {

void RecordUpload(fresco::CommandBuffer& buffer, const PendingImageUpload& upload) {
    const dom::ImageInfo& info = *upload.info;
    const auto create = [&](fresco::ImageId name, const fresco::Image& image, const char* debug_name) {
        buffer.CreateImage(name, image);
        buffer.SetImageDebugName(name, debug_name);
    };
    if (upload.user_image.pixels) return create(info.resource, upload.user_image, "PreloadedImage");
    if (!info.IsAnimated()) return create(info.resource, upload.pixels.DescribeFrame(0), "LoadedImage");
    for (uint32_t i = 0; i < info.frames.size(); ++i)
        create(info.frames[i].resource, upload.pixels.DescribeFrame(i), "LoadedImage");
}

}  // namespace

ImageUploads::~ImageUploads() {
    for (auto& record : in_flight_)
        record->buffer->Release();
}

void ImageUploads::Add(PendingImageUpload upload) {
    qsl::MutexLock lock(upload_mutex_);
    pending_.push_back(std::move(upload));
}

bool ImageUploads::Cancel(uint32_t image_id) {
    PendingImageUpload canceled;  // its pixels go after the lock
    qsl::MutexLock lock(upload_mutex_);
    for (PendingImageUpload& upload : pending_) {
        if (upload.image_id != image_id || upload.user_image.pixels) continue;
        canceled = std::move(upload);
        pending_.erase(&upload);
        lock.Unlock();
        return true;
    }
    return false;
}

void ImageUploads::Free(const dom::ImageInfo& info) {
    qsl::MutexLock lock(free_mutex_);
    if (info.resource != dom::kNoImageResource) pending_frees_.push_back(info.resource);
    for (const dom::ImageFrame& frame : info.frames)
        pending_frees_.push_back(frame.resource);
}

ImageUploads::Uploaded ImageUploads::Process(fresco::IScene& scene) {
    // Held until the buffer has run: another view's frame that draws one of these must not overtake it.
    qsl::MutexLock render_lock(render_mutex_);
    auto record = MakeUnique<InFlight, MemoryTag::Rendering>();
    InFlight& submitted = *record;
    {
        qsl::MutexLock lock(upload_mutex_);
        if (pending_.empty()) return {};
        submitted.uploads = std::move(pending_);
        pending_.clear();
    }
    submitted.buffer = fresco::Library::CreateBuffer(0, 0);
    Uploaded uploaded;
    for (const PendingImageUpload& upload : submitted.uploads) {
        RecordUpload(*submitted.buffer, upload);
        if (upload.image_id != PendingImageUpload::kNoImageId)
            uploaded.push_back({upload.image_id, upload.info});
    }
    {
        qsl::MutexLock lock(upload_mutex_);
        in_flight_.push_back(std::move(record));
    }
    scene.ExecuteBuffers(&submitted.buffer, 1, this, &submitted);
    return uploaded;
}

void ImageUploads::OnBuffersConsumed(void* user_data) {
    UniquePtr<InFlight, MemoryTag::Rendering> done;  // frees the decoded frames, after the lock
    qsl::MutexLock lock(upload_mutex_);
    for (auto& record : in_flight_) {
        if (record.get() != user_data) continue;
        done = std::move(record);
        in_flight_.erase(&record);
        break;
    }
    lock.Unlock();
    if (done) done->buffer->Release();
}

void ImageUploads::ReleasePending(fresco::IScene& scene) {
    const auto names = TakePendingFrees();
    if (names.empty()) return;
    fresco::CommandBuffer* buffer = fresco::Library::CreateBuffer(0, 0);
    for (fresco::ImageId name : names) {
        LogTrace("CachedImagesManager: Freeing GPU resource with id ", name);
        buffer->DestroyImage(name);
    }
    scene.ExecuteBuffers(&buffer, 1, nullptr, nullptr);
    buffer->Release();
}

void ImageUploads::Forget() {
    TakePendingFrees();
    Uploads dropped;
    qsl::MutexLock lock(upload_mutex_);
    dropped = std::move(pending_);
    pending_.clear();
    lock.Unlock();
}

Vector<fresco::ImageId, MemoryTag::Rendering> ImageUploads::TakePendingFrees() {
    qsl::MutexLock lock(free_mutex_);
    auto names = std::move(pending_frees_);
    pending_frees_.clear();
    return names;
}

}  // namespace qorvex
