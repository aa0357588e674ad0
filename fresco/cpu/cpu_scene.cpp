#include "fresco/cpu/cpu_scene.h"

#include "fresco/commands/capture.h"
#include "fresco/core/log.h"
#include "fresco/cpu/bands.h"

namespace fresco::cpu {
namespace {

constexpr size_t kGlyphCacheBytes = size_t(16) << 20;
// Below this a frame is done before a helper wakes up.
constexpr int64_t kMinBandedPixels = 1 << 17;
// Every band walks the whole stream, and a few of them for each thread even out what they hold.
constexpr int kMinBandHeight = 32;
constexpr uint32_t kBandsAThread = 4;
constexpr uint32_t kMaxHelpers = 15;
constexpr size_t kCaptureAlignment = 16;

}  // namespace

void CpuScene::SetRenderTarget(void* color, void*, const RenderTargetDescription& description) {
    Bitmap bitmap;
    const auto* target = static_cast<const CpuRenderTarget*>(color);
    if (target && target->pixels && target->width && target->height) {
        const bool valid = target->width <= kMaxImageSide && target->height <= kMaxImageSide &&
                           target->rowPitch >= target->width * 4 && target->rowPitch % 4 == 0 &&
                           reinterpret_cast<uintptr_t>(target->pixels) % 4 == 0;
        if (valid) {
            // The description may show less of the surface than there is.
            const uint32_t width =
                description.color.width ? std::min(description.color.width, target->width) : target->width;
            const uint32_t height = description.color.height
                                        ? std::min(description.color.height, target->height)
                                        : target->height;
            bitmap = {
                static_cast<uint8_t*>(target->pixels), target->rowPitch, {0, 0, int(width), int(height)}};
        } else {
            FRESCO_WARN("Refusing a render target of %u x %u pixels with a pitch of %u bytes", target->width,
                        target->height, target->rowPitch);
        }
    }
    backend_.SetRenderTarget(bitmap);
}

void CpuScene::ExecuteAll(CommandBuffer* const* buffers, uint32_t count) {
    shared_.resources.BeginFrame();
    backend_.SetBand(backend_.GetRenderTarget().bounds);
    for (uint32_t i = 0; i < count; ++i) {
        if (buffers[i]) backend_.Execute(BufferSource(*buffers[i]));
    }
}

void CpuScene::ExecuteFrontEnd(CommandBuffer* const* buffers, uint32_t count) {
    ExecuteAll(buffers, count);
}

// False when the frame is not worth it or must be painted in one go.
bool CpuScene::PaintInBands(CommandBuffer* const* buffers, uint32_t count) {
    const uint32_t helping = shared_.helpers ? std::min(shared_.helpers->GetCount(), kMaxHelpers) : 0;
    IRect area;
    if (helping == 0 || !CanPaintInBands(buffers, count, backend_, &area)) return false;
    if (int64_t(area.Width()) * area.Height() < kMinBandedPixels) return false;
    const uint32_t bands = std::min(uint32_t(area.Height() / kMinBandHeight), (helping + 1) * kBandsAThread);
    if (bands < 2) return false;
    while (helpers_.size() < helping) {
        helpers_.emplace_back(HeapNew<CpuBackend>(shared_));
        if (!helpers_.back()) return helpers_.pop_back(), false;
    }
    CpuBackend* painters[kMaxHelpers + 1] = {&backend_};
    for (uint32_t i = 0; i < helping; ++i) {
        painters[i + 1] = helpers_[i].get();
        painters[i + 1]->SetRenderTarget(backend_.GetRenderTarget());
        painters[i + 1]->stats() = {};
    }
    auto* job = HeapNew<BandJob>(buffers, count, area, bands, painters);
    if (!job) return false;
    shared_.resources.BeginFrame();
    for (uint32_t i = 0; i < helping; ++i) {
        job->AddRef();
        shared_.helpers->Post(job);
    }
    job->Run();
    job->Wait();
    job->Release();
    for (uint32_t i = 0; i < helping; ++i)
        backend_.stats() += helpers_[i]->stats();
    return true;
}

void CpuScene::ExecuteBackEnd(CommandBuffer* const* buffers, uint32_t count) {
    backend_.stats() = {};
    if (!PaintInBands(buffers, count)) ExecuteAll(buffers, count);
    shared_.glyphs.Trim(kGlyphCacheBytes);
}

void CpuScene::ExecuteBuffers(CommandBuffer* const* buffers, uint32_t count, IBufferListener* listener,
                              void* userData) {
    ExecuteFrontEnd(buffers, count);
    if (listener) listener->OnBuffersConsumed(userData);
}

void CpuScene::FreeSurfaces(const SurfaceId* ids, uint32_t count) {
    for (uint32_t i = 0; i < count; ++i)
        shared_.resources.DestroySurface(ids[i]);
}

void CpuScene::FreeImages(const ImageId* ids, uint32_t count) {
    for (uint32_t i = 0; i < count; ++i)
        shared_.resources.DestroyImage(ids[i]);
}

CaptureData CpuScene::SerializeBuffers(CommandBuffer* const* buffers, uint32_t count) {
    StreamUses uses;
    for (uint32_t i = 0; i < count; ++i) {
        if (buffers[i]) CollectUses(BufferSource(*buffers[i]), &uses);
    }
    CaptureWriter writer;
    const Bitmap& target = backend_.GetRenderTarget();
    if (!target.bounds.IsEmpty()) {
        writer.AddTarget(uint32_t(target.bounds.Width()), uint32_t(target.bounds.Height()), target.data,
                         target.pitch);
    }
    for (const FontId id : uses.fonts) {
        const FontFace* face = shared_.fonts.GetFace(id);
        if (!face) continue;
        const std::span<const uint8_t> bytes = face->GetBytes();
        const Vector<BitmapFontImage> pages = face->GetPages();
        if (!pages.empty()) {
            const std::string_view table(reinterpret_cast<const char*>(bytes.data()), bytes.size());
            writer.AddPictureFont(id, table, {"", face->GetFlags(), pages.data(), uint32_t(pages.size())});
            continue;
        }
        writer.AddFont(id, face->GetFaceIndex(), uint32_t(face->GetSdfMode()), bytes.data(), bytes.size());
    }
    for (const ImageId id : uses.images) {
        const Texture* image = shared_.resources.FindImage(id);
        if (!image) continue;
        const bool alpha = !image->alpha.empty();
        const void* pixels = alpha ? static_cast<const void*>(image->alpha.data()) : image->pixels.pixels();
        writer.AddImage(id, image->width, image->height,
                        uint32_t(alpha ? PixelFormat::A8 : PixelFormat::RGBA8), pixels);
    }
    for (const SurfaceId id : uses.surfaces) {
        const Texture* surface = shared_.resources.FindSurface(id);
        if (surface) writer.AddSurface(id, surface->width, surface->height, surface->pixels.pixels());
    }
    for (uint32_t i = 0; i < count; ++i) {
        if (buffers[i]) writer.AddBuffer(BufferSource(*buffers[i]));
    }
    const Vector<uint8_t>& bytes = writer.Finish();
    CaptureData capture;
    capture.data = HeapAllocate(bytes.size(), kCaptureAlignment);
    if (!capture.data) return {};
    std::memcpy(capture.data, bytes.data(), bytes.size());
    capture.size = bytes.size();
    return capture;
}

void CpuScene::FreeCapture(CaptureData capture) {
    HeapFree(capture.data, kCaptureAlignment);
}

void CpuScene::SetCacheLimit(SceneCache cache, CacheLimit limit, uint64_t value) {
    // Layers are the one scratch memory here; the other caches belong to back ends on a GPU.
    if (cache != SceneCache::ScratchLayers) return;
    LayerPool& pool = shared_.layers;
    if (limit == CacheLimit::Count)
        pool.SetLimits(size_t(value), pool.maxBytes());
    else
        pool.SetLimits(pool.maxCount(), size_t(value));
}

void CpuScene::ClearCaches(uint32_t mask) {
    if (mask & 8) shared_.layers.Clear();
}

void CpuScene::FreeResources() {
    shared_.resources.DropRetired();
    shared_.resources.DestroySurfacesOf(backend_.owner());
    shared_.layers.Clear();
    shared_.glyphs.Clear();
}

void CpuScene::Destroy() {
    shared_.resources.RetireOwner(backend_.owner());
    HeapDelete(this);
}

}  // namespace fresco::cpu
