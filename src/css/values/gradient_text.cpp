#include "css/values/gradient_text.h"

#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

bool Gradient::SameAs(const Gradient& other) const {
    return kind == other.kind && sides == other.sides && angle == other.angle && shape == other.shape &&
           size == other.size && hasExplicitSize == other.hasExplicitSize && radiusX == other.radiusX &&
           radiusY == other.radiusY && centerX == other.centerX && centerY == other.centerY &&
           stops == other.stops;
}

namespace {

constexpr std::string_view kFunctionNames[] = {"linear-gradient", "radial-gradient",
                                               "repeating-linear-gradient", "repeating-radial-gradient"};
constexpr std::string_view kSideWords[] = {"top", "right", "bottom", "left"};

// A stop with two positions is two stops of one colour (CSS Images Module Level 4, 3.4.1).
bool ParseStop(std::string_view text, Gradient& out) {
    Words<3> words(text);
    if (words.count < 1 || words.count > 3) return false;
    GradientStop stop;
    if (!ParseColor(words.at[0], stop.color)) return false;
    if (words.count == 1) out.stops.push_back(stop);
    for (size_t i = 1; i < words.count; ++i) {
        stop.hasPosition = true;
        if (!ParseLength(words.at[i], stop.position)) return false;
        out.stops.push_back(stop);
    }
    return true;
}

// "to" and one or two sides that do not oppose each other.
bool ParseSides(std::string_view text, Gradient& out) {
    Words<2> words(text);
    if (words.count < 1 || words.count > 2) return false;
    for (size_t i = 0; i < words.count; ++i) {
        int side = FindKeyword(kSideWords, words.at[i]);
        if (side < 0) return false;
        out.sides = static_cast<uint8_t>(out.sides | (1 << side));
    }
    constexpr uint8_t kVertical = kSideTop | kSideBottom, kHorizontal = kSideLeft | kSideRight;
    if (words.count == 2) return (out.sides & kVertical) && (out.sides & kHorizontal);
    return true;
}

// False when the text is not the direction; `out` is then to be read as having none.
bool ParseLinearDirection(std::string_view text, Gradient& out) {
    WordReader words(text);
    std::string_view first;
    if (!words.Next(first)) return false;
    if (EqualsIgnoreCase(first, "to")) return ParseSides(words.rest(), out);
    return Trim(words.rest()).empty() && ParseAngle(first, out.angle);
}

bool ParseRadialGeometry(std::string_view text, Gradient& out) {
    WordReader words(text);
    std::string_view word;
    bool hasShape = false, hasKeyword = false;
    Length radii[2];
    size_t radiusCount = 0;
    while (words.Next(word)) {
        if (EqualsIgnoreCase(word, "at")) {
            if (!ParsePosition(words.rest(), out.centerX, out.centerY)) return false;
            break;
        }
        bool isCircle = EqualsIgnoreCase(word, "circle");
        if (isCircle || EqualsIgnoreCase(word, "ellipse")) {
            if (hasShape) return false;
            hasShape = true;
            out.shape = isCircle ? GradientShape::Circle : GradientShape::Ellipse;
        } else if (!hasKeyword && radiusCount == 0 && ParseKeyword(word, out.size)) {
            hasKeyword = true;
        } else {
            if (hasKeyword || radiusCount == 2 || !ParseLength(word, radii[radiusCount])) return false;
            if (radii[radiusCount++].value < 0) return false;
        }
    }
    if (radiusCount == 0) return true;
    out.hasExplicitSize = true;
    // One length makes a circle, two an ellipse.
    if (!hasShape) out.shape = radiusCount == 1 ? GradientShape::Circle : GradientShape::Ellipse;
    if ((out.shape == GradientShape::Circle) != (radiusCount == 1)) return false;
    out.radiusX = radii[0];
    out.radiusY = radii[radiusCount - 1];
    return true;
}

bool ParseArguments(std::string_view arguments, Gradient& out) {
    ListReader list(arguments);
    std::string_view item;
    bool first = true;
    while (list.Next(item)) {
        if (first) {
            first = false;
            std::string_view word = item.substr(0, item.find(' '));
            Color color;
            // What does not start with a colour must be the geometry.
            if (!ParseColor(word, color) && item.find('(') == std::string_view::npos) {
                if (out.IsRadial() ? !ParseRadialGeometry(item, out) : !ParseLinearDirection(item, out))
                    return false;
                continue;
            }
        }
        if (!ParseStop(item, out)) return false;
    }
    return out.stops.size() >= 2;
}

}  // namespace

RefPtr<const Gradient> ParseGradient(std::string_view text) {
    for (size_t kind = 0; kind < std::size(kFunctionNames); ++kind) {
        std::string_view arguments;
        if (!TakeFunction(text, kFunctionNames[kind], arguments)) continue;
        RefPtr<Gradient> gradient = MakeRef<Gradient>();
        gradient->kind = static_cast<GradientKind>(kind);
        if (!ParseArguments(arguments, *gradient)) return nullptr;
        return gradient;
    }
    return nullptr;
}

void SerialiseGradient(const Gradient& gradient, CssString& out) {
    out.append(kFunctionNames[static_cast<size_t>(gradient.kind)]);
    out.push_back('(');
    if (gradient.IsRadial()) {
        out.append(gradient.shape == GradientShape::Circle ? "circle " : "ellipse ");
        if (gradient.hasExplicitSize) {
            Serialise(gradient.radiusX, out);
            if (gradient.shape == GradientShape::Ellipse) {
                out.push_back(' ');
                Serialise(gradient.radiusY, out);
            }
        } else {
            Serialise(gradient.size, out);
        }
        out.append(" at ");
        Serialise(gradient.centerX, out);
        out.push_back(' ');
        Serialise(gradient.centerY, out);
    } else if (gradient.sides) {
        out.append("to");
        for (int i = 0; i < 4; ++i) {
            if (!(gradient.sides & (1 << i))) continue;
            out.push_back(' ');
            out.append(kSideWords[i]);
        }
    } else {
        AppendNumber(gradient.angle, out);
        out.append("deg");
    }
    for (const GradientStop& stop : gradient.stops) {
        out.append(", ");
        Serialise(stop.color, out);
        if (!stop.hasPosition) continue;
        out.push_back(' ');
        Serialise(stop.position, out);
    }
    out.push_back(')');
}

}  // namespace qorvex::css
