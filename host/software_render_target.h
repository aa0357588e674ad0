#pragma once

#include <fresco/scene.h>

#include <cstdint>
#include <span>
#include <vector>

#include "host/pixel_memory.h"

namespace qorvex::host {

// A surface in memory for the CPU back end: premultiplied RGBA8, rows without a gap, top row first.
class SoftwareRenderTarget {
  public:
    SoftwareRenderTarget(std::uint32_t width, std::uint32_t height) { Resize(width, height); }
    SoftwareRenderTarget(const SoftwareRenderTarget&) = delete;
    SoftwareRenderTarget& operator=(const SoftwareRenderTarget&) = delete;

    // Drops the pixels; all become transparent.
    void Resize(std::uint32_t width, std::uint32_t height) {
        width_ = width;
        height_ = height;
        pixels_ = PixelMemory(std::size_t{4} * width * height);
        surface_ = {pixels_.data(), width, height, width * 4};
    }

    [[nodiscard]] std::uint32_t Width() const { return width_; }
    [[nodiscard]] std::uint32_t Height() const { return height_; }
    // The colour target of ViewRenderer::SetRenderTarget; set it again after Resize.
    [[nodiscard]] void* Color() { return &surface_; }
    [[nodiscard]] std::span<const std::uint8_t> Pixels() const { return pixels_.View(); }

    // The pixels laid over an opaque grey level, three bytes each.
    [[nodiscard]] std::vector<std::uint8_t> Flatten(std::uint8_t level = 255) const {
        std::vector<std::uint8_t> out;
        const std::span<const std::uint8_t> pixels = Pixels();
        out.reserve(pixels.size() / 4 * 3);
        for (std::size_t i = 0; i < pixels.size(); i += 4) {
            const unsigned rest = 255u - pixels[i + 3];
            for (int channel = 0; channel < 3; ++channel) {
                const unsigned sum = pixels[i + channel] + (rest * level + 127) / 255;
                out.push_back(static_cast<std::uint8_t>(sum > 255 ? 255 : sum));
            }
        }
        return out;
    }

  private:
    std::uint32_t width_ = 0;
    std::uint32_t height_ = 0;
    PixelMemory pixels_;
    fresco::CpuRenderTarget surface_;
};

}  // namespace qorvex::host
