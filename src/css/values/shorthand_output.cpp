#include "css/values/shorthands.h"
#include "css/values/value_text.h"

namespace qorvex::css {

bool ShorthandOutput::Add(PropertyId id, std::string_view text) {
    Declaration declaration;
    if (!OperationsOf(id).parse(text, declaration)) return false;
    Add(std::move(declaration));
    return true;
}

void ShorthandOutput::AddInitial(PropertyId id) {
    Add(Declaration::Initial(id));
}

void ShorthandOutput::Add(Declaration declaration) {
    declaration.set_flags(flags);
    declarations.push_back(std::move(declaration));
}

void ShorthandOutput::AddOrInitial(PropertyId id, Declaration& declaration) {
    if (declaration.property() == PropertyId::kUnknown)
        AddInitial(id);
    else
        Add(std::move(declaration));
}

namespace {

using enum PropertyId;

constexpr PropertyId kAnimationLonghands[] = {
    AnimationName,     AnimationDuration,  AnimationIterationCount, AnimationDelay,
    AnimationFillMode, AnimationDirection, AnimationTimingFunction, AnimationPlayState};
constexpr PropertyId kMarginLonghands[] = {MarginBottom, MarginLeft, MarginRight, MarginTop};
constexpr PropertyId kPaddingLonghands[] = {PaddingBottom, PaddingLeft, PaddingRight, PaddingTop};
constexpr PropertyId kBorderWidthLonghands[] = {BorderTopWidth, BorderLeftWidth, BorderRightWidth,
                                                BorderBottomWidth};
constexpr PropertyId kBorderColorLonghands[] = {BorderBottomColor, BorderLeftColor, BorderRightColor,
                                                BorderTopColor};
constexpr PropertyId kBorderStyleLonghands[] = {BorderBottomStyle, BorderLeftStyle, BorderRightStyle,
                                                BorderTopStyle};
constexpr PropertyId kBorderBottomLonghands[] = {BorderBottomWidth, BorderBottomStyle, BorderBottomColor};
constexpr PropertyId kBorderLeftLonghands[] = {BorderLeftWidth, BorderLeftStyle, BorderLeftColor};
constexpr PropertyId kBorderRightLonghands[] = {BorderRightWidth, BorderRightStyle, BorderRightColor};
constexpr PropertyId kBorderTopLonghands[] = {BorderTopWidth, BorderTopStyle, BorderTopColor};
constexpr PropertyId kBorderLonghands[] = {BorderTopWidth,    BorderLeftWidth,   BorderRightWidth,
                                           BorderBottomWidth, BorderBottomStyle, BorderLeftStyle,
                                           BorderRightStyle,  BorderTopStyle,    BorderBottomColor,
                                           BorderLeftColor,   BorderRightColor,  BorderTopColor};
constexpr PropertyId kBorderRadiusLonghands[] = {BorderTopLeftRadius, BorderTopRightRadius,
                                                 BorderBottomLeftRadius, BorderBottomRightRadius};
constexpr PropertyId kBorderImageLonghands[] = {BorderImageSource, BorderImageSlice, BorderImageWidth,
                                                BorderImageOutset, BorderImageRepeat};
constexpr PropertyId kMaskLonghands[] = {MaskPosition, MaskSize, MaskImage, MaskMode, MaskClip, MaskRepeat};
constexpr PropertyId kFontLonghands[] = {FontFamily, FontSize, FontStyle, FontWeight, LineHeight};
constexpr PropertyId kOverflowLonghands[] = {OverflowX, OverflowY};
constexpr PropertyId kBackgroundLonghands[] = {BackgroundImage, BackgroundPositionX, BackgroundPositionY,
                                               BackgroundColor, BackgroundSize,      BackgroundRepeat};
constexpr PropertyId kBackgroundPositionLonghands[] = {BackgroundPositionX, BackgroundPositionY};
constexpr PropertyId kTextStrokeLonghands[] = {TextStrokeWidth, TextStrokeColor};
constexpr PropertyId kTransitionLonghands[] = {TransitionProperty, TransitionDuration, TransitionDelay,
                                               TransitionTimingFunction};

}  // namespace

std::span<const PropertyId> LonghandsOf(PropertyId shorthand) {
    switch (shorthand) {
#define QORVEX_ROW(id, ...) \
    case PropertyId::id:    \
        return k##id##Longhands;
        QORVEX_CSS_SHORTHANDS(QORVEX_ROW)
#undef QORVEX_ROW
        default:
            return {};
    }
}

}  // namespace qorvex::css
