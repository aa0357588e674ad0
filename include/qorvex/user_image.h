// An image that the client made itself, given in place of bytes.
#pragma once

#include <cstdint>

namespace qorvex {

// The record is copied by IAsyncResourceResponse::RecieveUserImage; the image object that Texture names stays
// the client's and must live until the page no longer shows it.
struct UserImageData {
    std::uint32_t Width = 0;  // pixels
    std::uint32_t Height = 0;
    // The part of the image that shows: left, top, width, height in pixels. All zero means the whole.
    std::uint32_t ContentRect[4] = {0, 0, 0, 0};
    // The client's own id, for System::UserImagesChanged. 0: the image never changes.
    std::uint32_t UserImageId = 0;
    std::uint32_t Format = 0;  // a fresco::PixelFormat; 0 is RGBA8
    // The client's image object as the rendering back end takes it; for the CPU back end a fresco::UserImage.
    void* Texture = nullptr;
    bool PlainPixels = false;  // true: Texture points at the pixels themselves, which never change
    bool TopDown = true;       // false: the last row comes first
};

}  // namespace qorvex
