// How one document gets its scripts, sheets, images and whatever else: it asks the client, keeps count of
// what is still missing, holds the building of the tree up while something blocking is on its way, and
// fetches ahead what the builder has seen.
//
// Invariants: main thread only; everything that comes from the client's thread is posted to the view's
// channels with a weak reference to the document. Each id is in exactly one of the tables that wait for it,
// and leaves it when its answer is delivered.
#pragma once

#include "core/memory/containers.h"
#include "core/tasks/task_system.h"
#include "dom/document.h"
#include "dom/resource_loader.h"
#include "resources/stylesheet_cache.h"

namespace qorvex {

// What the loader asks of the view.
class ILoaderHost {
  public:
    virtual ~ILoaderHost() = default;
    virtual TaskFamilyHandle GetLoaderFamily() = 0;
    // False: the client refuses the request.
    virtual bool IsRequestAllowed(const URL& url) = 0;
    // The document gives this request up. False when another document waits for its answer too; the request
    // then goes on.
    virtual bool GiveUpRequest(uint32_t, const dom::Document&) { return true; }
};

class DocumentLoader final : public dom::IDocumentLoader {
  public:
    DocumentLoader(ILoaderHost& host, ResourceContext& context, StylesheetCache& stylesheets);
    ~DocumentLoader() override;

    // The document that owns this loader; right after both exist.
    void SetDocument(dom::Document& document);

    // For images, XMLHttpRequest, SVG and media. The callbacks may run on any thread. The task is for the
    // caller to push to the resource channel.
    TaskPtr Load(ResourceRequestDescription description, ResourceJobCallback on_finished,
                 ResourceJobCallback on_progress, bool binary, uint32_t* id);
    void Abort(uint32_t id);
    // The same for a request that another document may have made.
    void AbortShared(uint32_t id) { request_ids_.contains(id) ? Abort(id) : context_.Abort(id); }

    // --- dom::IDocumentLoader
    uint32_t LoadResource(const URL& url, dom::Element& element, bool deferred) override;
    uint32_t LoadAndParseStylesheet(const URL& url, dom::Element& element, bool deferred) override;
    uint32_t ParseStylesheetText(std::string_view text, dom::Element& element) override;
    void RequestPrefetch(const URL& url) override;
    void RequestStylesheetPrefetch(const URL& url) override;
    bool HasPendingWork() const override;
    void StopLoading() override;

    // --- Ends of the tasks that carry answers
    void ResolveJob(uint32_t id, ResourceJobPtr job);
    void DeliverStylesheet(uint32_t id, const RefPtr<css::Stylesheet>& sheet);
    void CompleteTrackedRequest(uint32_t id);

  private:
    // Who waits for an answer. The element is weak, so that a removed one can die meanwhile; the one that the
    // building waits for is held, or nobody could resume it.
    struct Waiter {
        script::WeakHandle<dom::Element> element;
        RefPtr<dom::Element> blocker;
    };
    struct Prefetch {
        uint32_t id = 0;
        ResourceJobPtr job;
    };

    Waiter MakeWaiter(dom::Element& element, bool deferred);
    URL Resolve(const URL& url) const;
    bool IsAllowed(const URL& url);
    // Building may go on if it was this waiter that held it up.
    void Resume(Waiter& waiter);
    uint32_t MakeTrackedRequest(const URL& url);
    void AdoptPrefetch(uint32_t id, ResourceJobPtr finished);
    void DrainResourceEvents();
    void LoadStylesheetBytes(const URL& url);
    void ParseStylesheetJob(const UrlKey& url, ResourceJobPtr job);
    // Gives the sheet to every stylesheet id that waits for the URL.
    void DeliverLoadedStylesheet(const UrlKey& url, uint32_t request_id,
                                 const RefPtr<css::Stylesheet>& sheet);
    script::WeakHandle<dom::Document> GetWeakDocument() const;

    ILoaderHost& host_;
    ResourceContext& context_;
    StylesheetCache& stylesheet_cache_;
    dom::Document* document_ = nullptr;
    HashMap<uint32_t, Waiter, MemoryTag::Resources> active_loads_;
    HashMap<uint32_t, Waiter, MemoryTag::Resources> active_stylesheets_;
    // Sheets that this document loads itself, with the stylesheet ids that wait for each.
    HashMap<UrlKey, Vector<uint32_t, MemoryTag::Resources>, MemoryTag::Resources> loading_stylesheets_;
    HashSet<uint32_t, MemoryTag::Resources> request_ids_;
    // The client was told to give up, and may still answer.
    HashSet<uint32_t, MemoryTag::Resources> aborted_ids_;
    HashMap<UrlKey, Prefetch, MemoryTag::Resources> prefetched_;
    // Of those that are still on their way.
    HashMap<uint32_t, UrlKey, MemoryTag::Resources> prefetch_keys_;
    // Prefetches that turned out to be sheets while their bytes were still on the way.
    HashMap<uint32_t, UrlKey, MemoryTag::Resources> prefetched_stylesheets_;
    uint32_t next_stylesheet_id_ = 0;
    uint32_t drain_depth_ = 0;
    bool stopping_ = false;  // inside StopLoading
    bool stopped_ = false;   // late answers may find nobody
};

// The loader of a document of this engine.
DocumentLoader& GetLoaderOf(dom::Document& document);

}  // namespace qorvex
