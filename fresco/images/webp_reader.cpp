#include <webp/decode.h>
#include <webp/demux.h>

#include "fresco/images/animation.h"

namespace fresco {
namespace {

class WebpAnimation final : public AnimationReader {
  public:
    using AnimationReader::AnimationReader;
    ~WebpAnimation() override { WebPAnimDecoderDelete(decoder_); }

    bool Open() {
        const WebPData webp{data_, size_};
        // The decoder takes the canvas twice before we could say no, so the header is asked first.
        WebPDemuxer* demuxer = WebPDemux(&webp);
        if (!demuxer) return false;
        const bool fits = SetExtent(WebPDemuxGetI(demuxer, WEBP_FF_CANVAS_WIDTH),
                                    WebPDemuxGetI(demuxer, WEBP_FF_CANVAS_HEIGHT),
                                    WebPDemuxGetI(demuxer, WEBP_FF_FRAME_COUNT), 0);
        WebPDemuxDelete(demuxer);
        WebPAnimDecoderOptions options;
        if (!fits || !WebPAnimDecoderOptionsInit(&options)) return false;
        options.color_mode = MODE_RGBA;
        decoder_ = WebPAnimDecoderNew(&webp, &options);
        return decoder_ != nullptr;
    }

    bool ReadNext(DecodedFrame* frame) override {
        uint8_t* canvas = nullptr;
        int end = 0;
        if (!WebPAnimDecoderGetNext(decoder_, &canvas, &end)) return false;
        const int duration = std::max(0, end - timestamp_);
        timestamp_ = end;
        if (!frame) return true;
        frame->delay = uint32_t(duration + 5) / 10;
        frame->pixels = AllocatePixels(Width(), Height(), size_);
        if (!frame->pixels) return false;
        std::memcpy(frame->pixels, canvas, size_t(Width()) * Height() * 4);
        return true;
    }

  private:
    WebPAnimDecoder* decoder_ = nullptr;
    int timestamp_ = 0;  // ms, end of the last frame
};

AnimationPtr OpenWebp(const uint8_t* data, size_t size) {
    auto* animation = HeapNew<WebpAnimation>(data, size);
    AnimationPtr owner(animation);
    if (!animation || !animation->Open()) return nullptr;
    return owner;
}

}  // namespace

bool DecodeWebp(const uint8_t* data, size_t size, uint32_t index, DecodedFrame* frame) {
    WebPBitstreamFeatures features;
    if (WebPGetFeatures(data, size, &features) != VP8_STATUS_OK) return false;
    const uint64_t width = uint64_t(features.width), height = uint64_t(features.height);
    if (features.has_animation) return ReadAnimationFrame(OpenWebp, data, size, index, frame);
    frame->width = uint32_t(width), frame->height = uint32_t(height);
    frame->hasAlpha = features.has_alpha;
    if (index > 0) return true;
    frame->pixels = AllocatePixels(width, height, size);
    if (!frame->pixels) return false;
    return WebPDecodeRGBAInto(data, size, frame->pixels, size_t(width * height * 4), int(width) * 4) !=
           nullptr;
}

}  // namespace fresco
