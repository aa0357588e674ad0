// Effects: what a layer or a fill goes through. An `Effect` is immutable and counted; recording copies it
// into the stream, so it may be released right after the call that took it.
#pragma once
#include <fresco/paint.h>
#include <cstddef>

namespace fresco {

enum class EffectKind : uint32_t {
    LinearGradient = 1,
    RadialGradient = 2,
    Pattern = 3,
    Filter = 4,
    Blend = 5,
    Custom = 6,
};

class Effect {
  public:
    virtual void AddRef() = 0;
    virtual void Release() = 0;
    virtual EffectKind GetKind() const = 0;
    // The record as it goes into the stream; see command_records.h.
    virtual const void* GetData() const = 0;
    virtual uint32_t GetDataSize() const = 0;

  protected:
    ~Effect() = default;
};

enum class FilterKind : uint32_t {
    Blur = 1,        // standard deviation
    AxisBlur = 2,    // standard deviation in x, in y
    Brightness = 3,  // amount, as the six below
    Contrast = 4,
    DropShadow = 5,  // offset x, offset y, standard deviation, then r, g, b, a
    Grayscale = 6,
    HueRotate = 7,  // degrees
    Invert = 8,
    Opacity = 9,
    Saturate = 10,
    Sepia = 11,
    ColorMatrix = 12,  // 4 rows of 5: r, g, b, a and constant, on colours that are not premultiplied
};

// 84 bytes. Lengths are in units of the transform that is current where the layer begins.
struct FilterRecord {
    uint32_t kind = 0;
    float values[20] = {};
};
static_assert(sizeof(FilterRecord) == 84, "filter records have a fixed size");

enum PatternSource : uint32_t { kPatternImage, kPatternSurface };
enum PatternRepeat : uint32_t { kRepeatBoth, kRepeatX, kRepeatY, kRepeatNone };

struct PatternGeometry {
    uint32_t source = kPatternImage;  // PatternSource
    uint32_t id = kNoId;
    uint32_t repeat = kRepeatBoth;  // PatternRepeat
    Rect tile;                      // where the first tile lies; width 0: the source's own size
};

// Makes effects. One per thread: the objects may travel, the factory may not.
class IEffectFactory {
  public:
    virtual ~IEffectFactory() = default;
    virtual Effect* CreateLinearGradient(const LinearGradient& geometry, const GradientStop* stops,
                                         uint32_t count) = 0;
    virtual Effect* CreateRadialGradient(const RadialGradient& geometry, const GradientStop* stops,
                                         uint32_t count) = 0;
    virtual Effect* CreatePattern(const PatternGeometry& geometry) = 0;
    // Null when a number is not finite; layers leave null effects out.
    virtual Effect* CreateFilter(const FilterRecord* filters, uint32_t count) = 0;
    virtual Effect* CreateBlend(uint32_t blend) = 0;
    virtual Effect* CreateCustom(const char* name, const float params[4], const char* text1,
                                 const char* text2) = 0;
};

// The calling thread's factory.
IEffectFactory* GetEffectFactory();

}  // namespace fresco
