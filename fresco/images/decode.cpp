// Library::DecodeImageMemory: finds the format and gives pixels the form that was asked for.
#include <fresco/library.h>
#include "fresco/core/heap.h"
#include "fresco/core/log.h"
#include "fresco/cpu/rows.h"
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

bool IsOpaque(const uint32_t* pixels, size_t count) {
    uint32_t all = 0xFFFFFFFFu;
    for (size_t i = 0; i < count; ++i)
        all &= pixels[i];
    return all >> 24 == 255;
}

// In place, piece by piece so that each is touched once while it is in the cache; returns whether all pixels
// are opaque.
bool Finish(DecodedFrame& frame, bool premultiply, PixelFormat format) {
    const size_t count = size_t(frame.width) * frame.height;
    if (!frame.hasAlpha && format == PixelFormat::RGBA8) return true;
    auto* pixels = reinterpret_cast<uint32_t*>(frame.pixels);
    const cpu::RowLoops& rows = cpu::Rows();
    bool opaque = true;
    constexpr size_t kPiece = 4096;
    for (size_t at = 0; at < count; at += kPiece) {
        const size_t length = std::min(kPiece, count - at);
        uint32_t* piece = pixels + at;
        const bool solid = IsOpaque(piece, length);
        opaque = opaque && solid;
        if (premultiply && !solid) rows.Premultiply(piece, int(length));
        if (format == PixelFormat::BGRA8) rows.SwapRedAndBlue(piece, int(length));
        if (format == PixelFormat::A8) {
            for (size_t i = 0; i < length; ++i)
                frame.pixels[at + i] = uint8_t(piece[i] >> 24);
        }
    }
    return opaque;
}

}  // namespace

bool MayDecode(uint64_t width, uint64_t height, uint64_t fileSize, uint64_t shrink) {
    if (width > 0 && height > 0 && width <= kMaxImageSide && height <= kMaxImageSide &&
        width * height * 4 <= kMaxImageBytes * shrink * shrink &&
        width * height <= kFreeImagePixels + fileSize * kMaxPixelsPerFileByte)
        return true;
    FRESCO_WARN("Refusing to decode an image of %llu x %llu pixels from %llu bytes",
                static_cast<unsigned long long>(width), static_cast<unsigned long long>(height),
                static_cast<unsigned long long>(fileSize));
    return false;
}

uint8_t* AllocatePixels(uint64_t width, uint64_t height, uint64_t fileSize) {
    if (!MayDecode(width, height, fileSize)) return nullptr;
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
