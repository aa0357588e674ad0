// GIF: frames are painted on a canvas one after the other. https://www.w3.org/Graphics/GIF/spec-gif89a.txt
#include <gif_lib.h>

#include "fresco/images/animation.h"

namespace fresco {
namespace {

// What a walk over the blocks tells without unpacking any.
struct GifExtent {
    bool begins = false;  // the first frame does, at least
    uint32_t frames = 0;  // that are wholly there
    uint64_t pixels = 0;  // of all; a frame may be larger than the canvas, which cuts it
};

GifExtent MeasureGif(const uint8_t* data, size_t size) {
    GifExtent extent;
    if (size < 13) return extent;
    size_t at = 13;
    const auto tableSize = [](uint8_t flags) { return flags & 0x80 ? size_t(3) << ((flags & 7) + 1) : 0; };
    at += tableSize(data[10]);
    const auto skipBlocks = [&] {
        while (at < size && data[at] != 0)
            at += size_t(data[at]) + 1;
        return at++ < size;
    };
    const auto word = [&](size_t offset) { return uint64_t(data[offset]) | uint64_t(data[offset + 1]) << 8; };
    while (at < size && data[at] != 0x3B) {
        if (data[at] == 0x2C) {
            if (size - at < 11) break;
            extent.begins = true;
            extent.pixels += word(at + 5) * word(at + 7);
            at += 10 + tableSize(data[at + 9]) + 1;
            if (!skipBlocks()) break;
            ++extent.frames;
        } else if (data[at] == 0x21) {
            at += 2;
            if (!skipBlocks()) break;
        } else {
            break;
        }
    }
    return extent;
}

class GifAnimation final : public AnimationReader {
  public:
    using AnimationReader::AnimationReader;
    ~GifAnimation() override {
        int error = 0;
        if (file_) DGifCloseFile(file_, &error);
    }
    bool Open();
    bool ReadNext(DecodedFrame* frame) override;

  private:
    static int ReadBytes(GifFileType* file, GifByteType* out, int count);
    bool PaintFrame(const GraphicsControlBlock& control);
    void Dispose();
    bool GiveFrame(DecodedFrame* frame) const;

    GifFileType* file_ = nullptr;
    size_t at_ = 0;
    bool painted_ = false;
    Vector<uint32_t> canvas_, restore_;
    Vector<uint8_t> line_;
    int disposal_ = 0;
    int left_ = 0, top_ = 0, right_ = 0, bottom_ = 0;  // of the last frame, within the canvas
};

int GifAnimation::ReadBytes(GifFileType* file, GifByteType* out, int count) {
    auto* self = static_cast<GifAnimation*>(file->UserData);
    const size_t read = std::min(size_t(count), self->size_ - self->at_);
    std::memcpy(out, self->data_ + self->at_, read);
    self->at_ += read;
    return int(read);
}

bool GifAnimation::Open() {
    int error = 0;
    file_ = DGifOpen(this, ReadBytes, &error);
    if (!file_) return false;
    const GifExtent extent = MeasureGif(data_, size_);
    if (!extent.begins) return false;  // a few bytes shall not cost a large canvas
    // A file that is cut within its first frame shows what there is of it.
    const uint32_t frames = std::max(1u, extent.frames);
    if (!SetExtent(uint64_t(std::max(0, file_->SWidth)), uint64_t(std::max(0, file_->SHeight)), frames,
                   extent.pixels))
        return false;
    canvas_.assign(size_t(Width()) * Height(), 0);
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
    // The library's list of all frames so far, which it copies for each one.
    GifFreeSavedImages(file_);
    file_->ImageCount = 0;
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

bool GifAnimation::GiveFrame(DecodedFrame* frame) const {
    frame->pixels = AllocatePixels(Width(), Height(), size_);
    if (!frame->pixels) return false;
    std::memcpy(frame->pixels, canvas_.data(), canvas_.size() * 4);
    return true;
}

bool GifAnimation::ReadNext(DecodedFrame* frame) {
    GraphicsControlBlock control = {DISPOSAL_UNSPECIFIED, false, 0, NO_TRANSPARENT_COLOR};
    for (;;) {
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
            const bool whole = PaintFrame(control);
            if (!whole && (painted_ || right_ == left_)) return false;
            painted_ = true;
            if (!frame) return true;
            frame->delay = uint32_t(std::max(0, control.DelayTime));
            return GiveFrame(frame);
        }
    }
}

AnimationPtr OpenGif(const uint8_t* data, size_t size) {
    auto* animation = HeapNew<GifAnimation>(data, size);
    AnimationPtr owner(animation);
    if (!animation || !animation->Open()) return nullptr;
    return owner;
}

}  // namespace

bool DecodeGif(const uint8_t* data, size_t size, uint32_t index, DecodedFrame* frame) {
    return ReadAnimationFrame(OpenGif, data, size, index, frame);
}

}  // namespace fresco
