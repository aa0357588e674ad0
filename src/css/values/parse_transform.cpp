// Text forms of the transform group.
#include <charconv>

#include "core/logging/log.h"
#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

namespace {

// Arguments between commas; more than `most` of them are refused.
template <size_t kMost>
struct Arguments {
    explicit Arguments(std::string_view text) {
        ListReader list(text);
        std::string_view item;
        while (list.Next(item)) {
            if (count < kMost) at[count] = item;
            if (count++ == kMost) return;
        }
    }
    std::array<std::string_view, kMost> at;
    size_t count = 0;
};

using ArgumentReader = bool (*)(std::string_view arguments, TransformOperation& out);

template <TransformKind kKind>
bool ReadTranslateAxis(std::string_view text, TransformOperation& out) {
    out.kind = kKind;
    return ParseLength(text, out.lengths[0]);
}

template <size_t kLeast, size_t kMost>
bool ReadTranslate(std::string_view text, TransformOperation& out) {
    out.kind = TransformKind::Translate3d;
    Arguments<3> arguments(text);
    if (arguments.count < kLeast || arguments.count > kMost) return false;
    for (size_t i = 0; i < arguments.count; ++i)
        if (!ParseLength(arguments.at[i], out.lengths[i])) return false;
    return true;
}

template <TransformKind kKind>
bool ReadAngle(std::string_view text, TransformOperation& out) {
    out.kind = kKind;
    return ParseAngle(text, out.numbers[0]);
}

bool ReadRotate3d(std::string_view text, TransformOperation& out) {
    out.kind = TransformKind::Rotate3d;
    Arguments<4> arguments(text);
    if (arguments.count != 4) return false;
    for (size_t i = 0; i < 3; ++i)
        if (!ParseFloat(arguments.at[i], out.numbers[i])) return false;
    return ParseAngle(arguments.at[3], out.numbers[3]);
}

template <size_t kAxis>
bool ReadScaleAxis(std::string_view text, TransformOperation& out) {
    out.kind = TransformKind::Scale3d;
    out.numbers[0] = out.numbers[1] = out.numbers[2] = 1;
    return ParseFloat(text, out.numbers[kAxis]);
}

template <size_t kMost>
bool ReadScale(std::string_view text, TransformOperation& out) {
    out.kind = TransformKind::Scale3d;
    out.numbers[0] = out.numbers[1] = out.numbers[2] = 1;
    Arguments<3> arguments(text);
    if (arguments.count > kMost) return false;
    for (size_t i = 0; i < arguments.count; ++i)
        if (!ParseFloat(arguments.at[i], out.numbers[i])) return false;
    // scale(x) scales both axes (CSS Transforms Module Level 1, 12.1).
    if (kMost == 2 && arguments.count == 1) out.numbers[1] = out.numbers[0];
    return true;
}

bool ReadMatrix3d(std::string_view text, TransformOperation& out) {
    out.kind = TransformKind::Matrix;
    Arguments<16> arguments(text);
    if (arguments.count != 16) return false;
    for (size_t i = 0; i < 16; ++i)
        if (!ParseFloat(arguments.at[i], out.numbers[i])) return false;
    return true;
}

bool ReadMatrix(std::string_view text, TransformOperation& out) {
    out.kind = TransformKind::Matrix;
    Arguments<6> arguments(text);
    if (arguments.count != 6) return false;
    static constexpr size_t kPlaces[] = {0, 1, 4, 5, 12, 13};
    for (size_t i = 0; i < 6; ++i)
        if (!ParseFloat(arguments.at[i], out.numbers[kPlaces[i]])) return false;
    out.numbers[10] = out.numbers[15] = 1;
    return true;
}

struct TransformFunction {
    std::string_view name;
    ArgumentReader read;
};

constexpr TransformFunction kFunctions[] = {
    {"translateX", ReadTranslateAxis<TransformKind::TranslateX>},
    {"translateY", ReadTranslateAxis<TransformKind::TranslateY>},
    {"translateZ", ReadTranslateAxis<TransformKind::TranslateZ>},
    {"translate3d", ReadTranslate<3, 3>},
    {"translate", ReadTranslate<1, 2>},
    {"rotateX", ReadAngle<TransformKind::RotateX>},
    {"rotateY", ReadAngle<TransformKind::RotateY>},
    {"rotateZ", ReadAngle<TransformKind::RotateZ>},
    {"rotate3d", ReadRotate3d},
    {"rotate", ReadAngle<TransformKind::RotateZ>},
    {"scale3d", ReadScale<3>},
    {"scaleX", ReadScaleAxis<0>},
    {"scaleY", ReadScaleAxis<1>},
    {"scaleZ", ReadScaleAxis<2>},
    {"scale", ReadScale<2>},
    {"skewX", ReadAngle<TransformKind::SkewX>},
    {"skewY", ReadAngle<TransformKind::SkewY>},
    {"matrix3d", ReadMatrix3d},
    {"matrix", ReadMatrix},
};

bool ParseOperation(std::string_view text, TransformOperation& out) {
    for (const TransformFunction& function : kFunctions) {
        std::string_view arguments;
        if (TakeFunction(text, function.name, arguments)) return function.read(arguments, out);
    }
    return false;
}

void SerialiseOperation(const TransformOperation& operation, CssString& out) {
    static constexpr std::string_view kNames[] = {
        "",        "translateX", "translateY", "translateZ", "translate3d", "rotateX", "rotateY",
        "rotateZ", "rotate3d",   "scale3d",    "skewX",      "skewY",       "matrix3d"};
    out.append(kNames[static_cast<size_t>(operation.kind)]);
    out.push_back('(');
    auto list = [&](size_t count, auto&& write) {
        for (size_t i = 0; i < count; ++i) {
            if (i > 0) out.append(", ");
            write(i);
        }
    };
    auto number = [&](size_t i) { AppendNumber(operation.numbers[i], out); };
    switch (operation.kind) {
        case TransformKind::TranslateX:
        case TransformKind::TranslateY:
        case TransformKind::TranslateZ:
            Serialise(operation.lengths[0], out);
            break;
        case TransformKind::Translate3d:
            list(3, [&](size_t i) { Serialise(operation.lengths[i], out); });
            break;
        case TransformKind::Scale3d:
            list(3, number);
            break;
        case TransformKind::Matrix:
            list(16, number);
            break;
        case TransformKind::Rotate3d:
            list(4, number);
            out.append("deg");
            break;
        default:
            number(0);
            out.append("deg");
    }
    out.push_back(')');
}

}  // namespace

bool Parse(std::string_view text, Transform& out) {
    if (EqualsIgnoreCase(text, "none")) return true;
    WordReader words(text);
    std::string_view word;
    uint32_t count = 0;
    while (words.Next(word)) {
        if (++count > kMaxTransformOperations) continue;
        if (!ParseOperation(word, out.operations.emplace_back())) return false;
    }
    if (count > kMaxTransformOperations) {
        LogWarning("Maximum transform operations reached: ", count,
                   ". The rest of the operations will be ignored!");
    }
    return count > 0;
}

void Serialise(const Transform& value, CssString& out) {
    if (value.empty()) out.append("none");
    bool first = true;
    for (const TransformOperation& operation : value.operations) {
        if (!first) out.push_back(' ');
        first = false;
        SerialiseOperation(operation, out);
    }
}

bool Parse(std::string_view text, TransformOrigin& out) {
    out = TransformOrigin();
    Words<3> words(text);
    if (words.count < 1 || words.count > 3) return false;
    // The third word, the depth, follows the pair.
    if (words.count == 3) {
        if (!ParseLength(words.at[2], out.z) || out.z.unit == LengthUnit::Percent) return false;
        text = text.substr(0, static_cast<size_t>(words.at[1].data() + words.at[1].size() - text.data()));
    }
    return ParsePosition(text, out.x, out.y);
}

void Serialise(const TransformOrigin& value, CssString& out) {
    Serialise(value.x, out);
    out.push_back(' ');
    Serialise(value.y, out);
    if (value.z == Length()) return;
    out.push_back(' ');
    Serialise(value.z, out);
}

bool Parse(std::string_view text, PerspectiveOrigin& out) {
    return ParsePosition(text, out.x, out.y);
}

void Serialise(const PerspectiveOrigin& value, CssString& out) {
    Serialise(value.x, out);
    out.push_back(' ');
    Serialise(value.y, out);
}

bool Parse(std::string_view text, Perspective& out) {
    out = Perspective();
    if (EqualsIgnoreCase(text, "none")) return true;
    out.kind = PerspectiveKind::Length;
    return ParseLength(text, out.length) && out.length.value >= 0;
}

void Serialise(const Perspective& value, CssString& out) {
    if (value.kind == PerspectiveKind::None)
        out.append("none");
    else
        Serialise(value.length, out);
}

bool Parse(std::string_view text, ZIndex& out) {
    out = ZIndex();
    if (EqualsIgnoreCase(text, "auto")) return true;
    out.kind = ZIndexKind::Value;
    return ParseInt(text, out.value);
}

void Serialise(const ZIndex& value, CssString& out) {
    if (value.kind == ZIndexKind::Auto) {
        out.append("auto");
        return;
    }
    char buffer[16];
    auto [end, error] = std::to_chars(buffer, buffer + sizeof buffer, value.value);
    out.append(std::string_view(buffer, static_cast<size_t>(end - buffer)));
}

}  // namespace qorvex::css
