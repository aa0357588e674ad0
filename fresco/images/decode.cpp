// Library::DecodeImageMemory: finds the format and gives pixels the form that was asked for.
#include <fresco/library.h>
#include "fresco/core/heap.h"
#include "fresco/core/log.h"
#include "fresco/images/decoders.h"

namespace fresco {
namespace {

constexpr size_t kPixelAlignment = 64;

bool StartsWith(const uint8_t* data, size_t size, std::string_view magic) {
    return size >= magic.size() && std::memcmp(data, magic.data(), magic.size()) == 0;
}

bool Decode(const uint8_t* data, size_t size, uint32_t index, const DecodeHints& hints, DecodedFrame* frame) {
    const bool png = StartsWith(data, size, "\x89PNG\r\n\x1a\n"),
               jpeg = StartsWith(data, size, "\xFF\xD8\xFF");
    if ((png || jpeg) && index > 0) return true;  // they hold one picture
    if (png) return DecodePng(data, size, frame);
    if (jpeg) return DecodeJpeg(data, size, hints, frame);
    if (StartsWith(data, size, "GIF8")) return DecodeGif(data, size, index, frame);
    if (StartsWith(data, size, "RIFF") && size >= 12 && std::memcmp(data + 8, "WEBP", 4) == 0) {
        return DecodeWebp(data, size, index, frame);
    }
    return false;
}

// In place; returns whether all pixels are opaque.
bool Finish(DecodedFrame& frame, bool premultiply, PixelFormat format) {
    const size_t count = size_t(frame.width) * frame.height;
    uint8_t* p = frame.pixels;
    uint8_t all = 255;
    for (size_t i = 0; i < count; ++i, p += 4) {
        const uint32_t a = p[3];
        all &= uint8_t(a);
        if (premultiply && a != 255) {
            for (int c = 0; c < 3; ++c) {
                const uint32_t t = p[c] * a + 128;
                p[c] = uint8_t((t + (t >> 8)) >> 8);
            }
        }
        if (format == PixelFormat::BGRA8) std::swap(p[0], p[2]);
        if (format == PixelFormat::A8) frame.pixels[i] = uint8_t(a);
    }
    return all == 255;
}

}  // namespace

uint8_t* AllocatePixels(uint64_t width, uint64_t height) {
    if (width == 0 || height == 0 || width > kMaxImageSide || height > kMaxImageSide ||
        width * height * 4 > kMaxImageBytes) {
        FRESCO_WARN("Refusing to decode an image of %llu x %llu pixels",
                    static_cast<unsigned long long>(width), static_cast<unsigned long long>(height));
        return nullptr;
    }
    return static_cast<uint8_t*>(HeapAllocate(size_t(width * height * 4), kPixelAlignment));
}

void FreePixels(void* pixels) {
    HeapFree(pixels, kPixelAlignment);
}

void Library::FreeDecodedImage(void* pixels) {
    FreePixels(pixels);
}

ImageDecodeResult Library::DecodeImageMemory(const void* data, size_t size, uint32_t frameIndex,
                                             uint32_t widthHint, uint32_t heightHint, bool premultiply,
                                             ImageInfo& info, uint32_t& frameCount, uint32_t& delay,
                                             FrameResult* result, PixelFormat format) {
    info = {};
    frameCount = 0;
    delay = 0;
    if (result) *result = {};
    DecodedFrame frame;
    const bool decoded =
        data && Decode(static_cast<const uint8_t*>(data), size, frameIndex, {widthHint, heightHint}, &frame);
    if (!decoded || !frame.pixels) {
        FreePixels(frame.pixels);
        // Past the last frame there is nothing, which is no failure.
        return decoded && frame.frameCount > 0 ? ImageDecodeResult::LastFrame : ImageDecodeResult::Failed;
    }
    const bool opaque = Finish(frame, premultiply, format);
    info.width = frame.width, info.height = frame.height, info.format = format;
    info.flags = opaque ? uint32_t(kImageOpaque) : premultiply ? 0u : uint32_t(kImageStraightAlpha);
    frameCount = frame.frameCount;
    delay = frame.delay;
    const uint32_t pixelSize = format == PixelFormat::A8 ? 1 : 4;
    if (result) {
        *result = {frame.pixels, frame.width * pixelSize, size_t(frame.width) * frame.height * pixelSize};
    } else {
        FreePixels(frame.pixels);
    }
    return frameIndex + 1 < frame.frameCount ? ImageDecodeResult::MoreFrames : ImageDecodeResult::LastFrame;
}

}  // namespace fresco
