#include <webp/decode.h>
#include <webp/demux.h>

#include "fresco/images/decoders.h"

namespace fresco {
namespace {

// The animation that this thread is in the middle of.
struct Animation {
    WebPAnimDecoder* decoder = nullptr;
    const uint8_t* data = nullptr;
    size_t size = 0;
    uint32_t next = 0;
    int timestamp = 0;  // ms, end of the last frame

    ~Animation() { Close(); }
    void Close() {
        WebPAnimDecoderDelete(decoder);
        decoder = nullptr;
    }
};
thread_local Animation t_animation;

bool NextFrame(Animation& animation, const WebPAnimInfo& info, DecodedFrame* frame) {
    uint8_t* canvas = nullptr;
    int end = 0;
    if (!WebPAnimDecoderGetNext(animation.decoder, &canvas, &end)) return false;
    if (frame) {
        frame->pixels = AllocatePixels(info.canvas_width, info.canvas_height);
        if (!frame->pixels) return false;
        std::memcpy(frame->pixels, canvas, size_t(info.canvas_width) * info.canvas_height * 4);
        frame->delay = uint32_t(std::max(0, end - animation.timestamp) + 5) / 10;
    }
    animation.timestamp = end;
    ++animation.next;
    return true;
}

bool DecodeAnimated(const uint8_t* data, size_t size, uint32_t index, DecodedFrame* frame) {
    Animation& animation = t_animation;
    const bool goesOn = animation.decoder && animation.data == data && animation.size == size &&
                        animation.next <= index && index > 0;
    if (!goesOn) {
        animation.Close();
        const WebPData webp{data, size};
        WebPAnimDecoderOptions options;
        if (!WebPAnimDecoderOptionsInit(&options)) return false;
        options.color_mode = MODE_RGBA;
        animation.decoder = WebPAnimDecoderNew(&webp, &options);
        animation.data = data, animation.size = size, animation.next = 0, animation.timestamp = 0;
    }
    WebPAnimInfo info;
    if (!animation.decoder || !WebPAnimDecoderGetInfo(animation.decoder, &info)) return false;
    frame->width = info.canvas_width, frame->height = info.canvas_height;
    frame->frameCount = info.frame_count;
    if (index >= info.frame_count) {
        animation.Close();
        return true;
    }
    while (animation.next < index) {
        if (!NextFrame(animation, info, nullptr)) return animation.Close(), false;
    }
    const bool read = NextFrame(animation, info, frame);
    if (!read || animation.next >= info.frame_count) animation.Close();
    return read;
}

}  // namespace

bool DecodeWebp(const uint8_t* data, size_t size, uint32_t index, DecodedFrame* frame) {
    WebPBitstreamFeatures features;
    if (WebPGetFeatures(data, size, &features) != VP8_STATUS_OK) return false;
    const uint64_t width = uint64_t(features.width), height = uint64_t(features.height);
    if (features.has_animation) {
        // The library takes the canvas twice before we could say no.
        if (width > kMaxImageSide || height > kMaxImageSide || width * height * 4 > kMaxImageBytes) {
            return AllocatePixels(width, height) != nullptr;
        }
        return DecodeAnimated(data, size, index, frame);
    }
    frame->width = uint32_t(width), frame->height = uint32_t(height);
    frame->hasAlpha = features.has_alpha;
    if (index > 0) return true;
    frame->pixels = AllocatePixels(width, height);
    if (!frame->pixels) return false;
    return WebPDecodeRGBAInto(data, size, frame->pixels, size_t(width * height * 4), int(width) * 4) !=
           nullptr;
}

}  // namespace fresco
