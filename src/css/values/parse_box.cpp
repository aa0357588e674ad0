// Text forms of the box records.
#include <charconv>
#include <cmath>

#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

void AppendNumber(float value, CssString& out) {
    if (!std::isfinite(value) || value == 0) value = 0;
    char buffer[64];
    auto [end, error] = std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::fixed);
    // The longest: "0.", 45 zeros and 9 digits of the smallest float with its sign.
    out.append(std::string_view(buffer, error == std::errc() ? static_cast<size_t>(end - buffer) : 0));
}

bool Parse(std::string_view text, Length& out) {
    return ParseLength(text, out);
}

void Serialise(const Length& value, CssString& out) {
    static constexpr std::string_view kSuffixes[] = {"px",   "%",  "vw",  "vh", "vmin",
                                                     "vmax", "em", "rem", "in", "pt"};
    AppendNumber(value.value, out);
    out.append(kSuffixes[static_cast<size_t>(value.unit)]);
}

bool Parse(std::string_view text, Extent& out) {
    if (EqualsIgnoreCase(text, "auto")) {
        out = Extent::Auto();
        return true;
    }
    Length length;
    if (!ParseLength(text, length)) return false;
    out = Extent::Of(length);
    return true;
}

void Serialise(const Extent& value, CssString& out) {
    static constexpr std::string_view kWords[] = {"auto", "inherit", "initial"};
    if (value.IsLength())
        Serialise(value.AsLength(), out);
    else
        out.append(kWords[static_cast<size_t>(value.kind)]);
}

static constexpr std::string_view kBorderWidthWords[] = {"medium", "thin", "thick"};

bool Parse(std::string_view text, BorderWidth& out) {
    int word = FindKeyword(kBorderWidthWords, text);
    if (word >= 0) {
        out = {static_cast<BorderWidthKind>(word)};
        return true;
    }
    Length length;
    if (!ParseLength(text, length) || length.value < 0) return false;
    out = BorderWidth::Of(length);
    return true;
}

void Serialise(const BorderWidth& value, CssString& out) {
    switch (value.kind) {
        case BorderWidthKind::Length:
            return Serialise(value.AsLength(), out);
        case BorderWidthKind::Initial:
            out.append("initial");
            return;
        case BorderWidthKind::Inherit:
            out.append("inherit");
            return;
        default:
            out.append(kBorderWidthWords[static_cast<size_t>(value.kind)]);
    }
}

namespace {

bool ParseFactor(std::string_view text, float& out) {
    return ParseFloat(text, out) && out >= 0;
}

// The word initial stands for auto, the initial value of flex-basis.
bool ParseBasis(std::string_view text, CSSFlexValue& out) {
    if (EqualsIgnoreCase(text, "auto") || EqualsIgnoreCase(text, "initial")) {
        out.basisKind = FlexBasisKind::Auto;
    } else if (EqualsIgnoreCase(text, "inherit")) {
        out.basisKind = FlexBasisKind::Inherit;
    } else {
        if (!ParseLength(text, out.basis) || out.basis.value < 0) return false;
        out.basisKind = FlexBasisKind::Length;
    }
    return true;
}

void SetGrow(float grow, CSSFlexValue& out) {
    out.hasGrow = true;
    out.grow = grow;
}

bool ParseFlexWord(std::string_view word, CSSFlexValue& out) {
    if (EqualsIgnoreCase(word, "none")) {
        SetGrow(0, out);
        out.hasShrink = true;
        return true;
    }
    if (EqualsIgnoreCase(word, "initial") || EqualsIgnoreCase(word, "auto")) {
        SetGrow(ToLower(word[0]) == 'a' ? 1 : 0, out);
        return true;
    }
    float grow;
    if (!ParseFactor(word, grow)) return ParseBasis(word, out);
    SetGrow(grow, out);
    return true;
}

}  // namespace

bool Parse(std::string_view text, CSSFlexValue& out) {
    Words<3> words(text);
    if (words.count == 0) return false;
    out = CSSFlexValue();
    // CSS Flexible Box Layout, 7.2: a basis that is left out beside a number is 0.
    float number;
    if (ParseFactor(words.at[0], number)) {
        out.basisKind = FlexBasisKind::Length;
        out.basis = Length::Percent(0);
    }
    if (words.count == 1) return ParseFlexWord(words.at[0], out);
    if (out.basisKind != FlexBasisKind::Length) return false;
    SetGrow(number, out);
    out.hasShrink = ParseFactor(words.at[1], out.shrink);
    if (!out.hasShrink) out.shrink = 0;
    if (words.count == 2) return out.hasShrink || ParseBasis(words.at[1], out);
    return out.hasShrink && ParseBasis(words.at[2], out);
}

void Serialise(const CSSFlexValue& value, CssString& out) {
    if (value.inherit) {
        out.append("inherit");
        return;
    }
    bool zeroBasis = value.basisKind == FlexBasisKind::Length && value.basis == Length::Percent(0);
    bool lengthBasis = value.basisKind == FlexBasisKind::Length;
    if (value.hasGrow || !lengthBasis) {
        AppendNumber(value.grow, out);
        // No text stands for "nothing given"; this one lays out the same.
        if (value.hasShrink || !value.hasGrow) {
            out.push_back(' ');
            AppendNumber(value.shrink, out);
        }
        if (zeroBasis) return;
        out.push_back(' ');
    }
    if (lengthBasis)
        Serialise(value.basis, out);
    else
        out.append(value.basisKind == FlexBasisKind::Inherit ? "inherit" : "auto");
}

bool Parse(std::string_view text, Containment& out) {
    out.bits = 0;
    if (EqualsIgnoreCase(text, "none")) return true;
    if (EqualsIgnoreCase(text, "strict")) out.bits = kContainStrict;
    if (EqualsIgnoreCase(text, "content")) out.bits = kContainContent;
    if (out.bits) return true;
    static constexpr std::string_view kWords[] = {"size", "layout", "style", "paint"};
    WordReader words(text);
    std::string_view word;
    while (words.Next(word)) {
        int index = FindKeyword(kWords, word);
        if (index < 0 || (out.bits & (1 << index))) return false;
        out.bits = static_cast<uint8_t>(out.bits | (1 << index));
    }
    return out.bits != 0;
}

void Serialise(const Containment& value, CssString& out) {
    if (value.bits == 0) out.append("none");
    if (value.bits == kContainStrict) out.append("strict");
    if (value.bits == kContainContent) out.append("content");
    if (value.bits == 0 || value.bits == kContainStrict || value.bits == kContainContent) return;
    static constexpr std::string_view kWords[] = {"size ", "layout ", "style ", "paint "};
    for (int i = 0; i < 4; ++i)
        if (value.bits & (1 << i)) out.append(kWords[i]);
    out.pop_back();
}

bool Parse(std::string_view text, BorderRadius& out) {
    Words<2> words(text);
    if (words.count < 1 || words.count > 2) return false;
    if (!ParseLength(words.at[0], out.horizontal)) return false;
    out.vertical = out.horizontal;
    if (words.count == 2 && !ParseLength(words.at[1], out.vertical)) return false;
    return out.horizontal.value >= 0 && out.vertical.value >= 0;
}

void Serialise(const BorderRadius& value, CssString& out) {
    Serialise(value.horizontal, out);
    if (value.vertical == value.horizontal) return;
    out.push_back(' ');
    Serialise(value.vertical, out);
}

bool Parse(std::string_view text, Opacity& out) {
    if (!ParseFloat(text, out.value)) return false;
    out.value = std::fmin(1, std::fmax(0, out.value));
    return true;
}

void Serialise(const Opacity& value, CssString& out) {
    AppendNumber(value.value, out);
}

bool Parse(std::string_view text, FloatParam& out) {
    return ParseFloat(text, out.value);
}

void Serialise(const FloatParam& value, CssString& out) {
    AppendNumber(value.value, out);
}

bool Parse(std::string_view text, StringParam& out) {
    out.value = text;
    return true;
}

void Serialise(const StringParam& value, CssString& out) {
    out.append(value.value);
}

}  // namespace qorvex::css
