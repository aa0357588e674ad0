#include "hud_fresco.h"

#include <fresco/library.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <string>

namespace qorvex::benchmarks {
namespace {

using namespace fresco;

class FileReader final : public IStreamReader {
  public:
    explicit FileReader(const char* path) {
        if (std::FILE* file = std::fopen(path, "rb")) {
            char block[65536];
            while (const std::size_t read = std::fread(block, 1, sizeof(block), file))
                bytes_.append(block, read);
            std::fclose(file);
        }
    }
    std::size_t GetSize() override { return bytes_.size(); }
    std::size_t Read(std::size_t offset, void* destination, std::size_t size) override {
        size = offset < bytes_.size() ? std::min(size, bytes_.size() - offset) : 0;
        std::memcpy(destination, bytes_.data() + offset, size);
        return size;
    }
    void Close() override {}

  private:
    std::string bytes_;
};

Paint Solid(const Color& color) {
    Paint paint;
    paint.color = color;
    return paint;
}

CornerRadii Round(float radius) {
    return {{radius, radius}, {radius, radius}, {radius, radius}, {radius, radius}};
}

}  // namespace

HudFresco::HudFresco()
    : library_(IRenderingLibrary::Initialize({})),
      scene_(library_->CreateScene({})),
      pixels_(static_cast<std::size_t>(HudScene::kWidth) * HudScene::kHeight, 0) {
    target_ = {pixels_.data(), HudScene::kWidth, HudScene::kHeight, HudScene::kWidth * 4};
    scene_->SetRenderTarget(&target_, nullptr, {});
    FileReader reader(kHudFont);
    font_ = library_->GetFontService()->LoadFace(&reader, 0, SdfMode::Never);
    hud_ = MakeHudScene(*library_->GetFontService()->GetFont(font_));
    Upload();
}

HudFresco::~HudFresco() {
    scene_->Destroy();
    library_->Destroy();
}

void HudFresco::Upload() {
    CommandBuffer* uploads = Library::CreateBuffer(0, 0);
    for (const HudPicture& picture : hud_.pictures) {
        images_.push_back(Library::GetImageName());
        uploads->CreateImage(images_.back(), {static_cast<std::uint32_t>(picture.width),
                                              static_cast<std::uint32_t>(picture.height), PixelFormat::RGBA8,
                                              0, 0, picture.pixels.data()});
    }
    scene_->ExecuteFrontEnd(&uploads, 1);
    uploads->Release();
    // One shadow, ten places: boxes of one size share a surface. Its pixels go to the other painter.
    const Rect& place = hud_.shadows[0].rect;
    const auto width = static_cast<std::uint32_t>(place.width),
               height = static_cast<std::uint32_t>(place.height);
    const SurfaceId surface = Library::GetSurfaceName();
    CommandBuffer* shadow = Library::CreateBufferForSurface(surface, 256, 0);
    shadow->CreateSurface(surface, {width, height, PixelFormat::RGBA8}, 0);
    shadow->ClearRect({}, 1);
    shadow->FillRoundedRect({24, 24, 0, place.width - 48, place.height - 48}, Round(12),
                            Solid({0, 0, 0, 0.6f}));
    shadow->ApplyBlur(24);
    scene_->ExecuteFrontEnd(&shadow, 1);
    shadow->Release();
    shadows_.assign(hud_.shadows.size(), surface);
    HudPicture picture{static_cast<int>(width), static_cast<int>(height), {}};
    picture.pixels.resize(static_cast<std::size_t>(width) * height);
    const CpuRenderTarget readback{picture.pixels.data(), width, height, width * 4};
    scene_->SetRenderTarget(const_cast<CpuRenderTarget*>(&readback), nullptr, {});
    CommandBuffer* copy = Library::CreateBuffer(0, 0);
    copy->DrawSurface(surface, {}, {0, 0, 0, place.width, place.height}, Paint{});
    scene_->ExecuteBackEnd(&copy, 1);
    copy->Release();
    scene_->SetRenderTarget(&target_, nullptr, {});
    hud_.shadowPictures.push_back(std::move(picture));
}

void HudFresco::RecordContent(CommandBuffer& buffer, const std::vector<HudBox>& boxes,
                              const std::vector<HudLabel>& labels) const {
    for (const HudBox& box : boxes)
        buffer.FillRoundedRect(box.rect, Round(box.radius), Solid(box.color));
    for (const HudLabel& label : labels) {
        GlyphRunParams run;
        run.font = font_, run.size = label.size, run.x = label.x, run.y = label.y,
        run.paint = Solid(label.color);
        buffer.DrawGlyphs(label.glyphs.data(), static_cast<std::uint32_t>(label.glyphs.size()), run);
    }
}

CommandBuffer* HudFresco::Record(const Rect* dirty) const {
    CommandBuffer* buffer = Library::CreateBuffer(0x3000, 0);
    buffer->BeginScissor();
    buffer->PushState(kStateAll);
    if (dirty) buffer->ClipRect(*dirty);
    buffer->ClearRect({0, 0, 0, HudScene::kWidth, HudScene::kHeight}, 0);
    for (std::size_t i = 0; i < hud_.shadows.size(); ++i)
        buffer->DrawSurface(shadows_[i], {}, hud_.shadows[i].rect, Paint{});
    for (const HudGradient& gradient : hud_.gradients) {
        const Rect& r = gradient.rect;
        const float unit = std::max(r.width, r.height);
        const auto place = [&](Point p) { return Point{(p.x - r.x) / unit, (p.y - r.y) / unit}; };
        const auto count = static_cast<std::uint32_t>(gradient.stops.size());
        if (gradient.radial) {
            buffer->FillRadialGradient(
                r, Paint{}, gradient.stops.data(), count,
                {place(gradient.start), {gradient.end.x / unit, gradient.end.y / unit}});
        } else {
            buffer->FillLinearGradient(r, Paint{}, gradient.stops.data(), count,
                                       {place(gradient.start), place(gradient.end)});
        }
    }
    for (const HudImage& image : hud_.images)
        buffer->DrawImage(images_[image.picture], image.rect, {}, Paint{});
    RecordContent(*buffer, hud_.boxes, hud_.labels);
    buffer->PushState(kStateClip);
    buffer->ClipRect(hud_.group, kClipIntersect);
    buffer->BeginLayer(kLayerContent, MakeLayerPaint(HudScene::kGroupOpacity));
    RecordContent(*buffer, hud_.groupBoxes, hud_.groupLabels);
    buffer->EndLayer();
    buffer->PopState();
    buffer->PopState();
    return buffer;
}

}  // namespace qorvex::benchmarks
