// One use of an image by a node: a layer of its style, or what an image element shows.
//
// Invariants: between Request and Release the use counts as a holder of the image, which keeps the image from
// being given up; a use that waits for its image holds back the document's "load". Script thread; dies no
// later than its node.
#pragma once

#include "display/box.h"
#include "dom/image_loading.h"

namespace qorvex::dom {

class ImageUse {
  public:
    ImageUse() = default;
    ImageUse(ImageUse&& other) noexcept;
    ImageUse& operator=(ImageUse&& other) noexcept;
    ~ImageUse() { Release(); }

    // Lets go of what was used before and asks for the image at `url`. States that the image has reached
    // already come to node.OnImageLoaded inside this call. Does nothing for an empty URL, or without a view.
    void Request(Node& node, const URL& url);
    void Release();

    // For Node::OnImageLoaded: takes the news over when they are about this image. False: it is another one.
    bool Update(uint32_t id, const ImageInfoPtr& info, ImageState state);
    // The same for Node::OnSVGLoaded. A vector image goes from Loading to OnGPU or to a failure.
    bool UpdateSVG(uint32_t id, const SVGImagePtr& svg);
    // The frame of an animated image that shows from now on (Node::OnImageFrame). True when it is this image.
    bool ShowFrame(uint32_t id, uint32_t frame);

    bool IsRequested() const { return node_ != nullptr; }
    // By the ending of its path: a file of the other kind fails.
    bool IsSVG() const { return is_svg_; }
    const SVGImagePtr& GetSVG() const { return svg_; }
    uint32_t GetId() const { return id_; }
    const URL& GetURL() const { return url_; }
    ImageState GetState() const { return state_; }
    bool HasFailed() const { return state_ >= ImageState::LoadFailed; }
    // Null until the image was decoded. While an image is loaded again, after the rendering resources were
    // lost, the old one stays, so that nothing jumps.
    const ImageInfoPtr& GetInfo() const { return info_; }
    // 0 by 0 until it is known.
    layout::Size GetNaturalSize() const { return info_ ? info_->NaturalSize() : layout::Size{}; }
    // What a display element draws; without a resource while there is nothing to draw.
    dsp::ImageSlot MakeSlot() const;

  private:
    void CountAsPending(bool pending);

    Node* node_ = nullptr;
    uint32_t id_ = 0;
    uint32_t frame_ = 0;
    ImageState state_ = ImageState::None;
    bool pending_ = false;
    bool is_svg_ = false;
    URL url_;
    ImageInfoPtr info_;
    SVGImagePtr svg_;
};

}  // namespace qorvex::dom
