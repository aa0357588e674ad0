// Between decoding and the rendering library: images that wait for the next painted frame, and names that
// wait to be released.
//
// Threads: lists are filled from any thread; Process, ReleasePending and what they call belong to the render
// thread of some view. Lock order: the render mutex, then the upload mutex; neither is held while a caller's
// lock is taken.
#pragma once

#include <fresco/scene.h>

#include "dom/image_loading.h"
#include "qsl/mutex.h"
#include "resources/decoded_image.h"

namespace qorvex {

struct PendingImageUpload {
    static constexpr uint32_t kNoImageId = 0xFFFFFFFF;  // of an image that is in no table

    uint32_t image_id = kNoImageId;
    dom::ImageInfoPtr info;
    DecodedImage pixels;
    // Of a client's own image, in place of pixels; its `pixels` is the client's object.
    fresco::Image user_image;
};

class ImageUploads final : private fresco::IBufferListener {
  public:
    using Uploads = Vector<PendingImageUpload, MemoryTag::Rendering>;

    ImageUploads() = default;
    ~ImageUploads();
    ImageUploads(const ImageUploads&) = delete;
    ImageUploads& operator=(const ImageUploads&) = delete;

    void Add(PendingImageUpload upload) QSL_EXCLUDES(upload_mutex_);
    // True when the image was still waiting: it never reaches the rendering library.
    bool Cancel(uint32_t image_id) QSL_EXCLUDES(upload_mutex_);
    void Free(const dom::ImageInfo& info) QSL_EXCLUDES(free_mutex_);

    // Makes in the rendering library what waits, ahead of the frame that is about to run, and gives
    // (id, info) of each image that is there now.
    using Uploaded = Vector<std::pair<uint32_t, dom::ImageInfoPtr>, MemoryTag::Rendering>;
    Uploaded Process(fresco::IScene& scene) QSL_EXCLUDES(render_mutex_, upload_mutex_);
    void ReleasePending(fresco::IScene& scene) QSL_EXCLUDES(free_mutex_);
    // The rendering library has lost its objects: nothing is to be uploaded or released any more.
    void Forget() QSL_EXCLUDES(upload_mutex_, free_mutex_);
    // What Free has been told and no render thread has taken.
    Vector<fresco::ImageId, MemoryTag::Rendering> TakePendingFrees() QSL_EXCLUDES(free_mutex_);

  private:
    // Submitted and not yet confirmed.
    struct InFlight {
        fresco::CommandBuffer* buffer = nullptr;
        Uploads uploads;
    };
    void OnBuffersConsumed(void* user_data) override;

    qsl::Mutex render_mutex_;
    Vector<UniquePtr<InFlight, MemoryTag::Rendering>, MemoryTag::Rendering> in_flight_
        QSL_GUARDED_BY(upload_mutex_);
    qsl::Mutex upload_mutex_;
    Uploads pending_ QSL_GUARDED_BY(upload_mutex_);
    qsl::Mutex free_mutex_;
    Vector<fresco::ImageId, MemoryTag::Rendering> pending_frees_ QSL_GUARDED_BY(free_mutex_);
};

}  // namespace qorvex
