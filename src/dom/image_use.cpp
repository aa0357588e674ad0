#include "dom/image_use.h"

#include <utility>

#include "dom/ascii.h"
#include "dom/document.h"

namespace qorvex::dom {

namespace {

bool HasSVGPath(const URL& url) {
    constexpr std::string_view kEnding = ".svg";
    const String path = url.GetPath();
    return path.size() >= kEnding.size() &&
           EqualsIgnoringAsciiCase(path.view().substr(path.size() - kEnding.size()), kEnding);
}

}  // namespace

ImageUse::ImageUse(ImageUse&& other) noexcept {
    *this = std::move(other);
}

ImageUse& ImageUse::operator=(ImageUse&& other) noexcept {
    if (this == &other) return *this;
    Release();
    node_ = std::exchange(other.node_, nullptr);
    id_ = std::exchange(other.id_, 0u);
    frame_ = std::exchange(other.frame_, 0u);
    state_ = std::exchange(other.state_, ImageState::None);
    pending_ = std::exchange(other.pending_, false);
    url_ = std::exchange(other.url_, URL());
    is_svg_ = std::exchange(other.is_svg_, false);
    info_ = std::exchange(other.info_, nullptr);
    svg_ = std::exchange(other.svg_, nullptr);
    return *this;
}

void ImageUse::Request(Node& node, const URL& url) {
    Release();
    Document& document = *node.GetDocument();
    IImageLoader* images = document.GetImageLoader();
    ISVGLoader* svgs = document.GetSVGLoader();
    const bool is_svg = HasSVGPath(url);
    if (url.IsEmpty() || (is_svg ? !svgs : !images)) return;
    node_ = &node;
    url_ = url;
    state_ = ImageState::Loading;
    CountAsPending(true);
    is_svg_ = is_svg;
    is_svg ? svgs->RegisterSVG(url, node, &id_) : images->RegisterImage(url, node, &id_);
}

void ImageUse::Release() {
    if (!node_) return;
    Document& document = *node_->GetDocument();
    if (is_svg_) {
        if (ISVGLoader* loader = document.GetSVGLoader()) loader->UnregisterSVG(id_, *node_);
    } else if (IImageLoader* loader = document.GetImageLoader()) {
        loader->UnregisterImage(id_, *node_);
    }
    if (info_ && info_->IsAnimated()) document.GetImageClock().Remove(id_, *node_);
    CountAsPending(false);
    node_ = nullptr;
    id_ = frame_ = 0;
    state_ = ImageState::None;
    url_ = URL();
    is_svg_ = false;
    info_ = nullptr;
    svg_ = nullptr;
}

bool ImageUse::Update(uint32_t id, const ImageInfoPtr& info, ImageState state) {
    if (!node_ || is_svg_ || id != id_) return false;
    state_ = state;
    CountAsPending(state < ImageState::Decoded);
    if (state != ImageState::Decoded && state != ImageState::OnGPU) return true;
    if (info_ == info) return true;
    ImageClock& clock = node_->GetDocument()->GetImageClock();
    if (info_ && info_->IsAnimated()) clock.Remove(id_, *node_);
    info_ = info;
    frame_ = info_->IsAnimated() ? clock.Add(id_, info_, *node_) : 0;
    return true;
}

bool ImageUse::UpdateSVG(uint32_t id, const SVGImagePtr& svg) {
    if (!node_ || !is_svg_ || id != id_) return false;
    state_ = svg ? ImageState::OnGPU : ImageState::LoadFailed;
    svg_ = svg;
    CountAsPending(false);
    return true;
}

bool ImageUse::ShowFrame(uint32_t id, uint32_t frame) {
    if (!node_ || is_svg_ || id != id_ || !info_ || frame >= info_->frames.size()) return false;
    frame_ = frame;
    return true;
}

dsp::ImageSlot ImageUse::MakeSlot() const {
    dsp::ImageSlot slot;
    if (!info_ || HasFailed()) return slot;
    slot.resource =
        static_cast<int32_t>(info_->IsAnimated() ? info_->frames[frame_].resource : info_->resource);
    slot.intrinsic = info_->NaturalSize();
    slot.source = info_->content;
    return slot;
}

void ImageUse::CountAsPending(bool pending) {
    if (pending_ == pending) return;
    pending_ = pending;
    node_->GetDocument()->CountPendingImage(pending ? 1 : -1);
}

}  // namespace qorvex::dom
