#include "fresco/cpu/resources.h"

#include "fresco/core/log.h"

namespace fresco::cpu {
namespace {

bool ValidSize(uint64_t width, uint64_t height) {
    return width > 0 && height > 0 && width <= kMaxImageSide && height <= kMaxImageSide &&
           width * height * 4 <= kMaxImageBytes;
}

// The mean of 2 by 2 pixels; an odd last row or column counts twice.
void Halve(const PixelBuffer& from, PixelBuffer* to) {
    for (int y = 0; y < to->height(); ++y) {
        const uint32_t* a = from.Row(y * 2);
        const uint32_t* b = from.Row(std::min(y * 2 + 1, from.height() - 1));
        uint32_t* out = to->Row(y);
        for (int x = 0; x < to->width(); ++x) {
            const int x0 = x * 2, x1 = std::min(x * 2 + 1, from.width() - 1);
            uint32_t even = 0x00020002, odd = 0x00020002;
            for (const uint32_t p : {a[x0], a[x1], b[x0], b[x1]}) {
                even += p & 0x00FF00FF;
                odd += (p >> 8) & 0x00FF00FF;
            }
            out[x] = (even >> 2 & 0x00FF00FF) | (odd >> 2 & 0x00FF00FF) << 8;
        }
    }
}

void MakeLevels(Texture& texture) {
    texture.levels.clear();
    texture.levelsValid = true;
    const PixelBuffer* from = &texture.pixels;
    texture.levels.reserve(16);
    while (from->width() > 1 && from->height() > 1 && texture.levels.size() < 15) {
        PixelBuffer next;
        if (!next.Allocate((from->width() + 1) / 2, (from->height() + 1) / 2)) break;
        Halve(*from, &next);
        texture.levels.push_back(std::move(next));
        from = &texture.levels.back();
    }
}

}  // namespace

const PixelBuffer& Resources::FindLevel(Texture& texture, double scale) {
    if (!(scale < 0.5)) return texture.pixels;
    const std::lock_guard<std::mutex> lock(mutex_);
    if (!texture.levelsValid) MakeLevels(texture);
    // The smallest level that is still shrunk, but by less than one half.
    const PixelBuffer* level = &texture.pixels;
    for (size_t i = 0; scale < 0.5 && i < texture.levels.size(); ++i, scale *= 2)
        level = &texture.levels[i];
    return *level;
}

Texture* Resources::FindImage(ImageId id) {
    const auto found = images_.find(id);
    if (found == images_.end()) return nullptr;
    Texture& texture = found->second;
    if (texture.user && texture.user->pixels) {
        const std::lock_guard<std::mutex> lock(mutex_);
        if (texture.readIn == frame_) return &texture;
        texture.readIn = frame_;
        const size_t pixelSize = texture.sourceFormat == uint32_t(PixelFormat::A8) ? 1 : 4;
        const size_t pitch = texture.user->rowPitch ? texture.user->rowPitch : texture.width * pixelSize;
        Load(texture, static_cast<const uint8_t*>(texture.user->pixels), pitch);
    }
    return &texture;
}

Texture* Resources::FindSurface(SurfaceId id) {
    const auto found = surfaces_.find(id);
    return found == surfaces_.end() ? nullptr : &found->second;
}

void Resources::Load(Texture& texture, const uint8_t* pixels, size_t pitch) {
    texture.levelsValid = false;
    const bool flipped = texture.flags & kImageFlippedVertically;
    for (uint32_t y = 0; y < texture.height; ++y) {
        const uint8_t* from = pixels + size_t(flipped ? texture.height - 1 - y : y) * pitch;
        if (texture.sourceFormat == uint32_t(PixelFormat::A8)) {
            std::memcpy(texture.alpha.data() + size_t(y) * texture.width, from, texture.width);
            // As a picture it is white under that coverage.
            uint32_t* out = texture.pixels.Row(int(y));
            for (uint32_t x = 0; x < texture.width; ++x)
                out[x] = from[x] * 0x01010101u;
            continue;
        }
        uint32_t* out = texture.pixels.Row(int(y));
        std::memcpy(out, from, size_t(texture.width) * 4);
        if (texture.sourceFormat == uint32_t(PixelFormat::BGRA8)) {
            for (uint32_t x = 0; x < texture.width; ++x) {
                out[x] = (out[x] & 0xFF00FF00) | (out[x] >> 16 & 0xFF) | (out[x] & 0xFF) << 16;
            }
        }
        if (texture.flags & kImageStraightAlpha) {
            for (uint32_t x = 0; x < texture.width; ++x) {
                out[x] = (ScalePixel(out[x] & 0x00FFFFFF, out[x] >> 24) & 0x00FFFFFF) | (out[x] & 0xFF000000);
            }
        }
    }
    uint32_t all = 0xFF000000;
    const size_t count = size_t(texture.width) * texture.height;
    for (size_t i = 0; i < count; ++i)
        all &= texture.pixels.pixels()[i];
    texture.opaque = (all >> 24) == 255;
}

void Resources::CreateImage(const CreateImageRecord& record, const void* pixels, size_t size) {
    if (!ValidSize(record.width, record.height) || record.format > uint32_t(PixelFormat::A8)) {
        FRESCO_WARN("Refusing image %u of %u x %u pixels", record.image, record.width, record.height);
        return;
    }
    Texture texture;
    texture.width = record.width, texture.height = record.height;
    texture.sourceFormat = record.format, texture.flags = record.flags;
    if (!texture.pixels.Allocate(int(record.width), int(record.height))) {
        FRESCO_WARN("No memory for image %u of %u x %u pixels", record.image, record.width, record.height);
        return;
    }
    const size_t pixelSize = record.format == uint32_t(PixelFormat::A8) ? 1 : 4;
    if (pixelSize == 1) texture.alpha.assign(size_t(record.width) * record.height, 0);
    const size_t pitch = record.pixels.rowPitch ? record.pixels.rowPitch : record.width * pixelSize;
    if (record.flags & kImageUserObject) {
        texture.user = static_cast<const UserImage*>(pixels);
    } else if (pixels && pitch >= record.width * pixelSize &&
               size >= pitch * (record.height - 1) + record.width * pixelSize) {
        Load(texture, static_cast<const uint8_t*>(pixels), pitch);
    }
    images_[record.image] = std::move(texture);
}

void Resources::UpdateImage(const UpdateImageRecord& record, const void* pixels, size_t size) {
    const auto found = images_.find(record.image);
    if (found == images_.end() || !pixels) return;
    Texture& texture = found->second;
    const size_t pixelSize = texture.sourceFormat == uint32_t(PixelFormat::A8) ? 1 : 4;
    if (size < size_t(texture.width) * texture.height * pixelSize) {
        FRESCO_WARN("Update of image %u is too short", record.image);
        return;
    }
    Load(texture, static_cast<const uint8_t*>(pixels), texture.width * pixelSize);
}

void Resources::DestroySurfacesOf(uint32_t owner) {
    for (auto entry = surfaces_.begin(); entry != surfaces_.end();)
        entry = entry->second.owner == owner ? surfaces_.erase(entry) : std::next(entry);
}

void Resources::RetireOwner(uint32_t owner) {
    std::lock_guard<std::mutex> lock(retiredMutex_);
    retired_.push_back(owner);
    anyRetired_.store(true, std::memory_order_release);
}

void Resources::RetireImages(const ImageId* ids, uint32_t count) {
    std::lock_guard<std::mutex> lock(retiredMutex_);
    retiredImages_.insert(retiredImages_.end(), ids, ids + count);
    anyRetired_.store(true, std::memory_order_release);
}

void Resources::DropRetired() {
    if (!anyRetired_.load(std::memory_order_acquire)) return;
    Vector<uint32_t> retired;
    Vector<ImageId> images;
    {
        std::lock_guard<std::mutex> lock(retiredMutex_);
        retired.swap(retired_);
        images.swap(retiredImages_);
        anyRetired_.store(false, std::memory_order_relaxed);
    }
    for (const uint32_t owner : retired)
        DestroySurfacesOf(owner);
    for (const ImageId id : images)
        DestroyImage(id);
}

void Resources::CreateSurface(const CreateSurfaceRecord& record, uint32_t owner) {
    const SurfaceDescription& d = record.description;
    if (!ValidSize(d.width, d.height)) {
        FRESCO_WARN("Refusing surface %u of %u x %u pixels", record.surface, d.width, d.height);
        return;
    }
    Texture* old = FindSurface(record.surface);
    if ((record.flag & 1) && old && old->width == d.width && old->height == d.height) return;
    Texture texture;
    texture.width = d.width, texture.height = d.height;
    texture.owner = owner;
    if (!texture.pixels.Allocate(int(d.width), int(d.height))) {
        FRESCO_WARN("No memory for surface %u of %u x %u pixels", record.surface, d.width, d.height);
        return;
    }
    surfaces_[record.surface] = std::move(texture);
}

bool Resources::RestoreImage(ImageId id, uint32_t format, uint32_t width, uint32_t height,
                             const uint8_t* data) {
    CreateImageRecord record;
    record.image = id, record.width = width, record.height = height, record.format = format;
    CreateImage(record, data, size_t(width) * height * (format == uint32_t(PixelFormat::A8) ? 1 : 4));
    return images_.count(id) > 0;
}

bool Resources::RestoreSurface(SurfaceId id, uint32_t width, uint32_t height, const uint8_t* data) {
    CreateSurfaceRecord record;
    record.surface = id, record.description = {width, height, PixelFormat::RGBA8};
    CreateSurface(record);
    Texture* surface = FindSurface(id);
    if (surface) std::memcpy(surface->pixels.pixels(), data, size_t(width) * height * 4);
    return surface != nullptr;
}

void Resources::Clear() {
    images_.clear();
    surfaces_.clear();
}

}  // namespace fresco::cpu
