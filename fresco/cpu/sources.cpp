#include "fresco/cpu/sources.h"

#include <bit>
#include <climits>

namespace fresco::cpu {
namespace {

// x' = (x - x0) * sx and so on, as a homography to compose with.
Homography Affine(double sx, double x0, double sy, double y0) {
    Homography h;
    h.xx = sx, h.x0 = -x0 * sx, h.yy = sy, h.y0 = -y0 * sy;
    return h;
}

// Walks a row of pixel centres through a homography.
template <class Use>
void WalkRow(const Homography& h, int x, int y, int count, Use use) {
    const double px = x + 0.5, py = y + 0.5;
    if (h.IsAffine()) {
        const double u0 = h.xy * py + h.x0, v0 = h.yy * py + h.y0;
        for (int i = 0; i < count; ++i)
            use(i, h.xx * (px + i) + u0, h.yx * (px + i) + v0);
        return;
    }
    for (int i = 0; i < count; ++i) {
        const Vec2 p = h.Project(px + i, py);
        const bool finite = std::abs(p.x) < 1e9 && std::abs(p.y) < 1e9;
        use(i, finite ? p.x : 0, finite ? p.y : 0);
    }
}

// 8-bit weights between two pixels, rounded.
inline uint32_t Mix(uint32_t a, uint32_t b, uint32_t weight) {
    const uint32_t inverse = 256 - weight;
    const uint32_t even = ((a & 0x00FF00FF) * inverse + (b & 0x00FF00FF) * weight + 0x00800080) >> 8;
    const uint32_t odd = ((a >> 8) & 0x00FF00FF) * inverse + ((b >> 8) & 0x00FF00FF) * weight + 0x00800080;
    return (even & 0x00FF00FF) | (odd & 0xFF00FF00);
}

}  // namespace

void GradientTable::Build(const GradientStop* stops, uint32_t count, float opacity, double length) {
    const double wanted = std::clamp(length * 2, double(kMinSize), double(kMaxSize));
    const int size = int(std::bit_ceil(uint32_t(wanted)));
    colors.resize(size_t(size) + 2);
    if (count == 0) return std::fill(colors.begin(), colors.end(), 0u);
    const float unit = 1.0f / float(size);
    const auto channels = [opacity](const Color& c, float out[4]) {
        const float scale = opacity * 255;
        out[0] = std::min(c.r, c.a) * scale, out[1] = std::min(c.g, c.a) * scale;
        out[2] = std::min(c.b, c.a) * scale, out[3] = c.a * scale;
    };
    // Entry i has the colour of its middle, (i + 0.5) * unit; those below an offset belong to the segment
    // that ends there. An offset below an earlier one counts as equal to it.
    float from[4], to[4], step[4] = {};
    int entry = 0;
    float last = stops[0].offset;
    channels(stops[0].color, from);
    const auto fillUntil = [&](int end) {
        if (end <= entry) return;
        Rows().Ramp(colors.data() + 1 + entry, end - entry, from, step);
        entry = end;
    };
    const auto entriesBelow = [&](float offset) {
        return int(std::clamp(std::ceil(double(offset) * size - 0.5), 0.0, double(size)));
    };
    fillUntil(entriesBelow(last));
    for (uint32_t k = 1; k < count; ++k) {
        const float offset = std::max(last, stops[k].offset);
        channels(stops[k - 1].color, from);
        channels(stops[k].color, to);
        const int end = entriesBelow(offset);
        if (end > entry) {
            const float slope = unit / (offset - last),
                        start = ((float(entry) + 0.5f) * unit - last) / (offset - last);
            for (int c = 0; c < 4; ++c) {
                step[c] = (to[c] - from[c]) * slope;
                from[c] += (to[c] - from[c]) * start;
            }
            fillUntil(end);
        }
        last = offset;
    }
    channels(stops[count - 1].color, from);
    std::fill(step, step + 4, 0.0f);
    fillUntil(size);
    // Beyond the ends stand their very colours: a short ramp's outermost entry is not there yet.
    Rows().Ramp(&colors.back(), 1, from, step);
    channels(stops[0].color, from);
    Rows().Ramp(&colors.front(), 1, from, step);
}

GradientSource::GradientSource(const LinearGradient& geometry, const Homography& toPlane,
                               GradientTable& table)
    : spread_(geometry.spread), table_(table) {
    const double dx = geometry.end.x - geometry.start.x, dy = geometry.end.y - geometry.start.y;
    const double squared = dx * dx + dy * dy;
    Homography project;
    if (squared > 1e-12) {
        project.xx = dx / squared, project.xy = dy / squared;
        project.x0 = -(geometry.start.x * dx + geometry.start.y * dy) / squared;
    } else {
        // Start and end in one point: all of it is the last colour.
        project.xx = project.xy = 0, project.x0 = 1;
    }
    project.yx = project.yy = project.y0 = 0;
    toUnit_ = project * toPlane;
}

GradientSource::GradientSource(const RadialGradient& geometry, const Homography& toPlane,
                               GradientTable& table)
    : radial_(true), spread_(geometry.spread), table_(table) {
    const double rx = std::max<double>(std::abs(geometry.radius.x), 1e-6);
    const double ry = std::max<double>(std::abs(geometry.radius.y), 1e-6);
    toUnit_ = Affine(1 / rx, geometry.center.x, 1 / ry, geometry.center.y) * toPlane;
}

void GradientSource::SetStops(const GradientStop* stops, uint32_t count, float opacity) {
    const double perPixel = toUnit_.IsAffine() ? toUnit_.MaxScale() : 0;
    table_.Build(stops, count, opacity, 1 / std::max(perPixel, 1e-6));
}

GradientWalk GradientSource::WalkOf(int y) const {
    const double last = double(table_.colors.size() - 2), py = y + 0.5;
    const auto start = [&](double xx, double xy, double x0) {
        // Far off, single floats lose the fraction, but there is one colour or noise.
        return float(std::clamp((xx * 0.5 + xy * py + x0) * last, -1e9, 1e9));
    };
    GradientWalk walk;
    walk.colors = table_.colors.data();
    walk.last = float(last);
    walk.spread = spread_;
    walk.u = start(toUnit_.xx, toUnit_.xy, toUnit_.x0), walk.du = float(toUnit_.xx * last);
    walk.v = start(toUnit_.yx, toUnit_.yy, toUnit_.y0), walk.dv = float(toUnit_.yx * last);
    return walk;
}

uint32_t GradientSource::Lookup(double t) const {
    if (spread_ == kSpreadRepeat) {
        t -= std::floor(t);
    } else if (spread_ == kSpreadReflect) {
        t = std::abs(t - 2 * std::floor(t / 2 + 0.5));
    }
    const double size = double(table_.colors.size() - 2);
    return table_.colors[size_t(std::clamp(t * size, -1.0, size) + GradientWalk::kShift)];
}

void GradientSource::FetchProjected(int x, int y, int count, uint32_t* out) const {
    WalkRow(toUnit_, x, y, count,
            [&](int i, double u, double v) { out[i] = Lookup(radial_ ? std::sqrt(u * u + v * v) : u); });
}

bool GradientSource::RowColor(int y, uint32_t* color) {
    if (radial_ || !toUnit_.IsAffine() || toUnit_.xx != 0) return false;
    Rows().LinearGradient(color, 0, 1, WalkOf(y));
    return true;
}

const uint32_t* GradientSource::Fetch(int x, int y, int count, uint32_t* room) {
    if (!toUnit_.IsAffine()) {
        FetchProjected(x, y, count, room);
        return room;
    }
    const bool alongRows = !radial_ && toUnit_.xy == 0;
    if (alongRows && x >= rowX_ && x + count <= rowX_ + int(row_.size())) return row_.data() + (x - rowX_);
    uint32_t* out = room;
    if (alongRows) {
        row_.resize(size_t(count));
        rowX_ = x;
        out = row_.data();
    }
    const GradientWalk walk = WalkOf(y);
    if (radial_)
        Rows().RadialGradient(out, x, count, walk);
    else
        Rows().LinearGradient(out, x, count, walk);
    return out;
}

ImageSource::ImageSource(Resources& resources, Texture& texture, const Placement& placement,
                         const Homography& toPlane, float opacity)
    : alpha_(uint32_t(std::clamp(opacity, 0.0f, 1.0f) * 255 + 0.5f)) {
    Rect source = placement.source;
    if (source.width == 0 || source.height == 0)
        source = {0, 0, 0, float(texture.width), float(texture.height)};
    const Rect& target = placement.target;
    const double sx =
        source.width / std::max<double>(std::abs(target.width), 1e-6) * (target.width < 0 ? -1 : 1);
    const double sy =
        source.height / std::max<double>(std::abs(target.height), 1e-6) * (target.height < 0 ? -1 : 1);
    Homography toTexels =
        Affine(1, -double(source.x), 1, -double(source.y)) * Affine(sx, target.x, sy, target.y) * toPlane;

    const double texelsAPixel = toTexels.MaxScale(target.x, target.y);
    level_ = &resources.FindLevel(texture, 1 / std::max(texelsAPixel, 1e-9));
    // Odd sizes round up, so a level's scale is the ratio of the sizes.
    const double levelX = double(level_->width()) / texture.width,
                 levelY = double(level_->height()) / texture.height;
    toTexels_ = Affine(levelX, 0, levelY, 0) * toTexels;
    const auto axis = [](double begin, double end, int size, double period) {
        Axis a;
        a.begin = std::clamp(begin, 0.0, size - 1e-3);
        a.end = std::max(std::min(double(size), end), a.begin + 1e-3);
        a.first = int(a.begin), a.last = std::max(a.first, int(std::ceil(a.end)) - 1);
        a.period = period;
        a.wraps = period > 0 && std::abs(period - (a.end - a.begin)) < 1e-6 * period;
        return a;
    };
    const double periodX = (std::abs(target.width) + placement.spacingX) * std::abs(sx) * levelX,
                 periodY = (std::abs(target.height) + placement.spacingY) * std::abs(sy) * levelY;
    u_ = axis(source.x * levelX, (source.x + source.width) * levelX, level_->width(),
              placement.repeatX ? std::max(periodX, 0.0) : 0);
    v_ = axis(source.y * levelY, (source.y + source.height) * levelY, level_->height(),
              placement.repeatY ? std::max(periodY, 0.0) : 0);
    // Texel for pixel: rows can be copied.
    const auto whole = [](double v) { return std::abs(v - std::round(v)) < 1.0 / 512; };
    aligned_ = toTexels_.IsScaleTranslate() && std::abs(toTexels_.xx - 1) < 1e-6 &&
               std::abs(toTexels_.yy - 1) < 1e-6 && whole(toTexels_.x0) && whole(toTexels_.y0) &&
               u_.period == 0 && v_.period == 0;
}

// Texel centres lie at one half; outside of the source its edge goes on, or the other side comes back.
bool ImageSource::Axis::Locate(double at, int* low, uint32_t* weight) const {
    if (period > 0) {
        at = begin + (at - begin) - std::floor((at - begin) / period) * period;
        if (at > end && !wraps) return false;
        at = std::min(at - 0.5, double(last));
    } else {
        at = std::min(std::max(at - 0.5, double(first)), double(last));
    }
    // Shifted to be positive, so that truncation is floor.
    const uint32_t fixed = uint32_t((at - (first - 1)) * 256 + 0.5);
    *low = int(fixed >> 8) + first - 1;
    *weight = fixed & 255;
    return true;
}

int ImageSource::Axis::Texel(int index) const {
    if (index < first) return wraps ? last : first;
    if (index > last) return wraps ? first : last;
    return index;
}

void ImageSource::FetchTurned(int x, int y, int count, uint32_t* out) {
    texels_.resize(size_t(count));
    const int pitch = level_->width();
    constexpr uint16_t kGap = 256;  // no weight between two texels
    bool gaps = false;
    WalkRow(toTexels_, x, y, count, [&](int i, double u, double v) {
        TexelSample& s = texels_[size_t(i)];
        int left = 0, top = 0;
        uint32_t right = 0, down = 0;
        if (!u_.Locate(u, &left, &right) || !v_.Locate(v, &top, &down)) {
            s = {{0, 0}, {0, 0}, kGap, 0};
            gaps = true;
            return;
        }
        const int upper = v_.Texel(top) * pitch, lower = v_.Texel(top + 1) * pitch;
        const int x0 = u_.Texel(left), x1 = u_.Texel(left + 1);
        s = {{upper + x0, upper + x1}, {lower + x0, lower + x1}, uint16_t(right), uint16_t(down)};
    });
    Rows().SampleTexels(out, level_->pixels(), texels_.data(), count);
    for (int i = 0; gaps && i < count; ++i) {
        if (texels_[size_t(i)].right == kGap) out[i] = 0;
    }
}

// A row comes in pieces (edges, middle), the next row in the same ones: the columns of all are kept.
void ImageSource::LocateColumns(int x, int y, int count) {
    const int known = columnsX_ + int(offsets_.size());
    if (!offsets_.empty() && x >= columnsX_ && x + count <= known) return;
    const int first = offsets_.empty() ? x : std::min(x, columnsX_);
    const int end = offsets_.empty() ? x + count : std::max(x + count, known);
    columnsX_ = first;
    offsets_.resize(size_t(end - first));
    samples_.resize(size_t(end - first));
    hasMixed_ = false;
    constexpr int kGap = INT_MIN;
    int lowest = INT_MAX, highest = INT_MIN;
    WalkRow(toTexels_, first, y, end - first, [&](int i, double at, double) {
        int low = kGap;
        uint32_t weight = 0;
        if (u_.Locate(at, &low, &weight))
            lowest = std::min(lowest, low), highest = std::max(highest, low + 1);
        offsets_[size_t(i)] = low;
        ColumnSample& sample = samples_[size_t(i)];
        std::fill(sample.weights, sample.weights + 4, uint16_t(256 - weight));
        std::fill(sample.weights + 4, sample.weights + 8, uint16_t(weight));
    });
    mixedFirst_ = lowest <= highest ? lowest : 0;
    mixedCount_ = lowest <= highest ? highest - lowest + 1 : 0;
    for (int32_t& offset : offsets_)
        offset = offset == kGap ? mixedCount_ : offset - mixedFirst_;
}

// The texels that the columns need, blended from the two rows around y; null in a gap.
const uint32_t* ImageSource::MixedRow(int y) {
    if (hasMixed_ && mixedY_ == y) return mixed_.data();
    int low = 0;
    uint32_t weight = 0;
    if (!v_.Locate(toTexels_.yy * (y + 0.5) + toTexels_.y0, &low, &weight)) return nullptr;
    mixed_.resize(size_t(mixedCount_) + 2);
    const uint32_t *upper = level_->Row(v_.Texel(low)), *lower = level_->Row(v_.Texel(low + 1));
    // The middle in one go; before the first and after the last texel stands what the axis says.
    const int begin = std::max(mixedFirst_, u_.first), end = std::min(mixedFirst_ + mixedCount_, u_.last + 1);
    uint32_t* mixed = mixed_.data() - mixedFirst_;
    if (begin < end) Rows().MixRows(mixed + begin, upper + begin, lower + begin, end - begin, weight);
    for (int i = mixedFirst_; i < std::min(begin, mixedFirst_ + mixedCount_); ++i)
        mixed[i] = Mix(upper[u_.Texel(i)], lower[u_.Texel(i)], weight);
    for (int i = std::max(end, mixedFirst_); i < mixedFirst_ + mixedCount_; ++i)
        mixed[i] = Mix(upper[u_.Texel(i)], lower[u_.Texel(i)], weight);
    mixed_[size_t(mixedCount_)] = mixed_[size_t(mixedCount_) + 1] = 0;
    mixedY_ = y, hasMixed_ = true;
    return mixed_.data();
}

void ImageSource::FetchUpright(int x, int y, int count, uint32_t* out) {
    LocateColumns(x, y, count);
    const uint32_t* row = MixedRow(y);
    if (!row) return std::fill(out, out + count, 0u);
    const size_t at = size_t(x - columnsX_);
    Rows().SampleColumns(out, row, offsets_.data() + at, samples_.data() + at, count);
}

// The row itself when all of it lies inside of the source.
bool ImageSource::FindAligned(int u, int v, int count, const uint32_t** row) const {
    *row = level_->Row(std::clamp(v, v_.first, v_.last)) + u;
    return u >= u_.first && u + count <= u_.last + 1;
}

const uint32_t* ImageSource::Fetch(int x, int y, int count, uint32_t* room) {
    if (aligned_) {
        const int u = x + int(std::lround(toTexels_.x0)), v = y + int(std::lround(toTexels_.y0));
        const uint32_t* row = nullptr;
        const bool inside = FindAligned(u, v, count, &row);
        if (inside && alpha_ == 255) return row;
        for (int i = 0; i < count; ++i)
            room[i] = row[std::clamp(u + i, u_.first, u_.last) - u];
    } else if (toTexels_.IsScaleTranslate()) {
        FetchUpright(x, y, count, room);
    } else {
        FetchTurned(x, y, count, room);
    }
    if (alpha_ != 255) Rows().Scale(room, count, alpha_);
    return room;
}

const uint32_t* WindowSource::Fetch(int x, int y, int count, uint32_t* room) {
    const uint32_t* inner = inner_.Fetch(x, y, count, room);
    if (placement_.repeatX && placement_.repeatY) return inner;
    if (inner != room) std::memcpy(room, inner, size_t(count) * 4);
    const Rect& t = placement_.target;
    WalkRow(toPlane_, x, y, count, [&](int i, double u, double v) {
        const bool inX = placement_.repeatX || (u >= t.x && u < double(t.x) + t.width);
        const bool inY = placement_.repeatY || (v >= t.y && v < double(t.y) + t.height);
        if (!inX || !inY) room[i] = 0;
    });
    return room;
}

YuvSource::YuvSource(const Texture* const planes[4], const Rect& target, const Homography& toPlane,
                     float opacity)
    : opacity_(opacity) {
    std::copy(planes, planes + 4, planes_);
    toUnit_ = Affine(1 / std::max<double>(target.width, 1e-6), target.x,
                     1 / std::max<double>(target.height, 1e-6), target.y) *
              toPlane;
}

const uint32_t* YuvSource::Fetch(int x, int y, int count, uint32_t* room) {
    const auto sample = [](const Texture& plane, double u, double v) {
        const double px = std::clamp(u * plane.width - 0.5, 0.0, plane.width - 1.0);
        const double py = std::clamp(v * plane.height - 0.5, 0.0, plane.height - 1.0);
        const size_t x0 = size_t(px), y0 = size_t(py);
        const size_t x1 = std::min<size_t>(x0 + 1, plane.width - 1),
                     y1 = std::min<size_t>(y0 + 1, plane.height - 1);
        const float fx = float(px - double(x0)), fy = float(py - double(y0));
        const uint8_t *a = plane.alpha.data() + y0 * plane.width, *b = plane.alpha.data() + y1 * plane.width;
        return (a[x0] * (1 - fx) + a[x1] * fx) * (1 - fy) + (b[x0] * (1 - fx) + b[x1] * fx) * fy;
    };
    WalkRow(toUnit_, x, y, count, [&](int i, double u, double v) {
        const float l = (sample(*planes_[0], u, v) - 16) * (1.164383f / 255);
        const float cb = (sample(*planes_[1], u, v) - 128) / 255,
                    cr = (sample(*planes_[2], u, v) - 128) / 255;
        const float alpha = (planes_[3] ? sample(*planes_[3], u, v) / 255 : 1) * opacity_;
        const auto clamp = [](float c) { return std::clamp(c, 0.0f, 1.0f); };
        room[i] =
            PackPixel(clamp(l + 1.596027f * cr) * alpha, clamp(l - 0.391762f * cb - 0.812968f * cr) * alpha,
                      clamp(l + 2.017232f * cb) * alpha, alpha);
    });
    return room;
}

}  // namespace fresco::cpu
