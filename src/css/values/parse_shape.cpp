// Text forms of clip-path and its shapes (CSS Shapes Module Level 1, 3).
#include "core/logging/log.h"
#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

namespace {

// One to four lengths in the order of a box's sides or corners, completed as CSS does.
bool ParseFourLengths(std::string_view text, Length (&out)[4]) {
    Words<4> words(text);
    if (words.count < 1 || words.count > 4) return false;
    for (size_t i = 0; i < words.count; ++i)
        if (!ParseLength(words.at[i], out[i])) return false;
    if (words.count < 2) out[1] = out[0];
    if (words.count < 3) out[2] = out[0];
    if (words.count < 4) out[3] = out[1];
    return true;
}

// Splits at a word that stands alone between spaces, like "at" and "round".
bool SplitAtWord(std::string_view text, std::string_view separator, std::string_view& before,
                 std::string_view& after) {
    WordReader words(text);
    std::string_view word;
    before = text;
    while (words.Next(word)) {
        if (!EqualsIgnoreCase(word, separator)) continue;
        before = Trim(text.substr(0, static_cast<size_t>(word.data() - text.data())));
        after = Trim(words.rest());
        return true;
    }
    return false;
}

bool ParseRadii(std::string_view text, std::array<BorderRadius, 4>& out) {
    size_t slash = text.find('/');
    Length horizontal[4], vertical[4];
    if (!ParseFourLengths(Trim(text.substr(0, slash)), horizontal)) return false;
    std::string_view second = slash == std::string_view::npos ? text : text.substr(slash + 1);
    if (!ParseFourLengths(Trim(second), vertical)) return false;
    for (size_t i = 0; i < 4; ++i) {
        out[i] = {horizontal[i], vertical[i]};
        if (horizontal[i].value < 0 || vertical[i].value < 0) return false;
    }
    return true;
}

RefPtr<const BasicShape> ParseInset(std::string_view text) {
    RefPtr<InsetShape> shape = MakeRef<InsetShape>();
    std::string_view offsets, radii;
    if (SplitAtWord(text, "round", offsets, radii) && !ParseRadii(radii, shape->radii)) return nullptr;
    Length sides[4];
    if (!ParseFourLengths(offsets, sides)) return nullptr;
    std::copy(sides, sides + 4, shape->offsets.begin());
    return shape;
}

bool ParseShapeRadius(std::string_view text, ShapeRadius& out) {
    if (EqualsIgnoreCase(text, "closest-side")) {
        out.kind = ShapeRadiusKind::ClosestSide;
    } else if (EqualsIgnoreCase(text, "farthest-side")) {
        out.kind = ShapeRadiusKind::FarthestSide;
    } else {
        out.kind = ShapeRadiusKind::Length;
        return ParseLength(text, out.length) && out.length.value >= 0;
    }
    return true;
}

RefPtr<const BasicShape> ParseCircle(std::string_view text) {
    RefPtr<CircleShape> shape = MakeRef<CircleShape>();
    std::string_view radius, center;
    if (SplitAtWord(text, "at", radius, center) && !ParsePosition(center, shape->centerX, shape->centerY))
        return nullptr;
    if (!radius.empty() && !ParseShapeRadius(radius, shape->radius)) return nullptr;
    return shape;
}

RefPtr<const BasicShape> ParseEllipse(std::string_view text) {
    RefPtr<EllipseShape> shape = MakeRef<EllipseShape>();
    std::string_view radii, center;
    if (SplitAtWord(text, "at", radii, center) && !ParsePosition(center, shape->centerX, shape->centerY))
        return nullptr;
    Words<2> words(radii);
    if (words.count == 0) return shape;
    if (words.count != 2 || !ParseShapeRadius(words.at[0], shape->radiusX) ||
        !ParseShapeRadius(words.at[1], shape->radiusY))
        return nullptr;
    return shape;
}

RefPtr<const BasicShape> ParsePolygon(std::string_view text) {
    RefPtr<PolygonShape> shape = MakeRef<PolygonShape>();
    ListReader list(text);
    std::string_view item;
    bool first = true;
    while (list.Next(item)) {
        bool isRule = first && ParseKeyword(item, shape->fillRule);
        first = false;
        if (isRule) continue;
        Words<2> words(item);
        PolygonShape::Point point;
        if (words.count != 2 || !ParseLength(words.at[0], point.x) || !ParseLength(words.at[1], point.y))
            return nullptr;
        shape->points.push_back(point);
    }
    if (shape->points.empty()) return nullptr;
    return shape;
}

RefPtr<const BasicShape> ParsePath(std::string_view text) {
    char quote = text.empty() ? 0 : text[0];
    size_t close = quote == '"' || quote == '\'' ? text.find(quote, 1) : std::string_view::npos;
    if (close == std::string_view::npos) {
        LogWarning("clip-path: path(", text, ") declaration has mismatched quotation marks!");
        return nullptr;
    }
    RefPtr<PathShape> shape = MakeRef<PathShape>();
    std::string_view path = text.substr(1, close - 1);
    size_t consumed = 0;
    if (!ParseSvgPath(path, shape->data, consumed) || consumed != path.size()) {
        LogWarning("Unable to parse clip-path: path(", text);
        return nullptr;
    }
    if (close + 1 != text.size()) {
        LogWarning("clip-path(", text,
                   ") declaration has excess characters after path declaration - they are ignored!");
    }
    shape->text = path;
    return shape;
}

RefPtr<const BasicShape> ParseBasicShape(std::string_view text) {
    std::string_view arguments;
    if (TakeFunction(text, "inset", arguments)) return ParseInset(arguments);
    if (TakeFunction(text, "circle", arguments)) return ParseCircle(arguments);
    if (TakeFunction(text, "ellipse", arguments)) return ParseEllipse(arguments);
    if (TakeFunction(text, "polygon", arguments)) return ParsePolygon(arguments);
    if (TakeFunction(text, "path", arguments)) return ParsePath(arguments);
    return nullptr;
}

template <class Shape, class... Fields>
bool SameFields(const BasicShape& a, const BasicShape& b, Fields Shape::*... fields) {
    if (a.kind() != b.kind()) return false;
    const Shape& x = static_cast<const Shape&>(a);
    const Shape& y = static_cast<const Shape&>(b);
    return ((x.*fields == y.*fields) && ...);
}

void AppendCenter(const Length& x, const Length& y, CssString& out) {
    out.append("at ");
    Serialise(x, out);
    out.push_back(' ');
    Serialise(y, out);
    out.push_back(')');
}

void AppendRadius(const ShapeRadius& radius, CssString& out) {
    if (radius.kind == ShapeRadiusKind::Length)
        Serialise(radius.length, out);
    else
        out.append(radius.kind == ShapeRadiusKind::ClosestSide ? "closest-side" : "farthest-side");
    out.push_back(' ');
}

}  // namespace

bool InsetShape::SameAs(const BasicShape& other) const {
    return SameFields(*this, other, &InsetShape::offsets, &InsetShape::radii);
}

void InsetShape::AppendText(CssString& out) const {
    out.append("inset(");
    for (const Length& offset : offsets) {
        Serialise(offset, out);
        out.push_back(' ');
    }
    out.append("round");
    for (const BorderRadius& radius : radii) {
        out.push_back(' ');
        Serialise(radius.horizontal, out);
    }
    out.append(" /");
    for (const BorderRadius& radius : radii) {
        out.push_back(' ');
        Serialise(radius.vertical, out);
    }
    out.push_back(')');
}

bool CircleShape::SameAs(const BasicShape& other) const {
    return SameFields(*this, other, &CircleShape::radius, &CircleShape::centerX, &CircleShape::centerY);
}

void CircleShape::AppendText(CssString& out) const {
    out.append("circle(");
    AppendRadius(radius, out);
    AppendCenter(centerX, centerY, out);
}

bool EllipseShape::SameAs(const BasicShape& other) const {
    return SameFields(*this, other, &EllipseShape::radiusX, &EllipseShape::radiusY, &EllipseShape::centerX,
                      &EllipseShape::centerY);
}

void EllipseShape::AppendText(CssString& out) const {
    out.append("ellipse(");
    AppendRadius(radiusX, out);
    AppendRadius(radiusY, out);
    AppendCenter(centerX, centerY, out);
}

bool PolygonShape::SameAs(const BasicShape& other) const {
    return SameFields(*this, other, &PolygonShape::fillRule, &PolygonShape::points);
}

void PolygonShape::AppendText(CssString& out) const {
    out.append("polygon(");
    out.append(KeywordText(fillRule));
    for (const Point& point : points) {
        out.append(", ");
        Serialise(point.x, out);
        out.push_back(' ');
        Serialise(point.y, out);
    }
    out.push_back(')');
}

bool PathShape::SameAs(const BasicShape& other) const {
    return SameFields(*this, other, &PathShape::data);
}

void PathShape::AppendText(CssString& out) const {
    char quote = text.contains('"') ? '\'' : '"';
    out.append("path(");
    out.push_back(quote);
    out.append(text);
    out.push_back(quote);
    out.push_back(')');
}

bool Parse(std::string_view text, ClipPathType& out) {
    out = ClipPathType();
    if (EqualsIgnoreCase(text, "none")) return true;
    Words<2> words(text);
    if (words.count < 1 || words.count > 2) return false;
    for (size_t i = 0; i < words.count; ++i) {
        if (!out.hasBox && ParseKeyword(words.at[i], out.box)) {
            out.hasBox = true;
        } else {
            if (out.shape) return false;
            out.shape = ParseBasicShape(words.at[i]);
            if (!out.shape) return false;
        }
    }
    return true;
}

void Serialise(const ClipPathType& value, CssString& out) {
    if (value.IsNone()) out.append("none");
    if (value.shape) value.shape->AppendText(out);
    if (!value.hasBox) return;
    if (value.shape) out.push_back(' ');
    out.append(KeywordText(value.box));
}

}  // namespace qorvex::css
