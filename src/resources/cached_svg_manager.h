// The twin of CachedImagesManager for vector images: one parsed SVG for all nodes of a system that show it.
// An orphan is only kept in memory; there is nothing to upload and nothing to lose with the rendering
// resources but what nodes made of it.
//
// In this build no SVG can be parsed: every load fails, and the first one says so in the log.
//
// Threads as in CachedImagesManager: nodes on the main thread, answers on any, BuildSVGTask on a resource
// thread. Neither a node nor the client is called with the lock held.
#pragma once

#include <qorvex/system.h>

#include "dom/image_loading.h"
#include "qsl/mutex.h"
#include "resources/node_holders.h"
#include "resources/orphan_table.h"
#include "resources/resource_context.h"
#include "resources/url_key.h"

namespace qorvex {

class CachedSVGManager final : public dom::ISVGLoader,
                               public AtomicRefCounted<CachedSVGManager, MemoryTag::Resources> {
  public:
    CachedSVGManager(TaskFamilyHandle family, RefPtr<ResourceContext> context, const CacheLimits& limits)
        : family_(family), context_(std::move(context)), limits_(limits) {}
    ~CachedSVGManager() override = default;

    // --- dom::ISVGLoader. Main thread.
    void RegisterSVG(const URL& url, dom::Node& node, uint32_t* id) override;
    void UnregisterSVG(uint32_t id, const dom::Node& node) override;
    void ForgetDocument(const dom::Document& document) override;

    // --- Main thread
    void Close();
    void PruneAllOrphans();
    // All of them are asked for again.
    void ReloadAll();

  private:
    enum class State : uint8_t { Loading = 1, Loaded = 2, Failed = 3 };
    struct CachedSVG {
        NodeHolders holders;
        dom::SVGImagePtr svg;
        State state = State::Loading;
        uint32_t request = kNone;
        bool answered = false;
        URL url;
    };
    static constexpr uint32_t kNone = 0xFFFFFFFF;

    void StartLoad(uint32_t id, const URL& url, dom::Document& document) QSL_EXCLUDES(mutex_);
    // Resource thread.
    void Build(uint32_t id, std::span<const uint8_t> bytes);
    void Finish(uint32_t id, dom::SVGImagePtr svg) QSL_EXCLUDES(mutex_);
    bool IsHolder(uint32_t id, const dom::Node& node, uint32_t serial) QSL_EXCLUDES(mutex_);
    // The last holder has gone. Gives the request to abort, or kNone.
    uint32_t Relinquish(uint32_t id) QSL_REQUIRES(mutex_);
    void PruneOrphans(const CacheLimits& limits) QSL_REQUIRES(mutex_);

    const TaskFamilyHandle family_;
    const RefPtr<ResourceContext> context_;
    const CacheLimits limits_;
    std::atomic<bool> reported_{false};

    qsl::Mutex mutex_;
    uint32_t next_id_ QSL_GUARDED_BY(mutex_) = 0;
    uint32_t next_holder_ QSL_GUARDED_BY(mutex_) = 0;
    HashMap<UrlKey, uint32_t, MemoryTag::Resources> ids_by_url_ QSL_GUARDED_BY(mutex_);
    HashMap<uint32_t, CachedSVG, MemoryTag::Resources> svgs_ QSL_GUARDED_BY(mutex_);
    OrphanTable<dom::SVGImagePtr> orphans_ QSL_GUARDED_BY(mutex_);
};

}  // namespace qorvex
