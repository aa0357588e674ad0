// Text forms of shadows, filters and the cursor.
#include <cstdio>

#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

bool ParseShadow(std::string_view text, bool isBox, ShadowItem& out) {
    out = ShadowItem();
    Words<6> words(text);
    if (words.count < 2 || words.count > 6) return false;
    Length* const lengths[] = {&out.offsetX, &out.offsetY, &out.blur, &out.spread};
    size_t lengthCount = 0;
    const size_t mostLengths = isBox ? 4 : 3;
    bool hasColor = false;
    for (size_t i = 0; i < words.count; ++i) {
        std::string_view word = words.at[i];
        BorderColor color;
        if (isBox && EqualsIgnoreCase(word, "inset")) {
            if (out.inset) return false;
            out.inset = true;
        } else if (lengthCount < mostLengths && ParseLength(word, *lengths[lengthCount])) {
            ++lengthCount;
        } else if (EqualsIgnoreCase(word, "initial") || Parse(word, color)) {
            // The initial colour of a shadow is the current one.
            if (hasColor) return false;
            hasColor = true;
            out.color = color;
        } else {
            return false;
        }
    }
    return lengthCount >= 2 && out.blur.value >= 0;
}

void SerialiseShadow(const ShadowItem& shadow, bool isBox, CssString& out) {
    Serialise(shadow.offsetX, out);
    out.push_back(' ');
    Serialise(shadow.offsetY, out);
    out.push_back(' ');
    Serialise(shadow.blur, out);
    if (isBox) {
        out.push_back(' ');
        Serialise(shadow.spread, out);
    }
    out.push_back(' ');
    Serialise(shadow.color, out);
    if (shadow.inset) out.append(" inset");
}

bool Parse(std::string_view text, BoxShadowListType& out) {
    if (EqualsIgnoreCase(text, "none")) return true;
    return ParseList(
        text, out, [](std::string_view item, ShadowItem& shadow) { return ParseShadow(item, true, shadow); });
}

void Serialise(const BoxShadowListType& value, CssString& out) {
    SerialiseList(value, "none", out,
                  [](const ShadowItem& item, CssString& text) { SerialiseShadow(item, true, text); });
}

bool Parse(std::string_view text, TextShadowListType& out) {
    if (EqualsIgnoreCase(text, "none")) return true;
    return ParseList(text, out, [](std::string_view item, ShadowItem& shadow) {
        return ParseShadow(item, false, shadow);
    });
}

void Serialise(const TextShadowListType& value, CssString& out) {
    SerialiseList(value, "none", out,
                  [](const ShadowItem& item, CssString& text) { SerialiseShadow(item, false, text); });
}

namespace {

enum class FilterArgument : uint8_t { Radius, AxisRadii, Amount, Shadow, Angle, Matrix };

struct FilterName {
    std::string_view name;
    FilterArgument argument;
    float whenEmpty;  // the amount of a function without argument (Filter Effects Module Level 1, 6)
};

// In the order of FilterKind, which starts at 1.
constexpr FilterName kFilterNames[] = {
    {"blur", FilterArgument::Radius, 0},
    {"brightness", FilterArgument::Amount, 1},
    {"contrast", FilterArgument::Amount, 1},
    {"drop-shadow", FilterArgument::Shadow, 0},
    {"grayscale", FilterArgument::Amount, 1},
    {"hue-rotate", FilterArgument::Angle, 0},
    {"invert", FilterArgument::Amount, 1},
    {"opacity", FilterArgument::Amount, 1},
    {"saturate", FilterArgument::Amount, 1},
    {"sepia", FilterArgument::Amount, 1},
    {"qor-color-matrix", FilterArgument::Matrix, 0},
    {"qor-axis-blur", FilterArgument::AxisRadii, 0},
};

const FilterName& NameOf(FilterKind kind) {
    return kFilterNames[static_cast<size_t>(kind) - 1];
}

bool ParseAmount(std::string_view text, FilterFunction& out) {
    out.isPercent = text.ends_with('%');
    if (out.isPercent) text.remove_suffix(1);
    return ParseFloat(text, out.amount) && out.amount >= 0;
}

// Reads the next number or length of a list that commas or spaces separate.
bool NextArgument(std::string_view& rest, std::string_view& item) {
    rest = Trim(rest);
    if (rest.empty()) return false;
    size_t end = std::min(rest.find_first_of(", \t\n\r\f"), rest.size());
    item = rest.substr(0, end);
    rest = Trim(rest.substr(end));
    if (!rest.empty() && rest.front() == ',') rest.remove_prefix(1);
    return true;
}

bool ParseMatrix(std::string_view text, FilterFunction& out) {
    std::string_view item;
    size_t count = 0;
    while (NextArgument(text, item))
        if (count == out.matrix.size() || !ParseFloat(item, out.matrix[count++])) return false;
    return count == out.matrix.size();
}

bool ParseRadii(std::string_view text, FilterFunction& out) {
    std::string_view x, y;
    if (!NextArgument(text, x) || !NextArgument(text, y) || !Trim(text).empty()) return false;
    return ParseLength(x, out.radiusX) && ParseLength(y, out.radiusY) && out.radiusX.value >= 0 &&
           out.radiusY.value >= 0;
}

bool ParseFilterArgument(std::string_view text, FilterFunction& out) {
    const FilterName& name = NameOf(out.kind);
    switch (name.argument) {
        case FilterArgument::Radius:
            return text.empty() || (ParseLength(text, out.radiusX) && out.radiusX.value >= 0);
        case FilterArgument::AxisRadii:
            return ParseRadii(text, out);
        case FilterArgument::Amount:
            out.amount = name.whenEmpty;
            return text.empty() || ParseAmount(text, out);
        case FilterArgument::Shadow:
            return ParseShadow(text, false, out.shadow);
        case FilterArgument::Angle:
            return text.empty() || ParseAngle(text, out.amount);
        case FilterArgument::Matrix:
            return ParseMatrix(text, out);
    }
    return false;
}

bool ParseFilter(std::string_view text, FilterFunction& out) {
    for (size_t i = 0; i < std::size(kFilterNames); ++i) {
        std::string_view argument;
        if (!TakeFunction(text, kFilterNames[i].name, argument)) continue;
        out.kind = static_cast<FilterKind>(i + 1);
        return ParseFilterArgument(argument, out);
    }
    return false;
}

void SerialiseFilter(const FilterFunction& filter, CssString& out) {
    const FilterName& name = NameOf(filter.kind);
    out.append(name.name);
    out.push_back('(');
    switch (name.argument) {
        case FilterArgument::AxisRadii:
            Serialise(filter.radiusX, out);
            out.push_back(' ');
            Serialise(filter.radiusY, out);
            break;
        case FilterArgument::Radius:
            Serialise(filter.radiusX, out);
            break;
        case FilterArgument::Shadow:
            SerialiseShadow(filter.shadow, false, out);
            break;
        case FilterArgument::Amount:
        case FilterArgument::Angle:
            AppendNumber(filter.amount, out);
            out.append(name.argument == FilterArgument::Angle ? "deg" : filter.isPercent ? "%" : "");
            break;
        case FilterArgument::Matrix:
            for (size_t i = 0; i < filter.matrix.size(); ++i) {
                char buffer[64];
                int length =
                    std::snprintf(buffer, sizeof buffer, "%s%.3f", i ? "," : "", double{filter.matrix[i]});
                out.append(std::string_view(buffer, static_cast<size_t>(length)));
            }
    }
    out.push_back(')');
}

}  // namespace

bool Parse(std::string_view text, FilterListType& out) {
    if (EqualsIgnoreCase(text, "none")) return true;
    WordReader words(text);
    std::string_view word;
    while (words.Next(word))
        if (!ParseFilter(word, out.items.emplace_back())) return false;
    return !out.empty();
}

void Serialise(const FilterListType& value, CssString& out) {
    if (value.empty()) out.append("none");
    for (size_t i = 0; i < value.size(); ++i) {
        if (i > 0) out.push_back(' ');
        SerialiseFilter(value[i], out);
    }
}

// url(a.png), pointer: the hot spot that the standard allows after the url is read over.
bool Parse(std::string_view text, CursorProperty& out) {
    out = CursorProperty();
    if (!StartsWithIgnoreCase(text, "url("))
        return ParseKeyword(text, out.type) && out.type != CursorType::Url;
    ListReader list(text);
    std::string_view first, word;
    if (!list.Next(first)) return false;
    WordReader words(first);
    std::string_view url, extra;
    if (!words.Next(url) || !ParseUrl(url, 0, out.url)) return false;
    out.type = CursorType::Url;
    bool hasWord = false;
    float number;
    while (words.Next(extra)) {
        if (ParseFloat(extra, number)) continue;
        if (hasWord || !ParseKeyword(extra, out.type)) return false;
        hasWord = true;
    }
    if (!list.Next(word)) return true;
    return !hasWord && ParseKeyword(word, out.type) && !list.Next(extra);
}

void Serialise(const CursorProperty& value, CssString& out) {
    if (value.url.empty()) {
        Serialise(value.type, out);
        return;
    }
    SerialiseUrl(value.url, out);
    if (value.type == CursorType::Url) return;
    out.append(", ");
    Serialise(value.type, out);
}

}  // namespace qorvex::css
