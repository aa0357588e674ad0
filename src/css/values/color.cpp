#include "css/values/color.h"

#include <cstdio>

#include "css/values/named_colors.h"
#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

namespace {

int HexDigit(char c) {
    if (IsDigit(c)) return c - '0';
    c = ToLower(c);
    return c >= 'a' && c <= 'f' ? c - 'a' + 10 : -1;
}

bool ParseHexColor(std::string_view digits, Color& out) {
    size_t perChannel = digits.size() <= 4 ? 1 : 2;
    if (digits.size() != 3 && digits.size() != 4 && digits.size() != 6 && digits.size() != 8) return false;
    float channels[4] = {0, 0, 0, 1};
    for (size_t i = 0; i < digits.size(); i += perChannel) {
        int high = HexDigit(digits[i]);
        int low = HexDigit(digits[i + perChannel - 1]);
        if (high < 0 || low < 0) return false;
        channels[i / perChannel] = static_cast<float>(high * 16 + low) / 255;
    }
    out = Color::Rgba(channels[0], channels[1], channels[2], channels[3]);
    return true;
}

bool ParseChannel(std::string_view text, bool isAlpha, float& out) {
    if (text.empty()) return false;
    if (text.back() == '%') {
        if (!ParseFloat(text.substr(0, text.size() - 1), out)) return false;
        out *= 0.01f;
        return out >= 0 && out <= 1;
    }
    if (!ParseFloat(text, out)) return false;
    if (isAlpha) {
        out = std::clamp(out, 0.0f, 1.0f);
        return true;
    }
    // A whole number counts 255ths and a fraction is the channel itself, so that 1.0 is a 255th.
    if (out != std::floor(out)) return out >= 0 && out <= 1;
    out = std::clamp(out, 0.0f, 255.0f) / 255;
    return true;
}

bool ParseRgb(std::string_view arguments, Color& out) {
    float channels[4] = {0, 0, 0, 1};
    size_t count = 0;
    ListReader list(arguments);
    std::string_view item;
    while (list.Next(item)) {
        if (count == 4 || !ParseChannel(item, count == 3, channels[count])) return false;
        ++count;
    }
    if (count < 3) return false;
    out = Color::Rgba(channels[0], channels[1], channels[2], channels[3]);
    return true;
}

// color(space r g b [a]); commas are taken for spaces, since the text form of such a colour has them.
bool ParseWideColor(std::string_view arguments, Color& out) {
    WordReader words(arguments);
    std::string_view space;
    if (!words.Next(space)) return false;
    bool isRec2020 = EqualsIgnoreCase(space, "rec2020");
    if (!isRec2020 && !EqualsIgnoreCase(space, "qor-scrgb")) return false;
    float v[4] = {0, 0, 0, 1};
    size_t count = 0;
    std::string_view rest = Trim(words.rest());
    while (!rest.empty()) {
        size_t end = rest.find_first_of(", \t\n\r\f");
        if (count == 4 || !ParseFloat(rest.substr(0, end), v[count])) return false;
        ++count;
        rest = end == std::string_view::npos ? std::string_view() : Trim(rest.substr(end));
        if (rest.empty() || rest.front() != ',') continue;
        rest = Trim(rest.substr(1));
        if (rest.empty()) return false;
    }
    if (count < 3) return false;
    float alpha = std::clamp(v[3], 0.0f, 1.0f);
    out = Color::Rgba(v[0], v[1], v[2], alpha);
    if (isRec2020) {
        out = Color::Rgba(1.6605f * v[0] - 0.5876f * v[1] - 0.0728f * v[2],
                          -0.1246f * v[0] + 1.1329f * v[1] - 0.0083f * v[2],
                          -0.0182f * v[0] - 0.1006f * v[1] + 1.1187f * v[2], alpha);
    }
    return true;
}

bool FindNamedColor(std::string_view text, Color& out) {
    if (EqualsIgnoreCase(text, "transparent")) {
        out = Color::Transparent();
        return true;
    }
    char lower[24];
    if (text.size() > sizeof lower) return false;
    for (size_t i = 0; i < text.size(); ++i)
        lower[i] = ToLower(text[i]);
    std::string_view name(lower, text.size());
    const NamedColor* found =
        std::lower_bound(std::begin(kNamedColors), std::end(kNamedColors), name,
                         [](const NamedColor& color, std::string_view key) { return color.name < key; });
    if (found == std::end(kNamedColors) || found->name != name) return false;
    auto channel = [&](int shift) { return static_cast<float>((found->rgb >> shift) & 255) / 255; };
    out = Color::Rgba(channel(16), channel(8), channel(0));
    return true;
}

}  // namespace

bool ParseColor(std::string_view text, Color& out) {
    if (text.size() < 3) return false;
    if (text[0] == '#') return ParseHexColor(text.substr(1), out);
    std::string_view arguments;
    if (TakeFunction(text, "rgb", arguments) || TakeFunction(text, "rgba", arguments))
        return text.size() > 9 && ParseRgb(arguments, out);
    if (TakeFunction(text, "color", arguments)) return ParseWideColor(arguments, out);
    return FindNamedColor(text, out);
}

bool Parse(std::string_view text, Color& out) {
    return ParseColor(text, out);
}

void Serialise(const Color& value, CssString& out) {
    char buffer[192];
    auto inRange = [](float channel) { return channel >= 0 && channel <= 1; };
    int length;
    if (inRange(value.red) && inRange(value.green) && inRange(value.blue)) {
        // The small addend undoes the rounding of a channel that was read as a 255th.
        auto truncated = [](float channel) { return static_cast<int>(channel * 255 + 0.001f); };
        length = std::snprintf(buffer, sizeof buffer, "rgba(%d, %d, %d, %f)", truncated(value.red),
                               truncated(value.green), truncated(value.blue), double{value.alpha});
    } else {
        length =
            std::snprintf(buffer, sizeof buffer, "color(qor-scrgb %.3f, %.3f, %.3f, %.3f)", double{value.red},
                          double{value.green}, double{value.blue}, double{value.alpha});
    }
    out.append(std::string_view(buffer, std::min<size_t>(static_cast<size_t>(length), sizeof buffer - 1)));
}

bool Parse(std::string_view text, BorderColor& out) {
    out = BorderColor();
    if (EqualsIgnoreCase(text, "currentColor")) return true;
    out.kind = ColorKind::Color;
    return ParseColor(text, out.color);
}

void Serialise(const BorderColor& value, CssString& out) {
    if (value.kind == ColorKind::Color)
        Serialise(value.color, out);
    else
        out.append(value.kind == ColorKind::CurrentColor ? "currentColor" : "initial");
}

}  // namespace qorvex::css
