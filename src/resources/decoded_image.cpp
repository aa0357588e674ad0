#include "resources/decoded_image.h"

#include "core/logging/log.h"

namespace qorvex {

DecodedImage DecodedImage::Decode(std::span<const uint8_t> file) {
    DecodedImage image;
    uint64_t bytes = 0;
    auto more = fresco::ImageDecodeResult::MoreFrames;
    for (uint32_t index = 0; more == fresco::ImageDecodeResult::MoreFrames; ++index) {
        fresco::ImageInfo info;
        fresco::FrameResult frame;
        uint32_t count = 0, delay = 0;
        more = fresco::Library::DecodeImageMemory(file.data(), file.size(), index, 0, 0, true, info, count,
                                                  delay, &frame, fresco::PixelFormat::RGBA8);
        if (more == fresco::ImageDecodeResult::Failed) return {};
        if (!frame.pixels) break;
        image.frames_.push_back({frame.pixels, delay});
        // One description stands for all frames.
        const fresco::Image& first = image.description_;
        if (index > 0 && (info.width != first.width || info.height != first.height)) return {};
        const uint32_t opaque = index == 0 ? fresco::kImageOpaque : image.description_.flags;
        image.description_ = {info.width,          info.height,    info.format,
                              info.flags & opaque, frame.rowPitch, nullptr};
        bytes += frame.size;
        // All frames together may be what one still image may be.
        if (bytes > fresco::kMaxImageBytes) {
            LogWarning("Refusing an animated image of more than ", fresco::kMaxImageBytes, " bytes in its ",
                       count, " frames");
            return {};
        }
    }
    return image;
}

fresco::Image DecodedImage::DescribeFrame(uint32_t index) const {
    fresco::Image frame = description_;
    frame.pixels = frames_[index].pixels;
    return frame;
}

}  // namespace qorvex
