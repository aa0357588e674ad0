// Where the colour of a covered pixel comes from. Sources answer for rows of device pixels and depend on the
// pixel's position alone, so that a partial repaint fetches what a full one does.
#pragma once
#include "fresco/cpu/resources.h"
#include "fresco/cpu/rows.h"
#include "fresco/paths/matrix.h"

namespace fresco::cpu {

class PixelSource {
  public:
    // A row of premultiplied pixels, opacity included: in `room`, or wherever the source has them already.
    virtual const uint32_t* Fetch(int x, int y, int count, uint32_t* room) = 0;
    // True when the whole row is of one colour.
    virtual bool RowColor(int, uint32_t*) { return false; }

  protected:
    ~PixelSource() = default;
};

// Colours along the gradient line, about two a device pixel, and those before and beyond it.
struct GradientTable {
    static constexpr int kMinSize = 64, kMaxSize = 2048;
    Vector<uint32_t> colors;
    // `length` of the gradient line in device pixels.
    void Build(const GradientStop* stops, uint32_t count, float opacity, double length);
};

class GradientSource final : public PixelSource {
  public:
    // The transforms take device pixels to the plane that the geometry is in. `table` is the source's own
    // until it goes.
    GradientSource(const LinearGradient& geometry, const Homography& toPlane, GradientTable& table);
    GradientSource(const RadialGradient& geometry, const Homography& toPlane, GradientTable& table);
    // Before the first Fetch.
    void SetStops(const GradientStop* stops, uint32_t count, float opacity);
    const uint32_t* Fetch(int x, int y, int count, uint32_t* room) override;
    bool RowColor(int y, uint32_t* color) override;

  private:
    GradientWalk WalkOf(int y) const;
    uint32_t Lookup(double t) const;
    void FetchProjected(int x, int y, int count, uint32_t* out) const;

    Homography toUnit_;  // linear: X is the parameter; radial: the distance from 0 is
    bool radial_ = false;
    uint32_t spread_ = kSpreadPad;
    GradientTable& table_;
    Vector<uint32_t> row_;  // of a gradient that runs along rows: all are equal
    int rowX_ = 0;
};

// A picture under a transform, bilinear. With a period it repeats.
class ImageSource final : public PixelSource {
  public:
    struct Placement {
        Rect source;  // in texels; width 0: all
        Rect target;  // where the source goes, in the user's plane
        bool repeatX = false, repeatY = false;
        float spacingX = 0, spacingY = 0;  // between repeats, in the user's plane
    };
    ImageSource(Resources& resources, Texture& texture, const Placement& placement, const Homography& toPlane,
                float opacity);
    const uint32_t* Fetch(int x, int y, int count, uint32_t* room) override;

  private:
    // One direction of the source, in texels of the level.
    struct Axis {
        double begin, end;   // may lie between texels
        int first, last;     // texels that the source touches
        double period = 0;   // 0: no repeat
        bool wraps = false;  // repeats meet: filter across the seam

        // The lower one of two texels, from first - 1 to last, and the weight of the other one in 256ths.
        // False in the gap between two repeats.
        bool Locate(double at, int* low, uint32_t* weight) const;
        // A texel for each index from first - 1 to last + 1.
        int Texel(int index) const;
    };

    void FetchTurned(int x, int y, int count, uint32_t* out);
    void FetchUpright(int x, int y, int count, uint32_t* out);
    void LocateColumns(int x, int y, int count);
    const uint32_t* MixedRow(int y);
    bool FindAligned(int u, int v, int count, const uint32_t** row) const;

    const PixelBuffer* level_ = nullptr;
    Homography toTexels_;
    Axis u_, v_;
    uint32_t alpha_ = 255;
    bool aligned_ = false;

    // Columns of the rows so far, from columnsX_ on, as offsets into mixed_. That holds the texels from
    // mixedFirst_ on, blended from two rows, and two blank ones for gaps.
    Vector<int32_t> offsets_;
    Vector<ColumnSample> samples_;
    int columnsX_ = 0;
    Vector<uint32_t> mixed_;
    int mixedFirst_ = 0, mixedCount_ = 0, mixedY_ = 0;
    bool hasMixed_ = false;
    Vector<TexelSample> texels_;  // of a row under a turn or a perspective
};

// Another source where the user's point lies in a target's row, column or rectangle, and nothing elsewhere.
class WindowSource final : public PixelSource {
  public:
    WindowSource(PixelSource& inner, const Homography& toPlane, const ImageSource::Placement& placement)
        : inner_(inner), toPlane_(toPlane), placement_(placement) {}
    const uint32_t* Fetch(int x, int y, int count, uint32_t* room) override;

  private:
    PixelSource& inner_;
    Homography toPlane_;
    ImageSource::Placement placement_;
};

// Y, U, V and perhaps alpha planes, BT.601 limited range.
class YuvSource final : public PixelSource {
  public:
    YuvSource(const Texture* const planes[4], const Rect& target, const Homography& toPlane, float opacity);
    const uint32_t* Fetch(int x, int y, int count, uint32_t* room) override;

  private:
    const Texture* planes_[4];
    Homography toUnit_;
    float opacity_;
};

}  // namespace fresco::cpu
