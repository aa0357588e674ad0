// An image file through one of the decoders: its first bytes are made those of the format, so that no
// mutation leads to another one.
#pragma once

#include <fresco/library.h>

#include <cstdint>
#include <string_view>
#include <vector>

#include "support/scene.h"

namespace qorvex::fuzz {

inline constexpr uint32_t kMostFrames = 8;
inline constexpr uint32_t kNoFrame = UINT32_MAX;  // ends an animation that its thread keeps open

inline void DecodeImage(const std::vector<uint8_t>& file) {
    const Scene scene;
    for (const auto format : {fresco::PixelFormat::RGBA8, fresco::PixelFormat::BGRA8}) {
        bool more = true;
        for (uint32_t turn = 0; turn <= kMostFrames; ++turn) {
            const uint32_t index = more && turn < kMostFrames ? turn : kNoFrame;
            fresco::ImageInfo info;
            uint32_t count = 0, delay = 0;
            fresco::FrameResult frame;
            const auto result = fresco::Library::DecodeImageMemory(file.data(), file.size(), index, turn * 16,
                                                                   0, format == fresco::PixelFormat::RGBA8,
                                                                   info, count, delay, &frame, format);
            // Every byte that was promised is there.
            uint64_t sum = 0;
            for (size_t i = 0; frame.pixels && i < frame.size; i += 64)
                sum += static_cast<const uint8_t*>(frame.pixels)[i];
            if (frame.pixels && frame.size) sum += static_cast<const uint8_t*>(frame.pixels)[frame.size - 1];
            [[maybe_unused]] volatile uint64_t seen = sum;
            if (frame.pixels) fresco::Library::FreeDecodedImage(frame.pixels);
            if (index == kNoFrame) break;
            more = result == fresco::ImageDecodeResult::MoreFrames;
        }
    }
}

/// A copy of the input that begins with these bytes; those marked by '?' stay.
inline std::vector<uint8_t> WithSignature(const uint8_t* data, size_t size, std::string_view signature) {
    std::vector<uint8_t> file(data, data + size);
    for (size_t i = 0; i < signature.size() && i < size; ++i)
        if (signature[i] != '?') file[i] = static_cast<uint8_t>(signature[i]);
    return file;
}

}  // namespace qorvex::fuzz
