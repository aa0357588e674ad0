// How the values of a property are written, told once for each value type. Keyword types tell it themselves;
// a type without an entry here does not compile.
#pragma once

#include <string>
#include <string_view>

#include "css/values/property_values.h"

namespace qorvex::css {

template <class T>
struct ValueSyntax;

#define QORVEX_SYNTAX(type, text)                       \
    template <>                                         \
    struct ValueSyntax<type> {                          \
        static constexpr std::string_view kText = text; \
    };

QORVEX_SYNTAX(Extent, "`auto`, a *length*")
QORVEX_SYNTAX(Length, "a *length*")
QORVEX_SYNTAX(BorderWidth, "`medium` (3px), `thin` (1px), `thick` (5px), a *length* not below 0")
QORVEX_SYNTAX(CSSFlexValue,
              "`none`, `auto`, *grow*, *basis*, *grow shrink*, *grow basis*, *grow shrink basis*; *basis* is "
              "`auto` or a *length* not below 0")
QORVEX_SYNTAX(Containment, "`none`, `strict`, `content`, or any of `size` `layout` `style` `paint`")
QORVEX_SYNTAX(BorderRadius, "one or two *lengths* not below 0: horizontal, vertical")
QORVEX_SYNTAX(Opacity, "a *number*, held between 0 and 1")
QORVEX_SYNTAX(FloatParam, "a *number*")
QORVEX_SYNTAX(StringParam, "any text, taken as it stands")
QORVEX_SYNTAX(Color, "a *color*")
QORVEX_SYNTAX(BorderColor, "`currentColor`, a *color*")
QORVEX_SYNTAX(ImageValue, "`none`, an *image*")
QORVEX_SYNTAX(ImageValueList, "`none`, or a list of *images* and `none`")
QORVEX_SYNTAX(BackgroundSize, "`cover`, `contain`, or one or two of `auto` and *lengths* not below 0")
QORVEX_SYNTAX(BackgroundSizeListType,
              "a list of `cover`, `contain`, or one or two of `auto` and *lengths* not below 0")
QORVEX_SYNTAX(BackgroundPosition,
              "one or two of `left` `center` `right`, `top` `center` `bottom` and *lengths*")
QORVEX_SYNTAX(BackgroundPositionList,
              "a list of *lengths*, `center`, and `left` `right` for x, `top` `bottom` for y")
QORVEX_SYNTAX(
    BackgroundRepeatType,
    "`repeat-x`, `repeat-y`, or one or two of `repeat` `round` `no-repeat` (`space` becomes `round`)")
QORVEX_SYNTAX(
    BackgroundRepeatList,
    "a list of `repeat-x`, `repeat-y`, or one or two of `repeat` `round` `no-repeat` (`space` becomes "
    "`round`)")
QORVEX_SYNTAX(BorderImageSliceType, "one to four *numbers* or *percentages* not below 0, and `fill`")
QORVEX_SYNTAX(BorderImageWidthType, "one to four of `auto`, *numbers* and *lengths* not below 0")
QORVEX_SYNTAX(BorderImageOutsetType, "one to four *numbers* or *lengths* not below 0")
QORVEX_SYNTAX(BorderImageRepeatType, "one or two of `stretch` `repeat` `round` (`space` becomes `repeat`)")
QORVEX_SYNTAX(ClipPathType,
              "`none`, a *shape*, one of `margin-box` `border-box` `padding-box` `content-box`, or both")
QORVEX_SYNTAX(
    BoxShadowListType,
    "`none`, or a list of: two to four *lengths* (x, y, blur, spread), a *color* or `currentColor`, "
    "`inset`")
QORVEX_SYNTAX(TextShadowListType,
              "`none`, or a list of: two or three *lengths* (x, y, blur), a *color* or `currentColor`")
QORVEX_SYNTAX(FilterListType,
              "`none`, or a row of `blur()` `brightness()` `contrast()` `drop-shadow()` `grayscale()` "
              "`hue-rotate()` `invert()` `opacity()` `saturate()` `sepia()` `qor-axis-blur(x y)` "
              "`qor-color-matrix(20 numbers)`")
QORVEX_SYNTAX(FontFamily, "a list of names, in quotes or as words")
QORVEX_SYNTAX(LetterSpacing, "`normal`, a *length*")
QORVEX_SYNTAX(LineHeight, "`normal`, a *number* (times the font size), a *length*")
QORVEX_SYNTAX(
    Transform,
    "`none`, or up to 16 of `translate()` `translateX()` `translateY()` `translateZ()` "
    "`translate3d()` `rotate()` `rotateX()` `rotateY()` `rotateZ()` `rotate3d()` `scale()` `scaleX()` "
    "`scaleY()` `scaleZ()` `scale3d()` `skewX()` `skewY()` `matrix()` `matrix3d()`")
QORVEX_SYNTAX(TransformOrigin,
              "one or two of `left` `center` `right` `top` `bottom` and *lengths*, then a *length* for z")
QORVEX_SYNTAX(PerspectiveOrigin, "one or two of `left` `center` `right` `top` `bottom` and *lengths*")
QORVEX_SYNTAX(Perspective, "`none`, a *length*")
QORVEX_SYNTAX(ZIndex, "`auto`, a whole *number*")
QORVEX_SYNTAX(AnimationName, "`none`, or a list of names of `@keyframes` rules and `none`")
QORVEX_SYNTAX(TimeList, "a list of *times*")
QORVEX_SYNTAX(AnimationIterationCount, "a list of `infinite` and *numbers* not below 0")
QORVEX_SYNTAX(AnimationFillMode, "a list of `none` `forwards` `backwards` `both`")
QORVEX_SYNTAX(AnimationDirection, "a list of `normal` `reverse` `alternate` `alternate-reverse`")
QORVEX_SYNTAX(AnimationPlayState, "a list of `running` `paused`")
QORVEX_SYNTAX(TimingFunctionList,
              "a list of `ease` `linear` `ease-in` `ease-out` `ease-in-out` `step-start` `step-end` "
              "`steps(n, start)` `steps(n, end)` `cubic-bezier(x1, y1, x2, y2)`")
QORVEX_SYNTAX(TransitionProperty, "`none`, `all`, or a list of property names")
#undef QORVEX_SYNTAX

// The words of a keyword type in their order, without those that are kinds of a declaration.
template <KeywordEnum Enum>
std::string KeywordSyntax() {
    std::string text;
    for (const std::string_view word : KeywordsOf<Enum>()) {
        if (word == "inherit" || word == "initial") continue;
        text += (text.empty() ? "`" : " `") + std::string(word) + "`";
    }
    return text;
}

template <class T>
std::string SyntaxOf() {
    if constexpr (std::is_same_v<T, CursorProperty>)
        return "an optional `url()` with two numbers and a comma, then one of " + KeywordSyntax<CursorType>();
    else if constexpr (KeywordEnum<T>)
        return KeywordSyntax<T>();
    else
        return std::string(ValueSyntax<T>::kText);
}

}  // namespace qorvex::css
