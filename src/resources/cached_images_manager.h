// Every raster image of a system, once, however many nodes of however many views show it: asked for by URL,
// decoded on the resource channel, uploaded with the next painted frame. An image that nothing shows any more
// is orphaned: it stays with the rendering library and comes back for free, until limits are passed.
//
// Threads: nodes register, unregister and are told on the main thread; answers come on any thread; decoding
// runs on resource threads; uploads on the render thread. A node is held weakly and told by a task of its
// view. Lock order: `mutex_`, then those of ImageUploads. Neither a node nor the client is called with a lock
// held.
#pragma once

#include <qorvex/cache_stats.h>
#include <qorvex/images_list.h>
#include <qorvex/system.h>

#include "dom/image_loading.h"
#include "resources/image_uploads.h"
#include "resources/node_holders.h"
#include "resources/orphan_table.h"
#include "resources/resource_context.h"
#include "resources/url_key.h"

namespace fresco {
class IRenderingLibrary;
}

namespace qorvex {

class DocumentLoader;

enum class ImageKind : uint8_t {
    Unknown = 0,
    Cached = 1,  // loaded from a URL
    User = 2,    // the client's own, from RecieveUserImage
};

class CachedImagesManager final : public dom::IImageLoader,
                                  public AtomicRefCounted<CachedImagesManager, MemoryTag::Resources> {
  public:
    CachedImagesManager(TaskFamilyHandle family, RefPtr<ResourceContext> context,
                        fresco::IRenderingLibrary& rendering, const CacheLimits& limits);
    ~CachedImagesManager() override;

    // The system goes: nothing is asked for any more, and what answers late finds nothing.
    void Close();

    // --- dom::IImageLoader. Main thread.
    void RegisterImage(const URL& url, dom::Node& node, uint32_t* id) override;
    void UnregisterImage(uint32_t id, const dom::Node& node) override;
    void ForgetDocument(const dom::Document& document) override;

    // --- Main thread
    // Drops all orphans, whatever the limits.
    void PruneAllOrphans();
    // Everything is loaded again, if the rendering resources have been lost since the last time.
    void ReloadAll();
    void UserImagesChanged(const unsigned* ids, unsigned count);
    void FillStats(class SystemCacheStatsImpl& stats);
    // See View::GetImagesList.
    ImagesList* ListImages(const dom::Document& document, unsigned flags);
    // The document gives this request up: false when nodes of others wait for its image too.
    bool GiveUpRequest(uint32_t request_id, const dom::Document& document);
    size_t GetRequestsInFlight();

    // --- Render thread
    void ProcessUploads(fresco::IScene& scene);
    void ReleasePendingGPUResources(fresco::IScene& scene) { uploads_.ReleasePending(scene); }
    void ForgetGPUResources();

  private:
    struct CachedImage {
        NodeHolders holders;
        dom::ImageInfoPtr info;
        dom::ImageState state = dom::ImageState::Loading;
        ImageKind kind = ImageKind::Unknown;
        uint32_t user_image_id = 0;
        // Its request was given up while somebody held it: the next who asks starts anew.
        bool given_up = false;
        URL url;
    };
    using OrphanedImages = OrphanTable<dom::ImageInfoPtr>;
    static constexpr uint32_t kNone = 0xFFFFFFFF;

    // --- cached_images_manager.cpp: uses and orphans
    CachedImage& Resurrect(uint32_t id) QSL_REQUIRES(mutex_);
    void Replay(dom::Node& node, uint32_t id, const dom::ImageInfoPtr& info, dom::ImageState state);
    // The last holder has gone. Gives the request to abort, or kNone.
    uint32_t Relinquish(uint32_t id) QSL_REQUIRES(mutex_);
    // False when it is not kept.
    bool Orphan(uint32_t id, CachedImage& image) QSL_REQUIRES(mutex_);
    void PruneOrphans(const CacheLimits& limits) QSL_REQUIRES(mutex_);

    // --- image_loading.cpp: from the request to the rendering library
    void StartLoad(uint32_t id, const URL& url, DocumentLoader& loader);
    void OnResponse(uint32_t id, ResourceRequestJob& job);
    void Decode(uint32_t id, std::span<const uint8_t> bytes);
    void TakeUserImage(uint32_t id, const UserImageData& user);
    void ScheduleUpload(PendingImageUpload upload, ImageKind kind);
    void UpdateCachedImageState(uint32_t id, dom::ImageInfoPtr info, dom::ImageState state)
        QSL_EXCLUDES(mutex_);
    bool IsHolder(uint32_t id, const dom::Node& node, uint32_t serial) QSL_EXCLUDES(mutex_);

    const TaskFamilyHandle family_;
    const RefPtr<ResourceContext> context_;
    fresco::IRenderingLibrary& rendering_;
    const CacheLimits limits_;
    const dom::ImageInfoPtr no_info_;
    ImageUploads uploads_;
    std::atomic<bool> lost_resources_{false};

    qsl::Mutex mutex_;
    uint32_t next_image_id_ QSL_GUARDED_BY(mutex_) = 0;
    uint32_t next_holder_ QSL_GUARDED_BY(mutex_) = 0;
    HashMap<UrlKey, uint32_t, MemoryTag::Resources> image_ids_by_url_ QSL_GUARDED_BY(mutex_);
    HashMap<uint32_t, CachedImage, MemoryTag::Resources> images_ QSL_GUARDED_BY(mutex_);
    OrphanedImages orphans_ QSL_GUARDED_BY(mutex_);
    // The client's id to the image's.
    HashMap<uint32_t, uint32_t, MemoryTag::Resources> user_image_ids_ QSL_GUARDED_BY(mutex_);
    // Request and image ids of what is in flight.
    struct PendingRequest {
        uint32_t request_id;
        uint32_t image_id;
    };
    Vector<PendingRequest, MemoryTag::Resources> pending_requests_ QSL_GUARDED_BY(mutex_);
};

}  // namespace qorvex
