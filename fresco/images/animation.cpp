#include "fresco/images/animation.h"

#include <array>
#include <mutex>

#include "fresco/core/log.h"

namespace fresco {

bool AnimationReader::SetExtent(uint64_t width, uint64_t height, uint64_t frames, uint64_t work) {
    if (width == 0 || height == 0 || frames == 0) return false;
    if (!MayDecode(width, height, size_)) return false;
    // All frames of an animation are decoded before it shows.
    const uint64_t pixels = std::max(work, width * height * frames);
    if (frames > kMaxAnimationFrames || pixels * 4 > kMaxImageBytes ||
        pixels > kFreeAnimationPixels + size_ * kMaxPixelsPerFileByte) {
        FRESCO_WARN("Refusing to decode an animation of %llu frames of %llu x %llu pixels from %llu bytes",
                    static_cast<unsigned long long>(frames), static_cast<unsigned long long>(width),
                    static_cast<unsigned long long>(height), static_cast<unsigned long long>(size_));
        return false;
    }
    width_ = uint32_t(width), height_ = uint32_t(height), frames_ = uint32_t(frames);
    return true;
}

// The readers between two calls. A caller who gives up leaves one behind, so the oldest makes room.
class AnimationShelf {
  public:
    AnimationPtr Take(const uint8_t* data, size_t size, uint32_t index) {
        if (index == 0) return nullptr;
        std::lock_guard lock(mutex_);
        for (AnimationPtr& reader : readers_) {
            if (reader && reader->data_ == data && reader->size_ == size && reader->next_ <= index)
                return std::move(reader);
        }
        return nullptr;
    }

    void Put(AnimationPtr reader) {
        std::lock_guard lock(mutex_);
        readers_[oldest_].swap(reader);
        oldest_ = (oldest_ + 1) % readers_.size();
    }

    void Clear() {
        std::lock_guard lock(mutex_);
        for (AnimationPtr& reader : readers_)
            reader.reset();
    }

    static bool ReadAt(AnimationReader& reader, uint32_t index, DecodedFrame* frame) {
        while (reader.next_ <= index) {
            const bool wanted = reader.next_ == index;
            if (!reader.ReadNext(wanted ? frame : nullptr)) return false;
            ++reader.next_;
        }
        return true;
    }

  private:
    std::mutex mutex_;
    std::array<AnimationPtr, 16> readers_;
    size_t oldest_ = 0;
};

namespace {
AnimationShelf& Shelf() {
    static AnimationShelf shelf;
    return shelf;
}
}  // namespace

bool ReadAnimationFrame(OpenAnimation open, const uint8_t* data, size_t size, uint32_t index,
                        DecodedFrame* frame) {
    AnimationPtr reader = Shelf().Take(data, size, index);
    if (!reader) reader = open(data, size);
    if (!reader) return false;
    frame->width = reader->Width(), frame->height = reader->Height();
    frame->frameCount = reader->FrameCount();
    if (index >= frame->frameCount) return true;
    if (!AnimationShelf::ReadAt(*reader, index, frame)) return false;
    if (index + 1 < frame->frameCount) Shelf().Put(std::move(reader));
    return true;
}

void CloseAnimations() {
    Shelf().Clear();
}

}  // namespace fresco
