// Keyword values: one table of words per enum, from which the enum, its parser and its serialiser are
// derived. The place of a word in its table is the number that is stored, so words may only be appended.
// Words named Inherit and Initial are never stored in a computed style: they become the kind of the
// declaration or the property's initial value when a declaration is made.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <type_traits>

// clang-format off
#define QORVEX_CSS_DISPLAY(W) \
    W(Simple, "simple") W(Inline, "inline") W(Block, "block") W(Flex, "flex") W(None, "none") \
    W(Inherit, "inherit")
#define QORVEX_CSS_OVERFLOW(W) \
    W(Visible, "visible") W(Hidden, "hidden") W(Scroll, "scroll") W(Auto, "auto") W(Inherit, "inherit")
#define QORVEX_CSS_POSITION(W) \
    W(Static, "static") W(Relative, "relative") W(Absolute, "absolute") W(Fixed, "fixed") \
    W(Inherit, "inherit")
#define QORVEX_CSS_FLEX_DIRECTION(W) \
    W(Row, "row") W(RowReverse, "row-reverse") W(Column, "column") W(ColumnReverse, "column-reverse") \
    W(Inherit, "inherit")
#define QORVEX_CSS_JUSTIFY_CONTENT(W) \
    W(FlexStart, "flex-start") W(FlexEnd, "flex-end") W(Center, "center") \
    W(SpaceBetween, "space-between") W(SpaceAround, "space-around") W(Inherit, "inherit")
#define QORVEX_CSS_ALIGN_SELF(W) \
    W(Auto, "auto") W(FlexStart, "flex-start") W(Center, "center") W(FlexEnd, "flex-end") \
    W(Stretch, "stretch")
#define QORVEX_CSS_ALIGN_ITEMS_CONTENT(W) \
    W(FlexStart, "flex-start") W(Center, "center") W(FlexEnd, "flex-end") W(Stretch, "stretch")
#define QORVEX_CSS_FLEX_WRAP(W) \
    W(NoWrap, "nowrap") W(Wrap, "wrap") W(WrapReverse, "wrap-reverse")
#define QORVEX_CSS_BORDER_STYLE(W) \
    W(None, "none") W(Hidden, "hidden") W(Dotted, "dotted") W(Dashed, "dashed") W(Solid, "solid")
#define QORVEX_CSS_VISIBILITY(W) \
    W(Hidden, "hidden") W(Visible, "visible") W(Initial, "initial") W(Inherit, "inherit")
#define QORVEX_CSS_BLEND_MODE(W) \
    W(Normal, "normal") W(Multiply, "multiply") W(Screen, "screen") W(Overlay, "overlay") \
    W(Darken, "darken") W(Lighten, "lighten") W(ColorDodge, "color-dodge") W(ColorBurn, "color-burn") \
    W(HardLight, "hard-light") W(SoftLight, "soft-light") W(Difference, "difference") \
    W(Exclusion, "exclusion") W(Hue, "hue") W(Saturation, "saturation") W(Color, "color") \
    W(Luminosity, "luminosity") W(Additive, "additive")
#define QORVEX_CSS_ISOLATION(W) W(Auto, "auto") W(Isolate, "isolate")
#define QORVEX_CSS_USER_SELECT(W) W(None, "none") W(Auto, "auto") W(Text, "text")
#define QORVEX_CSS_POINTER_EVENTS(W) W(None, "none") W(Auto, "auto") W(Inherit, "inherit")
#define QORVEX_CSS_TEXT_ALIGN(W) \
    W(Left, "left") W(Right, "right") W(Center, "center") W(Justify, "justify") W(Inherit, "inherit") \
    W(Initial, "initial")
#define QORVEX_CSS_FONT_STYLE(W) \
    W(Inherit, "inherit") W(Normal, "normal") W(Italic, "italic") W(Oblique, "oblique")
// The number is the weight in hundreds.
#define QORVEX_CSS_FONT_WEIGHT(W) \
    W(Inherit, "inherit") W(W100, "100") W(W200, "200") W(W300, "300") W(Normal, "normal") \
    W(W500, "500") W(W600, "600") W(Bold, "bold") W(W800, "800") W(W900, "900") W(Bolder, "bolder") \
    W(Lighter, "lighter")
#define QORVEX_CSS_FONT_FIT_MODE(W) W(None, "none") W(Fit, "fit") W(Shrink, "shrink")
#define QORVEX_CSS_FONT_SDF(W) W(Auto, "auto") W(Off, "off") W(On, "on")
#define QORVEX_CSS_TEXT_OVERFLOW(W) \
    W(Clip, "clip") W(Ellipsis, "ellipsis") W(Initial, "initial") W(Inherit, "inherit")
#define QORVEX_CSS_TEXT_TRANSFORM(W) \
    W(None, "none") W(Capitalize, "capitalize") W(Uppercase, "uppercase") W(Lowercase, "lowercase") \
    W(Initial, "initial") W(Inherit, "inherit")
#define QORVEX_CSS_OVERFLOW_WRAP(W) \
    W(Normal, "normal") W(BreakWord, "break-word") W(Anywhere, "anywhere") W(Initial, "initial") \
    W(Inherit, "inherit")
#define QORVEX_CSS_WHITE_SPACE(W) \
    W(Normal, "normal") W(NoWrap, "nowrap") W(Pre, "pre") W(PreWrap, "pre-wrap") \
    W(Initial, "initial") W(Inherit, "inherit")
#define QORVEX_CSS_TRANSFORM_STYLE(W) W(Flat, "flat") W(Preserve3D, "preserve-3d")
#define QORVEX_CSS_MASK_MODE(W) W(Auto, "auto") W(Alpha, "alpha") W(Luminance, "luminance")
#define QORVEX_CSS_MASK_CLIP(W) \
    W(ContentBox, "content-box") W(PaddingBox, "padding-box") W(BorderBox, "border-box") \
    W(MarginBox, "margin-box") W(FillBox, "fill-box") W(StrokeBox, "stroke-box") \
    W(ViewBox, "view-box") W(NoClip, "no-clip")
#define QORVEX_CSS_ANIMATION_FILL(W) \
    W(None, "none") W(Forwards, "forwards") W(Backwards, "backwards") W(Both, "both")
#define QORVEX_CSS_ANIMATION_DIRECTION(W) \
    W(Normal, "normal") W(Reverse, "reverse") W(Alternate, "alternate") \
    W(AlternateReverse, "alternate-reverse")
#define QORVEX_CSS_ANIMATION_PLAY_STATE(W) W(Running, "running") W(Paused, "paused")
#define QORVEX_CSS_CURSOR(W) \
    W(Alias, "alias") W(AllScroll, "all-scroll") W(Auto, "auto") W(Cell, "cell") \
    W(ContextMenu, "context-menu") W(ColResize, "col-resize") W(Copy, "copy") \
    W(Crosshair, "crosshair") W(Default, "default") W(EResize, "e-resize") W(EWResize, "ew-resize") \
    W(Grab, "grab") W(Grabbing, "grabbing") W(Help, "help") W(Move, "move") W(NResize, "n-resize") \
    W(NEResize, "ne-resize") W(NESWResize, "nesw-resize") W(NSResize, "ns-resize") \
    W(NWResize, "nw-resize") W(NWSEResize, "nwse-resize") W(NoDrop, "no-drop") W(None, "none") \
    W(NotAllowed, "not-allowed") W(Pointer, "pointer") W(Progress, "progress") \
    W(RowResize, "row-resize") W(SResize, "s-resize") W(SEResize, "se-resize") \
    W(SWResize, "sw-resize") W(Text, "text") W(Url, "URL") W(VerticalText, "vertical-text") \
    W(WResize, "w-resize") W(Wait, "wait") W(ZoomIn, "zoom-in") W(ZoomOut, "zoom-out")
// Words that occur inside larger values.
#define QORVEX_CSS_REPEAT_MODE(W) \
    W(Repeat, "repeat") W(Space, "space") W(Round, "round") W(NoRepeat, "no-repeat")
#define QORVEX_CSS_BORDER_IMAGE_REPEAT_MODE(W) \
    W(Stretch, "stretch") W(Repeat, "repeat") W(Round, "round") W(Space, "space")
#define QORVEX_CSS_CLIP_BOX(W) \
    W(MarginBox, "margin-box") W(BorderBox, "border-box") W(PaddingBox, "padding-box") \
    W(ContentBox, "content-box")
#define QORVEX_CSS_FILL_RULE(W) W(NonZero, "nonzero") W(EvenOdd, "evenodd")
#define QORVEX_CSS_GRADIENT_SIZE(W) \
    W(ClosestSide, "closest-side") W(FarthestSide, "farthest-side") W(ClosestCorner, "closest-corner") \
    W(FarthestCorner, "farthest-corner")

// E(EnumName, table): the enums whose whole value is one word; each is the type of a property or
// an item of a list.
#define QORVEX_CSS_KEYWORD_ENUMS(E) \
    E(CSSDisplay, QORVEX_CSS_DISPLAY) \
    E(CSSOverflow, QORVEX_CSS_OVERFLOW) \
    E(CSSPosition, QORVEX_CSS_POSITION) \
    E(CSSFlexDirection, QORVEX_CSS_FLEX_DIRECTION) \
    E(CSSJustifyContent, QORVEX_CSS_JUSTIFY_CONTENT) \
    E(CSSAlignSelf, QORVEX_CSS_ALIGN_SELF) \
    E(CSSAlignItemsContent, QORVEX_CSS_ALIGN_ITEMS_CONTENT) \
    E(CSSFlexWrap, QORVEX_CSS_FLEX_WRAP) \
    E(BorderStyleType, QORVEX_CSS_BORDER_STYLE) \
    E(Visibility, QORVEX_CSS_VISIBILITY) \
    E(BlendModeType, QORVEX_CSS_BLEND_MODE) \
    E(IsolationType, QORVEX_CSS_ISOLATION) \
    E(UserSelect, QORVEX_CSS_USER_SELECT) \
    E(PointerEvents, QORVEX_CSS_POINTER_EVENTS) \
    E(TextAlignType, QORVEX_CSS_TEXT_ALIGN) \
    E(FontStyle, QORVEX_CSS_FONT_STYLE) \
    E(FontWeight, QORVEX_CSS_FONT_WEIGHT) \
    E(FontFitModeType, QORVEX_CSS_FONT_FIT_MODE) \
    E(QorSdfOption, QORVEX_CSS_FONT_SDF) \
    E(TextOverflowMode, QORVEX_CSS_TEXT_OVERFLOW) \
    E(TextTransformType, QORVEX_CSS_TEXT_TRANSFORM) \
    E(OverflowWrapMode, QORVEX_CSS_OVERFLOW_WRAP) \
    E(WhiteSpaceMode, QORVEX_CSS_WHITE_SPACE) \
    E(TransformStyleProperty, QORVEX_CSS_TRANSFORM_STYLE) \
    E(MaskModeType, QORVEX_CSS_MASK_MODE) \
    E(MaskClipType, QORVEX_CSS_MASK_CLIP) \
    E(AnimationFillModeItem, QORVEX_CSS_ANIMATION_FILL) \
    E(AnimationDirectionItem, QORVEX_CSS_ANIMATION_DIRECTION) \
    E(AnimationPlayStateItem, QORVEX_CSS_ANIMATION_PLAY_STATE) \
    E(CursorType, QORVEX_CSS_CURSOR) \
    E(RepeatMode, QORVEX_CSS_REPEAT_MODE) \
    E(BorderImageRepeatMode, QORVEX_CSS_BORDER_IMAGE_REPEAT_MODE) \
    E(ClipBox, QORVEX_CSS_CLIP_BOX) \
    E(FillRule, QORVEX_CSS_FILL_RULE) \
    E(GradientSize, QORVEX_CSS_GRADIENT_SIZE)
// clang-format on

namespace qorvex::css {

#define QORVEX_WORD(name, text) name,
#define QORVEX_ENUM(type, table) enum class type : uint8_t { table(QORVEX_WORD) };
QORVEX_CSS_KEYWORD_ENUMS(QORVEX_ENUM)
#undef QORVEX_ENUM
#undef QORVEX_WORD

// The words of an enum in the order of its values.
template <class Enum>
std::span<const std::string_view> KeywordsOf();

#define QORVEX_WORD(name, text) text,
#define QORVEX_ENUM(type, table)                                           \
    template <>                                                            \
    inline std::span<const std::string_view> KeywordsOf<type>() {          \
        static constexpr std::string_view kWords[] = {table(QORVEX_WORD)}; \
        return kWords;                                                     \
    }
QORVEX_CSS_KEYWORD_ENUMS(QORVEX_ENUM)
#undef QORVEX_ENUM
#undef QORVEX_WORD

template <class T>
concept KeywordEnum = requires {
    KeywordsOf<T>();
}
&&std::is_enum_v<T>;

// Index of the word, compared without regard to ASCII case, or -1.
[[nodiscard]] int FindKeyword(std::span<const std::string_view> words, std::string_view text);

template <KeywordEnum Enum>
[[nodiscard]] bool ParseKeyword(std::string_view text, Enum& out) {
    int index = FindKeyword(KeywordsOf<Enum>(), text);
    if (index < 0) return false;
    out = static_cast<Enum>(index);
    return true;
}

template <KeywordEnum Enum>
[[nodiscard]] std::string_view KeywordText(Enum value) {
    return KeywordsOf<Enum>()[static_cast<size_t>(value)];
}

}  // namespace qorvex::css
