// Shapes of clip-path. A shape is immutable once parsed and counted atomically, since the render side reads
// it.
#pragma once

#include <array>
#include <cstdint>
#include <utility>

#include "css/values/box_values.h"
#include "css/values/css_containers.h"
#include "css/values/keywords.h"
#include "css/values/length.h"
#include "css/values/shared_value.h"
#include "css/values/svg_path_data.h"

namespace qorvex::css {

enum class ShapeKind : uint8_t { Inset = 0, Circle = 1, Ellipse = 2, Polygon = 3, Path = 4 };

class BasicShape : public SharedValue<BasicShape> {
  public:
    virtual ~BasicShape() = default;

    ShapeKind kind() const { return kind_; }
    virtual bool SameAs(const BasicShape& other) const = 0;
    virtual void AppendText(CssString& out) const = 0;

  protected:
    explicit BasicShape(ShapeKind kind) : kind_(kind) {}

  private:
    const ShapeKind kind_;
};

// Offsets run top, right, bottom, left; radii top-left, top-right, bottom-right, bottom-left.
class InsetShape final : public BasicShape {
  public:
    InsetShape() : BasicShape(ShapeKind::Inset) {}
    bool SameAs(const BasicShape& other) const override;
    void AppendText(CssString& out) const override;

    std::array<Length, 4> offsets;
    std::array<BorderRadius, 4> radii;
};

enum class ShapeRadiusKind : uint8_t { ClosestSide, FarthestSide, Length };

struct ShapeRadius {
    ShapeRadiusKind kind = ShapeRadiusKind::ClosestSide;
    Length length;
    friend bool operator==(const ShapeRadius&, const ShapeRadius&) = default;
};

class CircleShape final : public BasicShape {
  public:
    CircleShape() : BasicShape(ShapeKind::Circle) {}
    bool SameAs(const BasicShape& other) const override;
    void AppendText(CssString& out) const override;

    ShapeRadius radius;
    Length centerX = Length::Percent(50);
    Length centerY = Length::Percent(50);
};

class EllipseShape final : public BasicShape {
  public:
    EllipseShape() : BasicShape(ShapeKind::Ellipse) {}
    bool SameAs(const BasicShape& other) const override;
    void AppendText(CssString& out) const override;

    ShapeRadius radiusX, radiusY;
    Length centerX = Length::Percent(50);
    Length centerY = Length::Percent(50);
};

class PolygonShape final : public BasicShape {
  public:
    PolygonShape() : BasicShape(ShapeKind::Polygon) {}
    bool SameAs(const BasicShape& other) const override;
    void AppendText(CssString& out) const override;

    struct Point {
        Length x, y;
        friend bool operator==(const Point&, const Point&) = default;
    };
    FillRule fillRule = FillRule::NonZero;
    CssVector<Point> points;
};

class PathShape final : public BasicShape {
  public:
    PathShape() : BasicShape(ShapeKind::Path) {}
    bool SameAs(const BasicShape& other) const override;
    void AppendText(CssString& out) const override;

    CssString text;  // as written, without quotes
    SvgPathData data;
};

struct ClipPathType {
    bool hasBox = false;
    ClipBox box = ClipBox::BorderBox;
    RefPtr<const BasicShape> shape;

    bool IsNone() const { return !hasBox && !shape; }
    friend bool operator==(const ClipPathType& a, const ClipPathType& b) {
        if (a.hasBox != b.hasBox || (a.hasBox && a.box != b.box)) return false;
        return a.shape == b.shape || (a.shape && b.shape && a.shape->SameAs(*b.shape));
    }
};

}  // namespace qorvex::css
