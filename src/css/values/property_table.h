// The one list of CSS properties. Everything that knows a property (ids, names, style groups, parsers,
// serialisers, appliers, animation tracks, script attributes, documents) is derived from these rows; no
// second list may exist.
//
// Longhand row:
//   X(Id, "name", ValueType, Parser, field, Inheritance, Animation, ChangeClass, initial value)
//     Parser       the function that reads the value text: Parse (chosen by the value type) or one that is
//     stricter Inheritance  INHERITED or RESET Animation    ANIMATED (it has a keyframe track) or STEPPED
//     ChangeClass  what a changed value asks for: Layout, Visual, Transform, Animation, Transition
// Shorthand row: S(Id, "name", Expander)
//
// Invariant: the order is the numbering. Ids 0 to 117 are longhands in the order of the group macros below,
// 118 is their count, 119 to 138 are the shorthands. The sides run top, left, right, bottom for border widths
// but bottom, left, right, top for border styles, colours, margins and paddings.
#pragma once

#define QORVEX_CSS_LAYOUT_PROPERTIES(X)                                                                      \
    X(Display, "display", CSSDisplay, Parse, display, RESET, STEPPED, Layout, CSSDisplay::Block)             \
    X(OverflowX, "overflow-x", CSSOverflow, Parse, overflowX, RESET, STEPPED, Layout, CSSOverflow::Visible)  \
    X(OverflowY, "overflow-y", CSSOverflow, Parse, overflowY, RESET, STEPPED, Layout, CSSOverflow::Visible)  \
    X(Position, "position", CSSPosition, Parse, position, RESET, STEPPED, Layout, CSSPosition::Static)       \
    X(FlexDirection, "flex-direction", CSSFlexDirection, Parse, flexDirection, RESET, STEPPED, Layout,       \
      CSSFlexDirection::Row)                                                                                 \
    X(JustifyContent, "justify-content", CSSJustifyContent, Parse, justifyContent, RESET, STEPPED, Layout,   \
      CSSJustifyContent::FlexStart)                                                                          \
    X(AlignSelf, "align-self", CSSAlignSelf, Parse, alignSelf, RESET, STEPPED, Layout, CSSAlignSelf::Auto)   \
    X(AlignItems, "align-items", CSSAlignItemsContent, Parse, alignItems, RESET, STEPPED, Layout,            \
      CSSAlignItemsContent::Stretch)                                                                         \
    X(AlignContent, "align-content", CSSAlignItemsContent, Parse, alignContent, RESET, STEPPED, Layout,      \
      CSSAlignItemsContent::Stretch)                                                                         \
    X(FlexWrap, "flex-wrap", CSSFlexWrap, Parse, flexWrap, RESET, STEPPED, Layout, CSSFlexWrap::NoWrap)      \
    X(Flex, "flex", CSSFlexValue, Parse, flex, RESET, STEPPED, Layout, CSSFlexValue())                       \
    X(BorderTopWidth, "border-top-width", BorderWidth, Parse, borderTopWidth, RESET, ANIMATED, Layout,       \
      BorderWidth())                                                                                         \
    X(BorderLeftWidth, "border-left-width", BorderWidth, Parse, borderLeftWidth, RESET, ANIMATED, Layout,    \
      BorderWidth())                                                                                         \
    X(BorderRightWidth, "border-right-width", BorderWidth, Parse, borderRightWidth, RESET, ANIMATED, Layout, \
      BorderWidth())                                                                                         \
    X(BorderBottomWidth, "border-bottom-width", BorderWidth, Parse, borderBottomWidth, RESET, ANIMATED,      \
      Layout, BorderWidth())                                                                                 \
    X(BorderBottomStyle, "border-bottom-style", BorderStyleType, Parse, borderBottomStyle, RESET, STEPPED,   \
      Layout, BorderStyleType::None)                                                                         \
    X(BorderLeftStyle, "border-left-style", BorderStyleType, Parse, borderLeftStyle, RESET, STEPPED, Layout, \
      BorderStyleType::None)                                                                                 \
    X(BorderRightStyle, "border-right-style", BorderStyleType, Parse, borderRightStyle, RESET, STEPPED,      \
      Layout, BorderStyleType::None)                                                                         \
    X(BorderTopStyle, "border-top-style", BorderStyleType, Parse, borderTopStyle, RESET, STEPPED, Layout,    \
      BorderStyleType::None)                                                                                 \
    X(MarginBottom, "margin-bottom", Extent, Parse, marginBottom, RESET, ANIMATED, Layout,                   \
      Extent::Pixels(0))                                                                                     \
    X(MarginLeft, "margin-left", Extent, Parse, marginLeft, RESET, ANIMATED, Layout, Extent::Pixels(0))      \
    X(MarginRight, "margin-right", Extent, Parse, marginRight, RESET, ANIMATED, Layout, Extent::Pixels(0))   \
    X(MarginTop, "margin-top", Extent, Parse, marginTop, RESET, ANIMATED, Layout, Extent::Pixels(0))         \
    X(PaddingBottom, "padding-bottom", Length, Parse, paddingBottom, RESET, ANIMATED, Layout, Length())      \
    X(PaddingLeft, "padding-left", Length, Parse, paddingLeft, RESET, ANIMATED, Layout, Length())            \
    X(PaddingRight, "padding-right", Length, Parse, paddingRight, RESET, ANIMATED, Layout, Length())         \
    X(PaddingTop, "padding-top", Length, Parse, paddingTop, RESET, ANIMATED, Layout, Length())               \
    X(Width, "width", Extent, Parse, width, RESET, ANIMATED, Layout, Extent())                               \
    X(Height, "height", Extent, Parse, height, RESET, ANIMATED, Layout, Extent())                            \
    X(Top, "top", Extent, Parse, top, RESET, ANIMATED, Layout, Extent())                                     \
    X(Left, "left", Extent, Parse, left, RESET, ANIMATED, Layout, Extent())                                  \
    X(Right, "right", Extent, Parse, right, RESET, ANIMATED, Layout, Extent())                               \
    X(Bottom, "bottom", Extent, Parse, bottom, RESET, ANIMATED, Layout, Extent())                            \
    X(MinWidth, "min-width", Extent, Parse, minWidth, RESET, ANIMATED, Layout, Extent::Pixels(0))            \
    X(MinHeight, "min-height", Extent, Parse, minHeight, RESET, ANIMATED, Layout, Extent::Pixels(0))         \
    X(MaxWidth, "max-width", Extent, Parse, maxWidth, RESET, ANIMATED, Layout, Extent())                     \
    X(MaxHeight, "max-height", Extent, Parse, maxHeight, RESET, ANIMATED, Layout, Extent())                  \
    X(Contain, "contain", Containment, Parse, contain, RESET, STEPPED, Layout, Containment())

#define QORVEX_CSS_VISUAL_PROPERTIES(X)                                                                      \
    X(BackgroundImage, "background-image", ImageValueList, Parse, backgroundImage, RESET, STEPPED, Visual,   \
      ImageValueList())                                                                                      \
    X(BackgroundPositionX, "background-position-x", BackgroundPositionList, ParsePositionListX,              \
      backgroundPositionX, RESET, ANIMATED, Visual, BackgroundPositionList())                                \
    X(BackgroundPositionY, "background-position-y", BackgroundPositionList, ParsePositionListY,              \
      backgroundPositionY, RESET, ANIMATED, Visual, BackgroundPositionList())                                \
    X(BackgroundColor, "background-color", Color, Parse, backgroundColor, RESET, ANIMATED, Visual,           \
      Color::Transparent())                                                                                  \
    X(BackgroundSize, "background-size", BackgroundSizeListType, Parse, backgroundSize, RESET, ANIMATED,     \
      Visual, BackgroundSizeListType())                                                                      \
    X(MaskPosition, "mask-position", BackgroundPosition, Parse, maskPosition, RESET, ANIMATED, Visual,       \
      css::BackgroundPosition())                                                                             \
    X(MaskSize, "mask-size", css::BackgroundSize, Parse, maskSize, RESET, ANIMATED, Visual,                  \
      css::BackgroundSize())                                                                                 \
    X(BackgroundRepeat, "background-repeat", BackgroundRepeatList, Parse, backgroundRepeat, RESET, STEPPED,  \
      Visual, BackgroundRepeatList())                                                                        \
    X(MaskImage, "mask-image", ImageValue, Parse, maskImage, RESET, STEPPED, Visual, ImageValue())           \
    X(MaskMode, "mask-mode", MaskModeType, Parse, maskMode, RESET, STEPPED, Visual, MaskModeType::Auto)      \
    X(MaskClip, "mask-clip", MaskClipType, Parse, maskClip, RESET, STEPPED, Visual, MaskClipType::BorderBox) \
    X(MaskRepeat, "mask-repeat", BackgroundRepeatType, Parse, maskRepeat, RESET, STEPPED, Visual,            \
      BackgroundRepeatType::None())                                                                          \
    X(Opacity, "opacity", css::Opacity, Parse, opacity, RESET, ANIMATED, Visual, css::Opacity())             \
    X(Visibility, "visibility", css::Visibility, Parse, visibility, INHERITED, ANIMATED, Visual,             \
      css::Visibility::Visible)                                                                              \
    X(BorderTopLeftRadius, "border-top-left-radius", css::BorderRadius, Parse, borderTopLeftRadius, RESET,   \
      ANIMATED, Visual, css::BorderRadius())                                                                 \
    X(BorderTopRightRadius, "border-top-right-radius", css::BorderRadius, Parse, borderTopRightRadius,       \
      RESET, ANIMATED, Visual, css::BorderRadius())                                                          \
    X(BorderBottomLeftRadius, "border-bottom-left-radius", css::BorderRadius, Parse, borderBottomLeftRadius, \
      RESET, ANIMATED, Visual, css::BorderRadius())                                                          \
    X(BorderBottomRightRadius, "border-bottom-right-radius", css::BorderRadius, Parse,                       \
      borderBottomRightRadius, RESET, ANIMATED, Visual, css::BorderRadius())                                 \
    X(BorderBottomColor, "border-bottom-color", css::BorderColor, Parse, borderBottomColor, RESET, ANIMATED, \
      Visual, css::BorderColor())                                                                            \
    X(BorderLeftColor, "border-left-color", css::BorderColor, Parse, borderLeftColor, RESET, ANIMATED,       \
      Visual, css::BorderColor())                                                                            \
    X(BorderRightColor, "border-right-color", css::BorderColor, Parse, borderRightColor, RESET, ANIMATED,    \
      Visual, css::BorderColor())                                                                            \
    X(BorderTopColor, "border-top-color", css::BorderColor, Parse, borderTopColor, RESET, ANIMATED, Visual,  \
      css::BorderColor())                                                                                    \
    X(BorderImageSource, "border-image-source", ImageValue, Parse, borderImageSource, RESET, STEPPED,        \
      Visual, ImageValue())                                                                                  \
    X(BorderImageSlice, "border-image-slice", BorderImageSliceType, Parse, borderImageSlice, RESET, STEPPED, \
      Visual, BorderImageSliceType())                                                                        \
    X(BorderImageWidth, "border-image-width", BorderImageWidthType, Parse, borderImageWidth, RESET, STEPPED, \
      Visual, BorderImageWidthType())                                                                        \
    X(BorderImageOutset, "border-image-outset", BorderImageOutsetType, Parse, borderImageOutset, RESET,      \
      STEPPED, Visual, BorderImageOutsetType())                                                              \
    X(BorderImageRepeat, "border-image-repeat", BorderImageRepeatType, Parse, borderImageRepeat, RESET,      \
      STEPPED, Visual, BorderImageRepeatType())                                                              \
    X(ClipPath, "clip-path", ClipPathType, Parse, clipPath, RESET, ANIMATED, Visual, ClipPathType())         \
    X(BoxShadow, "box-shadow", BoxShadowListType, Parse, boxShadow, RESET, ANIMATED, Visual,                 \
      BoxShadowListType())                                                                                   \
    X(TextShadow, "text-shadow", TextShadowListType, Parse, textShadow, INHERITED, ANIMATED, Visual,         \
      TextShadowListType())                                                                                  \
    X(Filter, "filter", FilterListType, Parse, filter, RESET, ANIMATED, Visual, FilterListType())            \
    X(Isolation, "isolation", IsolationType, Parse, isolation, RESET, STEPPED, Visual, IsolationType::Auto)  \
    X(MixBlendMode, "mix-blend-mode", BlendModeType, Parse, mixBlendMode, RESET, STEPPED, Visual,            \
      BlendModeType::Normal)                                                                                 \
    X(SelectionBackgroundColor, "selection-background-color", Color, Parse, selectionBackgroundColor, RESET, \
      STEPPED, Visual, Color::SelectionBackground())                                                         \
    X(UserSelect, "user-select", css::UserSelect, Parse, userSelect, INHERITED, STEPPED, Visual,             \
      css::UserSelect::Auto)                                                                                 \
    X(PointerEvents, "pointer-events", css::PointerEvents, Parse, pointerEvents, INHERITED, STEPPED, Visual, \
      css::PointerEvents::Auto)                                                                              \
    X(Cursor, "cursor", CursorProperty, Parse, cursor, INHERITED, STEPPED, Visual, CursorProperty())         \
    X(CustomEffectName, "qor-custom-effect-name", StringParam, Parse, customEffectName, RESET, STEPPED,      \
      Visual, StringParam())                                                                                 \
    X(CustomEffectFloatParam1, "qor-custom-effect-float-param-1", FloatParam, Parse,                         \
      customEffectFloatParam1, RESET, ANIMATED, Visual, FloatParam())                                        \
    X(CustomEffectFloatParam2, "qor-custom-effect-float-param-2", FloatParam, Parse,                         \
      customEffectFloatParam2, RESET, ANIMATED, Visual, FloatParam())                                        \
    X(CustomEffectFloatParam3, "qor-custom-effect-float-param-3", FloatParam, Parse,                         \
      customEffectFloatParam3, RESET, ANIMATED, Visual, FloatParam())                                        \
    X(CustomEffectFloatParam4, "qor-custom-effect-float-param-4", FloatParam, Parse,                         \
      customEffectFloatParam4, RESET, ANIMATED, Visual, FloatParam())                                        \
    X(CustomEffectStringParam1, "qor-custom-effect-string-param-1", StringParam, Parse,                      \
      customEffectStringParam1, RESET, STEPPED, Visual, StringParam())                                       \
    X(CustomEffectStringParam2, "qor-custom-effect-string-param-2", StringParam, Parse,                      \
      customEffectStringParam2, RESET, STEPPED, Visual, StringParam())                                       \
    X(CompositionId, "qor-composition-id", StringParam, Parse, compositionId, RESET, STEPPED, Visual,        \
      StringParam())

#define QORVEX_CSS_TEXT_PROPERTIES(X)                                                                        \
    X(Color, "color", css::Color, Parse, color, INHERITED, ANIMATED, Visual, css::Color::Black())            \
    X(FontFamily, "font-family", css::FontFamily, Parse, fontFamily, INHERITED, STEPPED, Layout,             \
      css::FontFamily())                                                                                     \
    X(FontSize, "font-size", Length, Parse, fontSize, INHERITED, ANIMATED, Layout, Length::Pixels(16))       \
    X(FontStyle, "font-style", css::FontStyle, Parse, fontStyle, INHERITED, STEPPED, Layout,                 \
      css::FontStyle::Normal)                                                                                \
    X(FontWeight, "font-weight", css::FontWeight, Parse, fontWeight, INHERITED, STEPPED, Layout,             \
      css::FontWeight::Normal)                                                                               \
    X(TextAlign, "text-align", TextAlignType, Parse, textAlign, INHERITED, STEPPED, Layout,                  \
      TextAlignType::Left)                                                                                   \
    X(LetterSpacing, "letter-spacing", css::LetterSpacing, Parse, letterSpacing, INHERITED, ANIMATED,        \
      Layout, css::LetterSpacing())                                                                          \
    X(LineHeight, "line-height", css::LineHeight, Parse, lineHeight, INHERITED, ANIMATED, Layout,            \
      css::LineHeight())                                                                                     \
    X(SelectionColor, "selection-color", css::Color, Parse, selectionColor, INHERITED, STEPPED, Layout,      \
      css::Color::White())                                                                                   \
    X(FontFitMode, "font-fit-mode", FontFitModeType, Parse, fontFitMode, RESET, STEPPED, Layout,             \
      FontFitModeType::None)                                                                                 \
    X(TextOverflow, "text-overflow", TextOverflowMode, Parse, textOverflow, RESET, STEPPED, Layout,          \
      TextOverflowMode::Clip)                                                                                \
    X(TextTransform, "text-transform", TextTransformType, Parse, textTransform, INHERITED, STEPPED, Layout,  \
      TextTransformType::None)                                                                               \
    X(OverflowWrap, "overflow-wrap", OverflowWrapMode, Parse, overflowWrap, INHERITED, STEPPED, Layout,      \
      OverflowWrapMode::Normal)                                                                              \
    X(WhiteSpace, "white-space", WhiteSpaceMode, Parse, whiteSpace, INHERITED, STEPPED, Layout,              \
      WhiteSpaceMode::Normal)                                                                                \
    X(TextStrokeWidth, "text-stroke-width", Length, Parse, textStrokeWidth, INHERITED, ANIMATED, Layout,     \
      Length())                                                                                              \
    X(FontSdf, "qor-font-sdf", QorSdfOption, Parse, fontSdf, RESET, STEPPED, Layout, QorSdfOption::Auto)     \
    X(TextStrokeColor, "text-stroke-color", css::Color, Parse, textStrokeColor, INHERITED, ANIMATED, Layout, \
      css::Color::Black())

#define QORVEX_CSS_TRANSFORM_PROPERTIES(X)                                                                \
    X(Transform, "transform", css::Transform, Parse, transform, RESET, ANIMATED, Transform,               \
      css::Transform())                                                                                   \
    X(TransformOrigin, "transform-origin", css::TransformOrigin, Parse, transformOrigin, RESET, ANIMATED, \
      Transform, css::TransformOrigin())                                                                  \
    X(ZIndex, "z-index", css::ZIndex, Parse, zIndex, RESET, ANIMATED, Transform, css::ZIndex())           \
    X(Perspective, "perspective", css::Perspective, Parse, perspective, RESET, STEPPED, Transform,        \
      css::Perspective())                                                                                 \
    X(TransformStyle, "transform-style", TransformStyleProperty, Parse, transformStyle, RESET, STEPPED,   \
      Transform, TransformStyleProperty::Flat)                                                            \
    X(PerspectiveOrigin, "perspective-origin", css::PerspectiveOrigin, Parse, perspectiveOrigin, RESET,   \
      STEPPED, Transform, css::PerspectiveOrigin())

#define QORVEX_CSS_ANIMATION_PROPERTIES(X)                                                                   \
    X(AnimationName, "animation-name", css::AnimationName, Parse, animationName, RESET, STEPPED, Animation,  \
      css::AnimationName())                                                                                  \
    X(AnimationDuration, "animation-duration", css::AnimationDuration, ParseDurations, animationDuration,    \
      RESET, STEPPED, Animation, css::AnimationDuration())                                                   \
    X(AnimationIterationCount, "animation-iteration-count", css::AnimationIterationCount, Parse,             \
      animationIterationCount, RESET, STEPPED, Animation, css::AnimationIterationCount())                    \
    X(AnimationDelay, "animation-delay", css::AnimationDelay, Parse, animationDelay, RESET, STEPPED,         \
      Animation, css::AnimationDelay())                                                                      \
    X(AnimationFillMode, "animation-fill-mode", css::AnimationFillMode, Parse, animationFillMode, RESET,     \
      STEPPED, Animation, css::AnimationFillMode())                                                          \
    X(AnimationDirection, "animation-direction", css::AnimationDirection, Parse, animationDirection, RESET,  \
      STEPPED, Animation, css::AnimationDirection())                                                         \
    X(AnimationTimingFunction, "animation-timing-function", css::AnimationTimingFunction, Parse,             \
      animationTimingFunction, RESET, STEPPED, Animation, css::AnimationTimingFunction())                    \
    X(AnimationPlayState, "animation-play-state", css::AnimationPlayState, Parse, animationPlayState, RESET, \
      STEPPED, Animation, css::AnimationPlayState())

#define QORVEX_CSS_TRANSITION_PROPERTIES(X)                                                                 \
    X(TransitionProperty, "transition-property", css::TransitionProperty, Parse, transitionProperty, RESET, \
      STEPPED, Transition, css::TransitionProperty())                                                       \
    X(TransitionDuration, "transition-duration", css::TransitionDuration, ParseDurations,                   \
      transitionDuration, RESET, STEPPED, Transition, css::TransitionDuration())                            \
    X(TransitionDelay, "transition-delay", css::TransitionDelay, Parse, transitionDelay, RESET, STEPPED,    \
      Transition, css::TransitionDelay())                                                                   \
    X(TransitionTimingFunction, "transition-timing-function", css::TransitionTimingFunction, Parse,         \
      transitionTimingFunction, RESET, STEPPED, Transition, css::TransitionTimingFunction())

#define QORVEX_CSS_LONGHANDS(X)        \
    QORVEX_CSS_LAYOUT_PROPERTIES(X)    \
    QORVEX_CSS_VISUAL_PROPERTIES(X)    \
    QORVEX_CSS_TEXT_PROPERTIES(X)      \
    QORVEX_CSS_TRANSFORM_PROPERTIES(X) \
    QORVEX_CSS_ANIMATION_PROPERTIES(X) \
    QORVEX_CSS_TRANSITION_PROPERTIES(X)

#define QORVEX_CSS_SHORTHANDS(S)                                           \
    S(Animation, "animation", ExpandAnimation)                             \
    S(Margin, "margin", ExpandMargin)                                      \
    S(Padding, "padding", ExpandPadding)                                   \
    S(BorderWidth, "border-width", ExpandBorderWidth)                      \
    S(BorderColor, "border-color", ExpandBorderColor)                      \
    S(BorderStyle, "border-style", ExpandBorderStyle)                      \
    S(BorderBottom, "border-bottom", ExpandBorderBottom)                   \
    S(BorderLeft, "border-left", ExpandBorderLeft)                         \
    S(BorderRight, "border-right", ExpandBorderRight)                      \
    S(BorderTop, "border-top", ExpandBorderTop)                            \
    S(Border, "border", ExpandBorder)                                      \
    S(BorderRadius, "border-radius", ExpandBorderRadius)                   \
    S(BorderImage, "border-image", ExpandBorderImage)                      \
    S(Mask, "mask", ExpandMask)                                            \
    S(Font, "font", ExpandFont)                                            \
    S(Overflow, "overflow", ExpandOverflow)                                \
    S(Background, "background", ExpandBackground)                          \
    S(BackgroundPosition, "background-position", ExpandBackgroundPosition) \
    S(TextStroke, "text-stroke", ExpandTextStroke)                         \
    S(Transition, "transition", ExpandTransition)
