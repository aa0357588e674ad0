// One parser and one serialiser per value type. A parser takes a whole value text without the words inherit
// and initial, which are no values; a serialiser appends a text that its parser reads back to an equal value.
#pragma once

#include <string_view>

#include "css/values/property_values.h"
#include "css/values/text_reader.h"

namespace qorvex::css {

// clang-format off
#define QORVEX_CSS_RECORD_TYPES(V) \
    V(Extent) V(Length) V(BorderWidth) V(CSSFlexValue) V(Containment) V(BorderRadius) V(Opacity) \
    V(FloatParam) V(StringParam) V(Color) V(BorderColor) V(ImageValue) V(ImageValueList) \
    V(BackgroundSize) V(BackgroundSizeListType) V(BackgroundPosition) V(BackgroundRepeatType) \
    V(BackgroundRepeatList) V(BorderImageSliceType) V(BorderImageWidthType) V(BorderImageOutsetType) \
    V(BorderImageRepeatType) V(ClipPathType) V(BoxShadowListType) V(TextShadowListType) \
    V(FilterListType) V(CursorProperty) V(FontFamily) V(LetterSpacing) V(LineHeight) V(Transform) \
    V(TransformOrigin) V(PerspectiveOrigin) V(Perspective) V(ZIndex) V(AnimationName) V(TimeList) \
    V(AnimationIterationCount) V(AnimationFillMode) V(AnimationDirection) V(TimingFunctionList) \
    V(AnimationPlayState) V(TransitionProperty) V(MaskModeType) V(MaskClipType) V(FontWeight)
// clang-format on

#define QORVEX_DECLARE(type) [[nodiscard]] bool Parse(std::string_view text, type& out);
QORVEX_CSS_RECORD_TYPES(QORVEX_DECLARE)
#undef QORVEX_DECLARE

#define QORVEX_DECLARE(type) void Serialise(const type& value, CssString& out);
QORVEX_CSS_RECORD_TYPES(QORVEX_DECLARE)
#undef QORVEX_DECLARE

void Serialise(const BackgroundPositionList& value, CssString& out);

// The stricter readers that rows of the property table name.
[[nodiscard]] bool ParsePositionListX(std::string_view text, BackgroundPositionList& out);
[[nodiscard]] bool ParsePositionListY(std::string_view text, BackgroundPositionList& out);
[[nodiscard]] bool ParseDurations(std::string_view text, TimeList& out);  // none below 0

// Items of lists, which shorthands read one by one.
[[nodiscard]] bool Parse(std::string_view text, TimingFunction& out);
[[nodiscard]] bool Parse(std::string_view text, IterationCount& out);
// One or two words, of which the first may be the vertical one when it is a keyword.
[[nodiscard]] bool ParsePosition(std::string_view text, Length& x, Length& y);
[[nodiscard]] bool ParseShadow(std::string_view text, bool isBox, ShadowItem& out);
void SerialiseShadow(const ShadowItem& shadow, bool isBox, CssString& out);
// url( ) with or without quotes, from `start` to the end of the text. A url that `out` already has is not
// replaced.
[[nodiscard]] bool ParseUrl(std::string_view text, size_t start, CssString& out);
void SerialiseUrl(std::string_view url, CssString& out);

// Shortest decimal form that reads back to the same float; no exponent.
void AppendNumber(float value, CssString& out);

template <KeywordEnum Enum>
[[nodiscard]] bool Parse(std::string_view text, Enum& out) {
    if (!ParseKeyword(text, out)) return false;
    if constexpr (requires { Enum::Inherit; }) {
        if (out == Enum::Inherit) return false;
    }
    if constexpr (requires { Enum::Initial; }) {
        if (out == Enum::Initial) return false;
    }
    return true;
}

template <KeywordEnum Enum>
void Serialise(const Enum& value, CssString& out) {
    out.append(KeywordText(value));
}

// "a, b, c" with one reader or writer per item; the list is refused with any of its items.
template <class List, class Reader>
[[nodiscard]] bool ParseList(std::string_view text, List& out, Reader&& read) {
    ListReader items(text);
    std::string_view item;
    while (items.Next(item)) {
        auto& value = out.items.emplace_back();
        if (!read(item, value)) return false;
    }
    return true;
}

template <class List, class Writer>
void SerialiseList(const List& list, std::string_view whenEmpty, CssString& out, Writer&& write) {
    if (list.empty()) out.append(whenEmpty);
    bool first = true;
    for (const auto& item : list) {
        if (!first) out.append(", ");
        first = false;
        write(item, out);
    }
}

}  // namespace qorvex::css
