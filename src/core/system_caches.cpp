// Caches of a system as the client manages them.
#include "core/api_call.h"
#include "core/logging/log.h"
#include "core/system_impl.h"
#include "resources/image_cache_stats.h"

namespace qorvex {

namespace {

enum class Need { Valid, ValidAndAbsolute };

// The URL of a cache operation; empty, with an Error line, when it will not do.
URL ParseCacheURL(const char* text, Need need, const char* error) {
    URL url;
    url.Parse(text ? text : "");
    if (!url.IsEmpty() && (need == Need::Valid || !url.IsRelative())) return url;
    LogError(error, text ? text : "");
    return URL();
}

}  // namespace

void SystemImpl::PreloadAndCacheHTML(const char* url) {
    const MainThreadCall call("System");
    if (!call) return;
    const URL parsed =
        ParseCacheURL(url, Need::ValidAndAbsolute, "PreloadAndCacheHTML expects a valid and absolute URL: ");
    if (!parsed.IsEmpty()) html_cache_.Preload(parsed);
}

bool SystemImpl::RemoveHTMLCacheEntry(const char* url) {
    const MainThreadCall call("System");
    if (!call) return false;
    const URL parsed =
        ParseCacheURL(url, Need::ValidAndAbsolute, "RemoveHTMLCacheEntry expects a valid and absolute URL: ");
    return !parsed.IsEmpty() && html_cache_.Remove(parsed);
}

void SystemImpl::ClearHTMLCache() {
    const MainThreadCall call("System");
    if (!call) return;
    html_cache_.Clear();
}

void SystemImpl::PreloadAndCacheStylesheet(const char* url) {
    const MainThreadCall call("System");
    if (!call) return;
    const URL parsed =
        ParseCacheURL(url, Need::Valid, "PreloadAndCacheStylesheet invoked with invalid URL: ");
    if (!parsed.IsEmpty()) stylesheet_cache_.Load(parsed);
}

bool SystemImpl::RemoveStylesheetCacheEntry(const char* url) {
    const MainThreadCall call("System");
    if (!call) return false;
    URL parsed;
    parsed.Parse(url ? url : "");
    return !parsed.IsEmpty() && stylesheet_cache_.Remove(parsed);
}

void SystemImpl::ClearStylesheetCache() {
    const MainThreadCall call("System");
    if (!call) return;
    stylesheet_cache_.Clear();
}

SystemCacheStats* SystemImpl::CreateCacheStats() {
    const MainThreadCall call("System");
    if (!call) return nullptr;
    auto* stats = New<SystemCacheStatsImpl, MemoryTag::General>();
    images_->FillStats(*stats);
    return stats;
}

void SystemImpl::PruneOrphanedResources() {
    const MainThreadCall call("System");
    if (!call) return;
    LogDebug("Force prunning all orphaned images.");
    images_->PruneAllOrphans();
    LogDebug("Force prunning all orphaned svgs.");
    svgs_->PruneAllOrphans();
}

void SystemImpl::UserImagesChanged(const unsigned* ids, unsigned count) {
    const MainThreadCall call("System");
    if (!call) return;
    images_->UserImagesChanged(ids, ids ? count : 0);
}

}  // namespace qorvex
