#pragma once

#include <fresco/scene.h>

#include <cstdint>
#include <span>
#include <vector>

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
        pixels_.assign(std::size_t{4} * width * height, 0);
        surface_ = {pixels_.data(), width, height, width * 4};
    }

    [[nodiscard]] std::uint32_t Width() const { return width_; }
    [[nodiscard]] std::uint32_t Height() const { return height_; }
    // The colour target of ViewRenderer::SetRenderTarget; set it again after Resize.
    [[nodiscard]] void* Color() { return &surface_; }
    [[nodiscard]] std::span<const std::uint8_t> Pixels() const { return pixels_; }

    // The pixels laid over an opaque grey level, three bytes each.
    [[nodiscard]] std::vector<std::uint8_t> Flatten(std::uint8_t level = 255) const {
        std::vector<std::uint8_t> out;
        out.reserve(pixels_.size() / 4 * 3);
        for (std::size_t i = 0; i < pixels_.size(); i += 4) {
            const unsigned rest = 255u - pixels_[i + 3];
            for (int channel = 0; channel < 3; ++channel) {
                const unsigned sum = pixels_[i + channel] + (rest * level + 127) / 255;
                out.push_back(static_cast<std::uint8_t>(sum > 255 ? 255 : sum));
            }
        }
        return out;
    }

  private:
    std::uint32_t width_ = 0;
    std::uint32_t height_ = 0;
    std::vector<std::uint8_t> pixels_;
    fresco::CpuRenderTarget surface_;
};

}  // namespace qorvex::host
