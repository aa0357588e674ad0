// Path and AnimatedPath: command checks and arc geometry on top of PathData.
#include <fresco/path.h>

#include "fresco/commands/finite.h"
#include "fresco/paths/path_data.h"

namespace fresco {
namespace {

constexpr float kPi = 3.14159265358979f;

uint64_t HashBytes(uint64_t hash, const void* data, size_t size) {
    // FNV-1a over words: points are compared bit by bit, so that -0 and 0 merely miss each other in a cache.
    const auto* bytes = static_cast<const uint8_t*>(data);
    size_t i = 0;
    for (; i + 4 <= size; i += 4) {
        uint32_t word;
        std::memcpy(&word, bytes + i, 4);
        hash = (hash ^ word) * 0x100000001B3ull;
        hash ^= hash >> 29;
    }
    for (; i < size; ++i)
        hash = (hash ^ bytes[i]) * 0x100000001B3ull;
    return hash;
}

class PathImpl final : public Path {
  public:
    void AddRef() override { references_.fetch_add(1, std::memory_order_relaxed); }
    void Release() override {
        if (references_.fetch_sub(1, std::memory_order_acq_rel) == 1) HeapDelete(this);
    }

    void MoveTo(float x, float y) override {
        if (!Finite(x, y)) return;
        data_.MoveTo({x, y});
        start_ = current_ = {x, y};
        hasCurrent_ = true;
    }
    void LineTo(float x, float y) override {
        if (!Finite(x, y) || !Ensure(x, y)) return;
        data_.LineTo({x, y});
        current_ = {x, y};
    }
    void QuadraticCurveTo(float cx, float cy, float x, float y) override {
        if (!Finite(cx, cy, x, y)) return;
        Ensure(cx, cy);
        data_.QuadTo({cx, cy}, {x, y});
        current_ = {x, y};
    }
    void BezierCurveTo(float c1x, float c1y, float c2x, float c2y, float x, float y) override {
        if (!Finite(c1x, c1y, c2x, c2y) || !Finite(x, y)) return;
        Ensure(c1x, c1y);
        data_.CubicTo({c1x, c1y}, {c2x, c2y}, {x, y});
        current_ = {x, y};
    }
    // https://html.spec.whatwg.org/multipage/canvas.html#dom-context-2d-arcto
    void ArcTo(float x1, float y1, float x2, float y2, float radius) override {
        if (!Finite(x1, y1, x2, y2) || !Finite(radius) || radius < 0) return;
        Ensure(x1, y1);
        const double ax = current_.x - x1, ay = current_.y - y1, bx = x2 - x1, by = y2 - y1;
        const double la = std::hypot(ax, ay), lb = std::hypot(bx, by);
        const double cross = ax * by - ay * bx;
        if (la < 1e-6 || lb < 1e-6 || radius == 0 || std::abs(cross) < 1e-6 * la * lb) return LineTo(x1, y1);
        const double cosine = (ax * bx + ay * by) / (la * lb);
        const double tangent = radius / std::tan(std::acos(std::clamp(cosine, -1.0, 1.0)) / 2);
        const double px = x1 + ax / la * tangent, py = y1 + ay / la * tangent;
        const double qx = x1 + bx / lb * tangent, qy = y1 + by / lb * tangent;
        const double side = cross > 0 ? 1 : -1;
        const double cx = px + -ay / la * radius * side, cy = py + ax / la * radius * side;
        const double a0 = std::atan2(py - cy, px - cx);
        double sweep = std::atan2(qy - cy, qx - cx) - a0;
        while (sweep > kPi)
            sweep -= 2 * kPi;
        while (sweep < -kPi)
            sweep += 2 * kPi;
        LineTo(float(px), float(py));
        data_.AddArc({float(cx), float(cy)}, radius, radius, 0, float(a0), float(sweep));
        current_ = {float(qx), float(qy)};
    }
    void Arc(float cx, float cy, float radius, float start, float end, bool counterClockwise) override {
        Ellipse(cx, cy, radius, radius, 0, start, end, counterClockwise);
    }
    void Ellipse(float cx, float cy, float rx, float ry, float rotation, float start, float end,
                 bool counterClockwise) override {
        if (!Finite(cx, cy, rx, ry) || !Finite(rotation, start, end) || rx < 0 || ry < 0) return;
        float sweep = end - start;
        if (counterClockwise) {
            sweep = sweep <= -2 * kPi ? -2 * kPi : std::fmod(sweep, 2 * kPi);
            if (sweep > 0) sweep -= 2 * kPi;
        } else {
            sweep = sweep >= 2 * kPi ? 2 * kPi : std::fmod(sweep, 2 * kPi);
            if (sweep < 0) sweep += 2 * kPi;
        }
        const Point first = OnEllipse(cx, cy, rx, ry, rotation, start);
        if (hasCurrent_)
            LineTo(first.x, first.y);
        else
            MoveTo(first.x, first.y);
        if (sweep == 0) return;
        data_.AddArc({cx, cy}, rx, ry, rotation, start, sweep);
        current_ = OnEllipse(cx, cy, rx, ry, rotation, start + sweep);
    }
    // https://www.w3.org/TR/SVG11/implnote.html#ArcConversionEndpointToCenter
    void SvgArcTo(float rx, float ry, float rotation, bool largeArc, bool sweep, float x, float y) override {
        if (!Finite(rx, ry, rotation) || !Finite(x, y)) return;
        Ensure(x, y);
        double a = std::abs(rx), b = std::abs(ry);
        if (a == 0 || b == 0 || (x == current_.x && y == current_.y)) return LineTo(x, y);
        const double phi = double(rotation) * kPi / 180, c = std::cos(phi), s = std::sin(phi);
        const double dx = (double(current_.x) - x) / 2, dy = (double(current_.y) - y) / 2;
        const double x1 = c * dx + s * dy, y1 = -s * dx + c * dy;
        const double lambda = x1 * x1 / (a * a) + y1 * y1 / (b * b);
        if (lambda > 1) a *= std::sqrt(lambda), b *= std::sqrt(lambda);
        const double top = a * a * b * b - a * a * y1 * y1 - b * b * x1 * x1;
        const double factor = std::sqrt(std::max(0.0, top / (a * a * y1 * y1 + b * b * x1 * x1))) *
                              (largeArc == sweep ? -1 : 1);
        const double cx1 = factor * a * y1 / b, cy1 = -factor * b * x1 / a;
        const double cx = c * cx1 - s * cy1 + (double(current_.x) + x) / 2;
        const double cy = s * cx1 + c * cy1 + (double(current_.y) + y) / 2;
        const double start = std::atan2((y1 - cy1) / b, (x1 - cx1) / a);
        double delta = std::atan2((-y1 - cy1) / b, (-x1 - cx1) / a) - start;
        if (sweep && delta < 0) delta += 2 * kPi;
        if (!sweep && delta > 0) delta -= 2 * kPi;
        data_.AddArc({float(cx), float(cy)}, float(a), float(b), float(phi), float(start), float(delta));
        data_.points.back() = {x, y};  // no drift of the end point
        current_ = {x, y};
    }
    void AddRect(const Rect& rect) override {
        if (!IsFinite(rect)) return;
        data_.AddRect(rect.x, rect.y, rect.width, rect.height);
        start_ = current_ = {rect.x, rect.y};
        hasCurrent_ = true;
    }
    void AddRoundedRect(const Rect& rect, const CornerRadii& radii) override {
        if (!IsFinite(rect) || !IsFinite(radii)) return;
        data_.AddRoundedRect(rect, radii);
        start_ = current_ = {rect.x, rect.y};
        hasCurrent_ = true;
    }
    void Close() override {
        if (data_.verbs.empty() || data_.verbs.back() == PathVerb::Close) return;
        data_.Close();
        current_ = start_;
    }
    void Reset() override {
        data_.Clear();
        hasCurrent_ = false;
    }
    void SetFillRule(FillRule rule) override { rule_ = rule; }
    // Curves are flattened to a fraction of a pixel where they are drawn; there is nothing left to gain here.
    void SetFastLineSegmentDrawing(bool) override {}

    bool IsEmpty() const override { return data_.verbs.empty(); }
    FillRule GetFillRule() const override { return rule_; }
    Rect GetBounds() const override {
        if (data_.points.empty()) return {};
        Point low = data_.points[0], high = low;
        for (const Point& p : data_.points) {
            low = {std::min(low.x, p.x), std::min(low.y, p.y)};
            high = {std::max(high.x, p.x), std::max(high.y, p.y)};
        }
        return {low.x, low.y, 0, high.x - low.x, high.y - low.y};
    }
    uint64_t GetHash() const override {
        uint64_t hash = 0xCBF29CE484222325ull ^ uint64_t(rule_);
        hash = HashBytes(hash, data_.verbs.data(), data_.verbs.size());
        return HashBytes(hash, data_.points.data(), data_.points.size() * sizeof(Point));
    }
    bool Equals(const Path& other) const override {
        const size_t verbs = data_.verbs.size(), points = data_.points.size();
        return rule_ == other.GetFillRule() && verbs == other.GetVerbCount() &&
               points == other.GetPointCount() &&
               (verbs == 0 || std::memcmp(data_.verbs.data(), other.GetVerbs(), verbs) == 0) &&
               (points == 0 ||
                std::memcmp(data_.points.data(), other.GetPoints(), points * sizeof(Point)) == 0);
    }
    const PathVerb* GetVerbs() const override { return data_.verbs.data(); }
    size_t GetVerbCount() const override { return data_.verbs.size(); }
    const Point* GetPoints() const override { return data_.points.data(); }
    size_t GetPointCount() const override { return data_.points.size(); }

    void CopyFrom(const Path& other) {
        data_.verbs.assign(other.GetVerbs(), other.GetVerbs() + other.GetVerbCount());
        data_.points.assign(other.GetPoints(), other.GetPoints() + other.GetPointCount());
        rule_ = other.GetFillRule();
        hasCurrent_ = false;
    }
    bool SetPoints(size_t first, const Point* points, size_t count) {
        if (first > data_.points.size() || count > data_.points.size() - first) return false;
        for (size_t i = 0; i < count; ++i) {
            if (!IsFinite(points[i])) return false;
        }
        std::copy(points, points + count, data_.points.begin() + ptrdiff_t(first));
        return true;
    }

  private:
    template <class... Floats>
    static bool Finite(Floats... values) {
        const float list[] = {values...};
        return AllFinite(list, sizeof...(values));
    }
    static Point OnEllipse(float cx, float cy, float rx, float ry, float rotation, float angle) {
        const float x = rx * std::cos(angle), y = ry * std::sin(angle);
        return {cx + x * std::cos(rotation) - y * std::sin(rotation),
                cy + x * std::sin(rotation) + y * std::cos(rotation)};
    }
    // True when there was a current point already.
    bool Ensure(float x, float y) {
        if (hasCurrent_) {
            // After a Close the next contour starts where the last one did.
            if (!data_.verbs.empty() && data_.verbs.back() == PathVerb::Close) data_.MoveTo(start_);
            return true;
        }
        MoveTo(x, y);
        return false;
    }

    PathData data_;
    Point start_, current_;
    bool hasCurrent_ = false;
    FillRule rule_ = kFillNonZero;
    std::atomic<uint32_t> references_{1};
};

class AnimatedPathImpl final : public AnimatedPath {
  public:
    void AddRef() override { references_.fetch_add(1, std::memory_order_relaxed); }
    void Release() override {
        if (references_.fetch_sub(1, std::memory_order_acq_rel) == 1) HeapDelete(this);
    }
    void SetPath(const Path& path) override { path_.CopyFrom(path); }
    bool SetPoints(size_t first, const Point* points, size_t count) override {
        return path_.SetPoints(first, points, count);
    }
    const Path& GetPath() const override { return path_; }

  private:
    PathImpl path_;
    std::atomic<uint32_t> references_{1};
};

}  // namespace

Path* Path::Create() {
    return HeapNew<PathImpl>();
}

AnimatedPath* AnimatedPath::Create() {
    return HeapNew<AnimatedPathImpl>();
}

}  // namespace fresco
