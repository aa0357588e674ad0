// GIF: frames are painted on a canvas one after the other. https://www.w3.org/Graphics/GIF/spec-gif89a.txt
#include <gif_lib.h>

#include "fresco/core/heap.h"
#include "fresco/images/decoders.h"

namespace fresco {
namespace {

// Frames that are wholly there, from a walk over the blocks; 0 for what is no GIF.
uint32_t CountFrames(const uint8_t* data, size_t size) {
    if (size < 13) return 0;
    size_t at = 13;
    const auto tableSize = [](uint8_t flags) { return flags & 0x80 ? size_t(3) << ((flags & 7) + 1) : 0; };
    at += tableSize(data[10]);
    uint32_t frames = 0;
    const auto skipBlocks = [&] {
        while (at < size && data[at] != 0)
            at += size_t(data[at]) + 1;
        return at++ < size;
    };
    while (at < size && data[at] != 0x3B) {
        if (data[at] == 0x2C) {
            if (size - at < 11) break;
            at += 10 + tableSize(data[at + 9]) + 1;
            if (!skipBlocks()) break;
            ++frames;
        } else if (data[at] == 0x21) {
            at += 2;
            if (!skipBlocks()) break;
        } else {
            break;
        }
    }
    return frames;
}

// The animation that this thread is in the middle of.
class GifAnimation {
  public:
    ~GifAnimation() { Close(); }

    bool Continues(const uint8_t* data, size_t size, uint32_t index) const {
        return file_ && data_ == data && size_ == size && index > 0 && next_ <= index;
    }
    bool Open(const uint8_t* data, size_t size);
    // Paints frames up to and with `index`.
    bool Advance(uint32_t index, DecodedFrame* frame);
    void Close();

  private:
    static int ReadBytes(GifFileType* file, GifByteType* out, int count);
    bool PaintFrame(const GraphicsControlBlock& control);
    void Dispose();

    GifFileType* file_ = nullptr;
    const uint8_t* data_ = nullptr;
    size_t size_ = 0, at_ = 0;
    uint32_t next_ = 0;
    uint32_t delay_ = 0;
    Vector<uint32_t> canvas_, restore_;
    Vector<uint8_t> line_;
    int disposal_ = 0;
    int left_ = 0, top_ = 0, right_ = 0, bottom_ = 0;  // of the last frame, within the canvas
};
thread_local GifAnimation t_animation;

int GifAnimation::ReadBytes(GifFileType* file, GifByteType* out, int count) {
    auto* self = static_cast<GifAnimation*>(file->UserData);
    const size_t read = std::min(size_t(count), self->size_ - self->at_);
    std::memcpy(out, self->data_ + self->at_, read);
    self->at_ += read;
    return int(read);
}

void GifAnimation::Close() {
    int error = 0;
    if (file_) DGifCloseFile(file_, &error);
    file_ = nullptr;
    // Emptied alone, the thread would keep the memory, and past the end of the client's allocator.
    Vector<uint32_t>().swap(canvas_);
    Vector<uint32_t>().swap(restore_);
    Vector<uint8_t>().swap(line_);
}

bool GifAnimation::Open(const uint8_t* data, size_t size) {
    Close();
    data_ = data, size_ = size, at_ = 0, next_ = 0, disposal_ = 0;
    left_ = top_ = right_ = bottom_ = 0;
    int error = 0;
    file_ = DGifOpen(this, ReadBytes, &error);
    if (!file_) return false;
    const uint64_t width = uint64_t(file_->SWidth), height = uint64_t(file_->SHeight);
    if (width == 0 || height == 0 || width > kMaxImageSide || height > kMaxImageSide ||
        width * height * 4 > kMaxImageBytes) {
        FreePixels(AllocatePixels(width, height));  // says why
        Close();
        return false;
    }
    canvas_.assign(size_t(width * height), 0);
    return true;
}

void GifAnimation::Dispose() {
    const size_t width = size_t(file_->SWidth);
    if (disposal_ == DISPOSE_BACKGROUND) {
        for (int y = top_; y < bottom_; ++y) {
            std::fill_n(canvas_.data() + size_t(y) * width + size_t(left_),
                        size_t(std::max(0, right_ - left_)), 0u);
        }
    } else if (disposal_ == DISPOSE_PREVIOUS && !restore_.empty()) {
        canvas_ = restore_;
    }
}

bool GifAnimation::PaintFrame(const GraphicsControlBlock& control) {
    if (DGifGetImageDesc(file_) == GIF_ERROR) return false;
    const GifImageDesc& image = file_->Image;
    const ColorMapObject* map = image.ColorMap ? image.ColorMap : file_->SColorMap;
    if (image.Width <= 0 || image.Height <= 0 || image.Width > int(kMaxImageSide) ||
        image.Height > int(kMaxImageSide))
        return false;
    Dispose();
    if (control.DisposalMode == DISPOSE_PREVIOUS) restore_ = canvas_;
    disposal_ = control.DisposalMode;
    left_ = std::clamp(image.Left, 0, file_->SWidth), top_ = std::clamp(image.Top, 0, file_->SHeight);
    right_ = std::clamp(image.Left + image.Width, 0, file_->SWidth);
    bottom_ = std::clamp(image.Top + image.Height, 0, file_->SHeight);
    line_.resize(size_t(image.Width));
    constexpr int kOffset[] = {0, 4, 2, 1}, kStep[] = {8, 8, 4, 2};
    for (int pass = 0; pass < (image.Interlace ? 4 : 1); ++pass) {
        const int first = image.Interlace ? kOffset[pass] : 0, step = image.Interlace ? kStep[pass] : 1;
        for (int row = first; row < image.Height; row += step) {
            if (DGifGetLine(file_, line_.data(), image.Width) == GIF_ERROR) return false;
            const int y = image.Top + row;
            if (y < top_ || y >= bottom_ || !map) continue;
            uint32_t* out = canvas_.data() + size_t(y) * size_t(file_->SWidth);
            for (int x = left_; x < right_; ++x) {
                const int index = line_[size_t(x - image.Left)];
                if (index == control.TransparentColor || index >= map->ColorCount) continue;
                const GifColorType& c = map->Colors[index];
                out[x] = uint32_t(c.Red) | uint32_t(c.Green) << 8 | uint32_t(c.Blue) << 16 | 0xFF000000u;
            }
        }
    }
    return true;
}

bool GifAnimation::Advance(uint32_t index, DecodedFrame* frame) {
    GraphicsControlBlock control = {DISPOSAL_UNSPECIFIED, false, 0, NO_TRANSPARENT_COLOR};
    while (next_ <= index) {
        GifRecordType type;
        if (DGifGetRecordType(file_, &type) == GIF_ERROR || type == TERMINATE_RECORD_TYPE) return false;
        if (type == EXTENSION_RECORD_TYPE) {
            int code = 0;
            GifByteType* block = nullptr;
            if (DGifGetExtension(file_, &code, &block) == GIF_ERROR) return false;
            if (code == GRAPHICS_EXT_FUNC_CODE && block) DGifExtensionToGCB(block[0], block + 1, &control);
            while (block) {
                if (DGifGetExtensionNext(file_, &block) == GIF_ERROR) return false;
            }
        } else if (type == IMAGE_DESC_RECORD_TYPE) {
            // A cut first frame shows what there is of it.
            const bool whole = PaintFrame(control);
            if (!whole && (next_ > 0 || right_ == left_)) return false;
            delay_ = uint32_t(std::max(0, control.DelayTime));
            control = {DISPOSAL_UNSPECIFIED, false, 0, NO_TRANSPARENT_COLOR};
            ++next_;
            if (!whole) break;
        }
    }
    frame->width = uint32_t(file_->SWidth), frame->height = uint32_t(file_->SHeight);
    frame->delay = delay_;
    frame->pixels = AllocatePixels(frame->width, frame->height);
    if (!frame->pixels) return false;
    std::memcpy(frame->pixels, canvas_.data(), canvas_.size() * 4);
    return true;
}

}  // namespace

bool DecodeGif(const uint8_t* data, size_t size, uint32_t index, DecodedFrame* frame) {
    GifAnimation& animation = t_animation;
    const uint32_t frames = std::max(1u, CountFrames(data, size));
    frame->frameCount = frames;
    if (index >= frames) {
        animation.Close();
        return true;
    }
    if (!animation.Continues(data, size, index) && !animation.Open(data, size)) return false;
    const bool read = animation.Advance(index, frame);
    if (!read || index + 1 >= frames) animation.Close();
    return read;
}

}  // namespace fresco
