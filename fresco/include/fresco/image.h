// Images: descriptions, and the decoder's answers.
#pragma once
#include <fresco/paint.h>
#include <cstddef>

namespace fresco {

enum class PixelFormat : uint32_t {
    RGBA8 = 0,  // 4 bytes a pixel, r first; premultiplied unless the image's flags say otherwise
    BGRA8 = 1,
    A8 = 2,  // coverage alone: alpha of masks, planes of YUV images
};

enum ImageFlags : uint32_t {
    kImageOpaque = 1,
    kImageStraightAlpha = 2,  // colours are not premultiplied by alpha
    kImageFlippedVertically = 4,
    kImageUserObject = 32,  // `pixels` points at a UserImage that the client keeps alive and may repaint
};

// Description of an image, and with `pixels` set the data to create it from. The pixels are read when the
// buffer executes; their owner keeps them until then (IScene::ExecuteBuffers tells when).
struct Image {
    uint32_t width = 0, height = 0;
    PixelFormat format = PixelFormat::RGBA8;
    uint32_t flags = 0;
    uint32_t rowPitch = 0;  // bytes; 0: rows follow each other without a gap
    const void* pixels = nullptr;
};

// What `Image::pixels` points at with kImageUserObject and the CPU back end. It is read at each draw.
struct UserImage {
    const void* pixels = nullptr;
    uint32_t rowPitch = 0;
};

struct ImageInfo {
    uint32_t width = 0, height = 0;
    PixelFormat format = PixelFormat::RGBA8;
    uint32_t flags = 0;
};

enum class ImageDecodeResult : uint32_t {
    LastFrame = 0,   // a frame, or nothing when the index is past the last one
    MoreFrames = 1,  // a frame, and another one follows
    Failed = 2,
};

// One decoded frame, tightly packed rows. `pixels` is freed with Library::FreeDecodedImage.
struct FrameResult {
    void* pixels = nullptr;
    uint32_t rowPitch = 0;
    size_t size = 0;
};

// Refused above any: no page needs more, and a lying header must not take the machine's memory. The bytes are
// those of all frames together.
constexpr uint32_t kMaxImageSide = 16384;
constexpr uint64_t kMaxImageBytes = 256ull << 20;
constexpr uint32_t kMaxAnimationFrames = 10000;
// A few bytes shall not cost a second: what a file may unpack to grows with its size. What is free holds a
// screen of 3840 x 2160 in one colour, and the frames of a small spinner; the rate is several times what
// real pictures reach.
constexpr uint64_t kFreeImagePixels = 8ull << 20;
constexpr uint64_t kFreeAnimationPixels = 4ull << 20;  // each is drawn, kept and copied
constexpr uint64_t kMaxPixelsPerFileByte = 2048;

}  // namespace fresco
