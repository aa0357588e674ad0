#include "resources/image_cache_stats.h"

#include "css/values/style_groups.h"
#include "dom/document.h"
#include "dom/style_sheet_list.h"
#include "resources/cached_images_manager.h"

namespace qorvex {

void SystemCacheStatsImpl::Images::Add(std::string_view url, uint32_t width, uint32_t height,
                                       uint32_t holders) {
    urls.emplace_back(url);
    entries.push_back({nullptr, width, height, holders});
    bytes += static_cast<uint64_t>(width) * height * 4;
}

void SystemCacheStatsImpl::Images::Finish() {
    for (uint32_t i = 0; i < entries.size(); ++i)
        entries[i].URL = urls[i].c_str();
}

void SystemCacheStatsImpl::AddLive(std::string_view url, uint32_t width, uint32_t height, uint32_t holders) {
    live_.Add(url, width, height, holders);
}

void SystemCacheStatsImpl::AddOrphan(std::string_view url, uint32_t width, uint32_t height) {
    orphaned_.Add(url, width, height, 0);
}

void SystemCacheStatsImpl::Finish() {
    live_.Finish();
    orphaned_.Finish();
    data_ = {live_.entries.size(), orphaned_.entries.size(), live_.bytes,
             orphaned_.bytes,      live_.entries.data(),     orphaned_.entries.data()};
}

void ImagesListImpl::Add(std::string_view url) {
    if (known_.insert(String(url)).second) urls_.emplace_back(url);
}

void CachedImagesManager::FillStats(SystemCacheStatsImpl& stats) {
    qsl::MutexLock lock(mutex_);
    for (const auto& [id, image] : images_) {
        const fresco::Image& size = image.info->description;
        stats.AddLive(image.url.GetText(), size.width, size.height, image.holders.CountUses());
    }
    for (const auto& [id, orphan] : orphans_.GetAll())
        stats.AddOrphan(orphan.url.GetText(), orphan.payload->description.width,
                        orphan.payload->description.height);
    stats.Finish();
}

ImagesList* CachedImagesManager::ListImages(const dom::Document& document, unsigned flags) {
    constexpr unsigned kHiddenToo = 1, kSheetsToo = 2;
    auto* list = New<ImagesListImpl, MemoryTag::General>();
    {
        qsl::MutexLock lock(mutex_);
        for (const auto& [id, image] : images_) {
            for (const auto& [key, holder] : image.holders.GetAll()) {
                const dom::Node* node = holder.document == &document ? holder.node.get() : nullptr;
                if (!node) continue;
                const bool hidden = node->GetLaidOutStyle().layout->display == css::CSSDisplay::None;
                if (hidden && !(flags & kHiddenToo)) continue;
                list->Add(image.url.GetText());
                break;
            }
        }
    }
    if (!(flags & kSheetsToo)) return list;
    dom::StyleSheetList& sheets = const_cast<dom::Document&>(document).GetStyleSheets();
    for (size_t i = 0; i < sheets.GetLength(); ++i)
        for (const css::CssString& url : sheets.GetEntry(i)->sheet->imageUrls)
            list->Add(url.view());
    return list;
}

bool CachedImagesManager::GiveUpRequest(uint32_t request_id, const dom::Document& document) {
    qsl::MutexLock lock(mutex_);
    for (PendingRequest& pending : pending_requests_) {
        if (pending.request_id != request_id) continue;
        CachedImage* image = images_.get(pending.image_id);
        if (image->holders.HasOthersThan(document)) return false;
        image->given_up = true;
        pending_requests_.erase(&pending);
        return true;
    }
    return true;
}

size_t CachedImagesManager::GetRequestsInFlight() {
    qsl::MutexLock lock(mutex_);
    return pending_requests_.size();
}

}  // namespace qorvex
