// The scene through the rendering library, as the engine would record it: shadows and pictures are uploaded
// once, a frame is one command buffer.
#pragma once
#include <fresco/rendering_library.h>

#include <memory>
#include <vector>

#include "hud_scene.h"

namespace qorvex::benchmarks {

class HudFresco {
  public:
    HudFresco();
    ~HudFresco();
    HudFresco(const HudFresco&) = delete;
    HudFresco& operator=(const HudFresco&) = delete;

    // `dirty` null: the whole frame.
    fresco::CommandBuffer* Record(const fresco::Rect* dirty) const;
    void Draw(fresco::CommandBuffer* frame) { scene_->ExecuteBackEnd(&frame, 1); }
    const HudScene& hud() const { return hud_; }
    fresco::IRenderingLibrary& library() { return *library_; }
    fresco::IScene& scene() { return *scene_; }
    const std::vector<std::uint32_t>& pixels() const { return pixels_; }

  private:
    void Upload();
    void RecordContent(fresco::CommandBuffer& buffer, const std::vector<HudBox>& boxes,
                       const std::vector<HudLabel>& labels) const;

    fresco::IRenderingLibrary* library_;
    fresco::IScene* scene_;
    fresco::FontId font_ = fresco::kNoId;
    std::vector<std::uint32_t> pixels_;
    fresco::CpuRenderTarget target_;
    HudScene hud_;
    std::vector<fresco::ImageId> images_;
    std::vector<fresco::SurfaceId> shadows_;
};

constexpr char kHudFont[] = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";

}  // namespace qorvex::benchmarks
