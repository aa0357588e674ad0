// How nodes get their images. Implemented by resources; every call and every answer on the script thread of
// the node's document.
#pragma once

#include <fresco/image.h>

#include <cstdint>

#include "core/memory/containers.h"
#include "core/url/url.h"
#include "layout/geometry.h"

namespace qorvex::dom {

class Document;
class Node;

// What nodes see of an image, in the order in which it passes through.
enum class ImageState : uint8_t {
    None = 0,
    Loading = 1,
    Decoding = 2,
    Decoded = 3,  // described, and drawn from here on: the frame that draws it first uploads it
    OnGPU = 4,
    LoadFailed = 5,
    DecodeFailed = 6,
};

inline constexpr uint32_t kNoImageResource = 0xFFFFFFFF;

struct ImageFrame {
    uint32_t resource = kNoImageResource;
    double duration = 0;  // milliseconds, never 0
};

// What goes to the nodes with each state. Never changed once it is given out; held by count, on any thread.
struct ImageInfo : AtomicRefCounted<ImageInfo, MemoryTag::Rendering> {
    // The rendering library's name of a still image.
    uint32_t resource = kNoImageResource;
    // Without pixels.
    fresco::Image description;
    // The part of a client's own image that shows; empty for the whole.
    layout::Rect content{};
    // Of an animated image, two or more.
    Vector<ImageFrame, MemoryTag::Rendering> frames;

    bool IsAnimated() const { return !frames.empty(); }
    bool HasResource() const { return IsAnimated() || resource != kNoImageResource; }
    uint32_t FirstResource() const { return IsAnimated() ? frames[0].resource : resource; }
    layout::Size NaturalSize() const {
        if (content.width > 0 && content.height > 0) return {content.width, content.height};
        return {static_cast<float>(description.width), static_cast<float>(description.height)};
    }
};

using ImageInfoPtr = RefPtr<const ImageInfo>;

class IImageLoader {
  public:
    virtual ~IImageLoader() = default;

    // Another use of the image at the absolute `url` by `node`; uses are counted, and each one ends with
    // UnregisterImage. Writes the image's id, then tells the node of every state that the image has passed
    // through, and later of each new one, by Node::OnImageLoaded. A node that asks first is not told of
    // Loading.
    virtual void RegisterImage(const URL& url, Node& node, uint32_t* id) = 0;
    // The node may be in its destructor.
    virtual void UnregisterImage(uint32_t id, const Node& node) = 0;
    // All uses by nodes of this document end, also by those that outlive it.
    virtual void ForgetDocument(const Document& document) = 0;
};

// A parsed vector image; what it is made of is known where it is drawn. Never changed once it is given out.
class SVGImage : public AtomicRefCounted<SVGImage, MemoryTag::Resources> {
  public:
    virtual ~SVGImage() = default;
    // Of the parsed data, for the cache's limits.
    virtual uint64_t GetBytes() const = 0;
};

using SVGImagePtr = RefPtr<const SVGImage>;

// The same for vector images. The one answer comes by Node::OnSVGLoaded, with null for a failure; inside
// RegisterSVG when it is known already.
class ISVGLoader {
  public:
    virtual ~ISVGLoader() = default;
    virtual void RegisterSVG(const URL& url, Node& node, uint32_t* id) = 0;
    virtual void UnregisterSVG(uint32_t id, const Node& node) = 0;
    virtual void ForgetDocument(const Document& document) = 0;
};

}  // namespace qorvex::dom
