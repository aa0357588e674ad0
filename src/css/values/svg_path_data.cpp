#include "css/values/svg_path_data.h"

#include <numbers>

#include "css/values/number_parser.h"
#include "css/values/text_reader.h"

namespace qorvex::css {

namespace {

struct Point {
    float x = 0;
    float y = 0;
    friend Point operator+(Point a, Point b) { return {a.x + b.x, a.y + b.y}; }
    friend Point operator-(Point a, Point b) { return {a.x - b.x, a.y - b.y}; }
};

class PathReader {
  public:
    PathReader(std::string_view text, SvgPathData& out) : text_(text), out_(out) {}

    // Stops before the first segment that is not well formed.
    size_t Read() {
        SkipSpace();
        size_t good = position_;
        char command = 0;
        while (position_ < text_.size()) {
            char c = text_[position_];
            if ((ToLower(c) >= 'a' && ToLower(c) <= 'z')) {
                command = c;
                ++position_;
            } else if (command == 'M') {
                command = 'L';  // further pairs of a move-to are line-tos
            } else if (command == 'm') {
                command = 'l';
            } else if (command == 0 || ToLower(command) == 'z') {
                break;
            }
            if (out_.verbs.empty() && ToLower(command) != 'm') break;
            if (!ReadSegment(command)) break;
            SkipSpace();
            good = position_;
            SkipComma();
        }
        return good;
    }

  private:
    void SkipSpace() {
        while (position_ < text_.size() && IsSpace(text_[position_]))
            ++position_;
    }
    void SkipComma() {
        SkipSpace();
        if (position_ < text_.size() && text_[position_] == ',') ++position_;
        SkipSpace();
    }

    bool ReadNumber(float& out) {
        SkipComma();
        size_t length = ReadFloat(text_.substr(position_), out);
        position_ += length;
        if (length == 0) return false;
        // "1." is a number of this grammar; so is an exponent.
        if (position_ < text_.size() && text_[position_] == '.' &&
            text_.substr(position_ - length, length).find('.') == std::string_view::npos)
            ++position_;
        return ReadExponent(out);
    }

    bool ReadExponent(float& out) {
        if (position_ >= text_.size() || ToLower(text_[position_]) != 'e') return true;
        size_t digits = position_ + 1;
        if (digits < text_.size() && (text_[digits] == '+' || text_[digits] == '-')) ++digits;
        if (digits >= text_.size() || !IsDigit(text_[digits])) return true;
        int exponent = 0;
        for (position_ = digits; position_ < text_.size() && IsDigit(text_[position_]); ++position_)
            exponent = std::min(exponent * 10 + (text_[position_] - '0'), 1000);
        if (text_[digits - 1] == '-') exponent = -exponent;
        out = static_cast<float>(out * std::pow(10.0, exponent));
        return std::isfinite(out);
    }

    // The two flags of an arc may stand without a separator.
    bool ReadFlag(bool& out) {
        SkipComma();
        if (position_ >= text_.size() || (text_[position_] != '0' && text_[position_] != '1')) return false;
        out = text_[position_++] == '1';
        return true;
    }

    bool ReadPoint(Point origin, Point& out) {
        if (!ReadNumber(out.x) || !ReadNumber(out.y)) return false;
        out = out + origin;
        return std::isfinite(out.x) && std::isfinite(out.y);
    }

    bool ReadSegment(char command) {
        Point origin = command >= 'a' ? current_ : Point();
        Point points[3];
        switch (ToLower(command)) {
            case 'm':
                if (!ReadPoint(origin, points[0])) return false;
                start_ = points[0];
                return Emit(PathVerb::Move, points, 1);
            case 'l':
                return ReadPoint(origin, points[0]) && Emit(PathVerb::Line, points, 1);
            case 'h':
                points[0] = current_;
                if (!ReadNumber(points[0].x)) return false;
                points[0].x += origin.x;
                return Emit(PathVerb::Line, points, 1);
            case 'v':
                points[0] = current_;
                if (!ReadNumber(points[0].y)) return false;
                points[0].y += origin.y;
                return Emit(PathVerb::Line, points, 1);
            case 'c':
                for (Point& point : points)
                    if (!ReadPoint(origin, point)) return false;
                return Emit(PathVerb::Cubic, points, 3);
            case 's':
                points[0] = Reflected(PathVerb::Cubic);
                return ReadPoint(origin, points[1]) && ReadPoint(origin, points[2]) &&
                       Emit(PathVerb::Cubic, points, 3);
            case 'q':
                return ReadPoint(origin, points[0]) && ReadPoint(origin, points[1]) &&
                       Emit(PathVerb::Quad, points, 2);
            case 't':
                points[0] = Reflected(PathVerb::Quad);
                return ReadPoint(origin, points[1]) && Emit(PathVerb::Quad, points, 2);
            case 'a':
                return ReadArc(origin);
            case 'z':
                current_ = start_;
                out_.verbs.push_back(PathVerb::Close);
                return true;
            default:
                return false;
        }
    }

    // The control point of a smooth curve: that of the curve before, mirrored, or the current point.
    Point Reflected(PathVerb verb) const {
        if (out_.verbs.back() != verb || afterArc_) return current_;
        return current_ + (current_ - control_);
    }

    bool Emit(PathVerb verb, const Point* points, size_t count) {
        out_.verbs.push_back(verb);
        for (size_t i = 0; i < count; ++i) {
            out_.coordinates.push_back(points[i].x);
            out_.coordinates.push_back(points[i].y);
        }
        if (count > 1) control_ = points[count - 2];
        current_ = points[count - 1];
        afterArc_ = false;
        return true;
    }

    bool ReadArc(Point origin) {
        float rx, ry, rotation;
        bool large, sweep;
        Point end;
        if (!ReadNumber(rx) || !ReadNumber(ry) || !ReadNumber(rotation) || !ReadFlag(large) ||
            !ReadFlag(sweep) || !ReadPoint(origin, end))
            return false;
        EmitArc(std::fabs(rx), std::fabs(ry), rotation, large, sweep, end);
        return true;
    }

    // Endpoint to centre form, then one cubic for each quarter at most (SVG 2, B.2.4).
    void EmitArc(double rx, double ry, double degrees, bool large, bool sweep, Point end) {
        if (rx == 0 || ry == 0 || (end.x == current_.x && end.y == current_.y)) {
            Emit(PathVerb::Line, &end, 1);
            return;
        }
        const double phi = degrees * std::numbers::pi / 180, c = std::cos(phi), s = std::sin(phi);
        const double dx = (current_.x - end.x) / 2.0, dy = (current_.y - end.y) / 2.0;
        const double x1 = c * dx + s * dy, y1 = -s * dx + c * dy;
        const double lambda = x1 * x1 / (rx * rx) + y1 * y1 / (ry * ry);
        if (lambda > 1) {
            rx *= std::sqrt(lambda);
            ry *= std::sqrt(lambda);
        }
        const double denominator = rx * rx * y1 * y1 + ry * ry * x1 * x1;
        const double numerator = rx * rx * ry * ry - denominator;
        double factor = denominator > 0 ? std::sqrt(std::max(0.0, numerator / denominator)) : 0;
        if (large == sweep) factor = -factor;
        const double cx1 = factor * rx * y1 / ry, cy1 = -factor * ry * x1 / rx;
        const double cx = c * cx1 - s * cy1 + (current_.x + end.x) / 2.0;
        const double cy = s * cx1 + c * cy1 + (current_.y + end.y) / 2.0;
        const double from = std::atan2((y1 - cy1) / ry, (x1 - cx1) / rx);
        double span = std::atan2((-y1 - cy1) / ry, (-x1 - cx1) / rx) - from;
        if (sweep && span < 0) span += 2 * std::numbers::pi;
        if (!sweep && span > 0) span -= 2 * std::numbers::pi;
        const int pieces =
            std::max(1, static_cast<int>(std::ceil(std::fabs(span) / (std::numbers::pi / 2) - 1e-6)));
        const double step = span / pieces, k = 4.0 / 3 * std::tan(step / 4);
        auto place = [&](double x, double y) {
            return Point{static_cast<float>(cx + c * rx * x - s * ry * y),
                         static_cast<float>(cy + s * rx * x + c * ry * y)};
        };
        for (int i = 0; i < pieces; ++i) {
            const double a = from + i * step, b = a + step;
            Point points[3] = {place(std::cos(a) - k * std::sin(a), std::sin(a) + k * std::cos(a)),
                               place(std::cos(b) + k * std::sin(b), std::sin(b) - k * std::cos(b)),
                               i + 1 == pieces ? end : place(std::cos(b), std::sin(b))};
            Emit(PathVerb::Cubic, points, 3);
        }
        afterArc_ = true;
    }

    std::string_view text_;
    SvgPathData& out_;
    size_t position_ = 0;
    Point current_, start_, control_;
    bool afterArc_ = false;
};

}  // namespace

bool ParseSvgPath(std::string_view text, SvgPathData& out, size_t& consumed) {
    consumed = PathReader(text, out).Read();
    return !out.verbs.empty();
}

}  // namespace qorvex::css
