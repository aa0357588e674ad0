// Where the colour of a covered pixel comes from. Sources answer for rows of device pixels and depend on the
// pixel's position alone, so that a partial repaint fetches what a full one does.
#pragma once
#include "fresco/cpu/resources.h"
#include "fresco/paths/matrix.h"

namespace fresco::cpu {

class PixelSource {
  public:
    // Premultiplied, opacity included.
    virtual void Fetch(int x, int y, int count, uint32_t* out) = 0;

  protected:
    ~PixelSource() = default;
};

// 1024 colours along the gradient line.
struct GradientTable {
    static constexpr int kSize = 1024;
    uint32_t colors[kSize];
    void Build(const GradientStop* stops, uint32_t count, float opacity);
};

class GradientSource final : public PixelSource {
  public:
    // The transforms take device pixels to the plane that the geometry is in.
    GradientSource(const LinearGradient& geometry, const Homography& toPlane, const GradientTable& table);
    GradientSource(const RadialGradient& geometry, const Homography& toPlane, const GradientTable& table);
    void Fetch(int x, int y, int count, uint32_t* out) override;

  private:
    uint32_t Lookup(double t) const;

    Homography toUnit_;  // linear: X is the parameter; radial: the distance from 0 is
    bool radial_ = false;
    uint32_t spread_ = kSpreadPad;
    const GradientTable& table_;
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
    ImageSource(Texture& texture, const Placement& placement, const Homography& toPlane, float opacity);
    void Fetch(int x, int y, int count, uint32_t* out) override;

  private:
    uint32_t Sample(double u, double v) const;
    void FetchClamped(int x, int y, int count, uint32_t* out);
    void FetchAligned(int u, int v, int count, uint32_t* out) const;

    struct Axis {
        int low, high;  // the two texels
        uint32_t weight;
    };
    Vector<Axis> columns_;  // of the last row, from columnsX_ on
    int columnsX_ = 0;
    const PixelBuffer* level_ = nullptr;
    Homography toTexels_;
    double left_, top_, right_, bottom_;  // of the source in texels of the level
    double periodX_ = 0, periodY_ = 0;    // in texels of the level; 0: no repeat
    bool wrapX_ = false, wrapY_ = false;  // repeats meet: filter across the seam
    uint32_t alpha_ = 255;
    bool aligned_ = false;
};

// Another source where the user's point lies in a target's row, column or rectangle, and nothing elsewhere.
class WindowSource final : public PixelSource {
  public:
    WindowSource(PixelSource& inner, const Homography& toPlane, const ImageSource::Placement& placement)
        : inner_(inner), toPlane_(toPlane), placement_(placement) {}
    void Fetch(int x, int y, int count, uint32_t* out) override;

  private:
    PixelSource& inner_;
    Homography toPlane_;
    ImageSource::Placement placement_;
};

// Y, U, V and perhaps alpha planes, BT.601 limited range.
class YuvSource final : public PixelSource {
  public:
    YuvSource(const Texture* const planes[4], const Rect& target, const Homography& toPlane, float opacity);
    void Fetch(int x, int y, int count, uint32_t* out) override;

  private:
    const Texture* planes_[4];
    Homography toUnit_;
    float opacity_;
};

}  // namespace fresco::cpu
