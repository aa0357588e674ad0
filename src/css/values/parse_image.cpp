// Text forms of images and of what places them.
#include "core/logging/log.h"
#include "css/values/gradient_text.h"
#include "css/values/number_parser.h"
#include "css/values/text_reader.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

bool ParseUrl(std::string_view text, size_t start, CssString& out) {
    if (start >= text.size() || !StartsWithIgnoreCase(text.substr(start), "url(")) {
        LogWarning("Trying to parse URL with invalid start index.");
        return false;
    }
    if (!out.empty()) {
        LogWarning("Trying to parse URL overwritting existing one.");
        return false;
    }
    std::string_view url;
    if (!TakeFunction(text.substr(start), "url", url)) return false;
    if (!url.empty() && (url[0] == '"' || url[0] == '\'')) {
        const char quote = url[0];
        if (url.size() < 2 || url.back() != quote) return false;
        url = url.substr(1, url.size() - 2);
        if (HoldsUnescaped(url, quote)) return false;
    } else if (HoldsUnescaped(url, '"') || HoldsUnescaped(url, '\'')) {
        return false;
    }
    // With both quotes in it there is no text for it.
    if (url.empty() || HoldsUnescaped(url, QuoteFor(url))) return false;
    out = url;
    return true;
}

void SerialiseUrl(std::string_view url, CssString& out) {
    const char quote = QuoteFor(url);
    out.append("url(");
    out.push_back(quote);
    out.append(url);
    out.push_back(quote);
    out.push_back(')');
}

bool Parse(std::string_view text, ImageValue& out) {
    out = ImageValue();
    if (EqualsIgnoreCase(text, "none")) return true;
    if (StartsWithIgnoreCase(text, "url(")) {
        out.kind = ImageKind::Url;
        return ParseUrl(text, 0, out.url);
    }
    out.gradient = ParseGradient(text);
    if (!out.gradient) return false;
    out.kind = static_cast<ImageKind>(static_cast<int>(ImageKind::LinearGradient) +
                                      static_cast<int>(out.gradient->kind));
    return true;
}

void Serialise(const ImageValue& value, CssString& out) {
    switch (value.kind) {
        case ImageKind::None:
            out.append("none");
            return;
        case ImageKind::Initial:
            out.append("initial");
            return;
        case ImageKind::Url:
            return SerialiseUrl(value.url, out);
        default:
            if (value.gradient) SerialiseGradient(*value.gradient, out);
    }
}

bool Parse(std::string_view text, ImageValueList& out) {
    if (EqualsIgnoreCase(text, "none")) return true;
    return ParseList(text, out, [](std::string_view item, ImageValue& image) { return Parse(item, image); });
}

void Serialise(const ImageValueList& value, CssString& out) {
    SerialiseList(value, "none", out, [](const ImageValue& item, CssString& text) { Serialise(item, text); });
}

namespace {

bool ParseCoordinate(std::string_view text, std::string_view low, std::string_view high, Length& out) {
    if (EqualsIgnoreCase(text, low)) {
        out = Length::Percent(0);
    } else if (EqualsIgnoreCase(text, "center")) {
        out = Length::Percent(50);
    } else if (EqualsIgnoreCase(text, high)) {
        out = Length::Percent(100);
    } else {
        return ParseLength(text, out);
    }
    return true;
}

bool ParseX(std::string_view text, Length& out) {
    return ParseCoordinate(text, "left", "right", out);
}
bool ParseY(std::string_view text, Length& out) {
    return ParseCoordinate(text, "top", "bottom", out);
}

bool IsVertical(std::string_view word) {
    return EqualsIgnoreCase(word, "top") || EqualsIgnoreCase(word, "bottom");
}
bool IsHorizontal(std::string_view word) {
    return EqualsIgnoreCase(word, "left") || EqualsIgnoreCase(word, "right");
}

}  // namespace

bool ParsePosition(std::string_view text, Length& x, Length& y) {
    Words<2> words(text);
    if (words.count < 1 || words.count > 2) return false;
    std::string_view first = words.at[0];
    std::string_view second = words.count == 2 ? words.at[1] : std::string_view("center");
    bool swapped = IsVertical(first) || (words.count == 2 && IsHorizontal(second));
    if (swapped) std::swap(first, second);
    return ParseX(first, x) && ParseY(second, y);
}

bool ParsePositionListX(std::string_view text, BackgroundPositionList& out) {
    return ParseList(text, out, ParseX);
}

bool ParsePositionListY(std::string_view text, BackgroundPositionList& out) {
    return ParseList(text, out, ParseY);
}

void Serialise(const BackgroundPositionList& value, CssString& out) {
    SerialiseList(value, "0%", out, [](const Length& item, CssString& text) { Serialise(item, text); });
}

bool Parse(std::string_view text, BackgroundPosition& out) {
    return ParsePosition(text, out.x, out.y);
}

void Serialise(const BackgroundPosition& value, CssString& out) {
    Serialise(value.x, out);
    out.push_back(' ');
    Serialise(value.y, out);
}

bool Parse(std::string_view text, BackgroundSize& out) {
    out = BackgroundSize();
    if (EqualsIgnoreCase(text, "cover")) {
        out.mode = BackgroundSizeMode::Cover;
        return true;
    }
    if (EqualsIgnoreCase(text, "contain")) {
        out.mode = BackgroundSizeMode::Contain;
        return true;
    }
    Words<2> words(text);
    if (words.count < 1 || words.count > 2 || !Parse(words.at[0], out.width)) return false;
    if (words.count == 2 && !Parse(words.at[1], out.height)) return false;
    return out.width.value >= 0 && out.height.value >= 0;
}

void Serialise(const BackgroundSize& value, CssString& out) {
    if (value.mode != BackgroundSizeMode::Size) {
        out.append(value.mode == BackgroundSizeMode::Cover ? "cover" : "contain");
        return;
    }
    Serialise(value.width, out);
    if (!value.height.IsLength()) return;
    out.push_back(' ');
    Serialise(value.height, out);
}

bool Parse(std::string_view text, BackgroundSizeListType& out) {
    return ParseList(text, out,
                     [](std::string_view item, BackgroundSize& size) { return Parse(item, size); });
}

void Serialise(const BackgroundSizeListType& value, CssString& out) {
    SerialiseList(value, "auto", out,
                  [](const BackgroundSize& item, CssString& text) { Serialise(item, text); });
}

namespace {

bool ParseRepeatWord(std::string_view word, RepeatMode& out) {
    if (!ParseKeyword(word, out)) return false;
    if (out == RepeatMode::Space) {
        LogWarning("Space repeat type is not supported falling back to round");
        out = RepeatMode::Round;
    }
    return true;
}

}  // namespace

bool Parse(std::string_view text, BackgroundRepeatType& out) {
    if (EqualsIgnoreCase(text, "repeat-x")) {
        out = {RepeatMode::Repeat, RepeatMode::NoRepeat};
        return true;
    }
    if (EqualsIgnoreCase(text, "repeat-y")) {
        out = {RepeatMode::NoRepeat, RepeatMode::Repeat};
        return true;
    }
    Words<2> words(text);
    if (words.count < 1 || words.count > 2 || !ParseRepeatWord(words.at[0], out.x)) return false;
    out.y = out.x;
    return words.count == 1 || ParseRepeatWord(words.at[1], out.y);
}

void Serialise(const BackgroundRepeatType& value, CssString& out) {
    Serialise(value.x, out);
    if (value.y == value.x) return;
    out.push_back(' ');
    Serialise(value.y, out);
}

bool Parse(std::string_view text, BackgroundRepeatList& out) {
    return ParseList(text, out,
                     [](std::string_view item, BackgroundRepeatType& type) { return Parse(item, type); });
}

void Serialise(const BackgroundRepeatList& value, CssString& out) {
    SerialiseList(value, "repeat", out,
                  [](const BackgroundRepeatType& item, CssString& text) { Serialise(item, text); });
}

bool Parse(std::string_view text, MaskModeType& out) {
    if (!ParseKeyword(text, out)) return false;
    if (out == MaskModeType::Luminance) {
        LogWarning("mask-mode Luminance currently not supported falling back to alpha");
        out = MaskModeType::Alpha;
    }
    return true;
}

void Serialise(const MaskModeType& value, CssString& out) {
    out.append(KeywordText(value));
}

bool Parse(std::string_view text, MaskClipType& out) {
    if (!ParseKeyword(text, out)) return false;
    if (out > MaskClipType::BorderBox) {
        LogWarning(KeywordText(out), " for mask-clip is currently not supported falling back to border-box");
        out = MaskClipType::BorderBox;
    }
    return true;
}

void Serialise(const MaskClipType& value, CssString& out) {
    out.append(KeywordText(value));
}

}  // namespace qorvex::css
