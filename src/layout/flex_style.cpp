#include "layout/flex_style.h"

#include "core/logging/log.h"
#include "layout/length_bounds.h"
#include "layout/node_flags.h"

#include <yoga/Yoga.h>

#include <array>
#include <cmath>

namespace qorvex::layout {

using css::Extent;
using css::LayoutStyle;
using css::Length;
using css::LengthContext;
using css::LengthUnit;

namespace {

constexpr std::array kFlexDirections = {YGFlexDirectionRow, YGFlexDirectionRowReverse, YGFlexDirectionColumn,
                                        YGFlexDirectionColumnReverse};
constexpr std::array kJustifyContent = {YGJustifyFlexStart, YGJustifyFlexEnd, YGJustifyCenter,
                                        YGJustifySpaceBetween, YGJustifySpaceAround};
constexpr std::array kAlignItems = {YGAlignFlexStart, YGAlignCenter, YGAlignFlexEnd, YGAlignStretch};
constexpr std::array kAlignSelf = {YGAlignAuto, YGAlignFlexStart, YGAlignCenter, YGAlignFlexEnd,
                                   YGAlignStretch};
constexpr std::array kFlexWraps = {YGWrapNoWrap, YGWrapWrap, YGWrapWrapReverse};

template <typename Values, typename Code>
auto Pick(const Values& values, Code code) {
    const auto index = static_cast<size_t>(code);
    return values[index < values.size() ? index : 0];
}

// The three forms of a Yoga length setter.
struct LengthSetter {
    void (*points)(YGNodeRef, float);
    void (*percent)(YGNodeRef, float);
    void (*unset)(YGNodeRef);
};

void SetLength(YGNodeRef node, const LengthSetter& setter, const Extent& extent,
               const LengthContext& lengths) {
    if (extent.IsLength() && extent.unit == LengthUnit::Percent) {
        setter.percent(node, BoundLength(extent.value));
        return;
    }
    const float value = ResolveExtent(extent, lengths, css::kNoPercentBase, YGUndefined);
    if (std::isnan(value)) {
        setter.unset(node);
    } else {
        setter.points(node, BoundLength(value));
    }
}

constexpr LengthSetter kWidth = {YGNodeStyleSetWidth, YGNodeStyleSetWidthPercent, YGNodeStyleSetWidthAuto};
constexpr LengthSetter kHeight = {YGNodeStyleSetHeight, YGNodeStyleSetHeightPercent,
                                  YGNodeStyleSetHeightAuto};
#define QORVEX_LIMIT_SETTER(Name)                                                          \
    constexpr LengthSetter k##Name = {YGNodeStyleSet##Name, YGNodeStyleSet##Name##Percent, \
                                      [](YGNodeRef node) { YGNodeStyleSet##Name(node, YGUndefined); }};
QORVEX_LIMIT_SETTER(MinWidth)
QORVEX_LIMIT_SETTER(MinHeight)
QORVEX_LIMIT_SETTER(MaxWidth)
QORVEX_LIMIT_SETTER(MaxHeight)
#undef QORVEX_LIMIT_SETTER

void SyncContainer(YGNodeRef node, const LayoutStyle& style, css::TextAlignType align) {
    YGFlexDirection direction = YGFlexDirectionColumn;
    YGJustify justify = YGJustifyFlexStart;
    YGAlign items = YGAlignStretch;
    switch (style.display) {
        case css::CSSDisplay::Flex:
            direction = Pick(kFlexDirections, style.flexDirection);
            justify = Pick(kJustifyContent, style.justifyContent);
            items = Pick(kAlignItems, style.alignItems);
            break;
        case css::CSSDisplay::Inline:
            direction = YGFlexDirectionRow;
            if (align == css::TextAlignType::Right) justify = YGJustifyFlexEnd;
            if (align == css::TextAlignType::Center) justify = YGJustifyCenter;
            break;
        default:
            if (align == css::TextAlignType::Right) items = YGAlignFlexEnd;
            if (align == css::TextAlignType::Center) items = YGAlignCenter;
            break;
    }
    YGNodeStyleSetFlexDirection(node, direction);
    YGNodeStyleSetJustifyContent(node, justify);
    YGNodeStyleSetAlignItems(node, items);
    YGNodeStyleSetAlignContent(node, Pick(kAlignItems, style.alignContent));
    YGNodeStyleSetFlexWrap(node, Pick(kFlexWraps, style.flexWrap));
}

// A picture stretches in flex containers alone; in lines and blocks it keeps its size.
YGAlign SelfAlignment(const LayoutNode& node) {
    const YGAlign self = Pick(kAlignSelf, node.style->layout->alignSelf);
    if (self != YGAlignAuto || !node.flags.isReplaced || node.parent == nullptr) return self;
    const LayoutNode& parent = node.parent->node();
    if (parent.style->layout->display == css::CSSDisplay::Flex) return self;
    const css::TextAlignType align = parent.style->text->textAlign;
    const bool aligned = parent.style->layout->display != css::CSSDisplay::Inline &&
                         (align == css::TextAlignType::Right || align == css::TextAlignType::Center);
    return aligned ? self : YGAlignFlexStart;
}

// Children that stand for themselves need not have changed when their container becomes another kind.
void SyncChildAlignment(LayoutNode& container) {
    const bool isFlex = container.style->layout->display == css::CSSDisplay::Flex;
    if (container.wasFlexContainer == isFlex) return;
    container.wasFlexContainer = isFlex;
    for (const HandlePtr& child : container.Children()) {
        const LayoutNode& node = child->node();
        if (node.flags.isReplaced && node.flex != nullptr)
            YGNodeStyleSetAlignSelf(node.flex, SelfAlignment(node));
    }
}

void SyncFlex(YGNodeRef node, const css::CSSFlexValue& flex, const FlexStyleContext& context) {
    float grow = 0;
    float shrink = 0;
    const bool hasBasis = flex.basisKind == css::FlexBasisKind::Length;
    if (flex.hasGrow) {
        grow = flex.grow;
        shrink = flex.hasShrink ? flex.shrink : 1;
    } else if (hasBasis) {
        grow = shrink = 1;
    }
    YGNodeStyleSetFlexGrow(node, BoundLength(grow));
    YGNodeStyleSetFlexShrink(node, BoundLength(shrink));
    if (!hasBasis) {
        // A factor without a basis has the basis 0 (CSS Flexible Box Layout, section 7.1.1).
        const bool omitted = flex.hasGrow && flex.basisKind == css::FlexBasisKind::Initial;
        omitted ? YGNodeStyleSetFlexBasis(node, 0) : YGNodeStyleSetFlexBasisAuto(node);
    } else if (context.disableFlexBasisUnits) {
        YGNodeStyleSetFlexBasis(node, BoundLength(flex.basis.value));
    } else if (flex.basis.unit == LengthUnit::Percent) {
        YGNodeStyleSetFlexBasisPercent(node, BoundLength(flex.basis.value));
    } else {
        YGNodeStyleSetFlexBasis(node, BoundLength(ResolveLength(flex.basis, context.lengths)));
    }
}

using EdgeSetter = void (*)(YGNodeRef, YGEdge, float);

void SetEdge(YGNodeRef node, EdgeSetter points, EdgeSetter percent, YGEdge edge, const Extent& extent,
             const LengthContext& lengths) {
    if (extent.IsLength() && extent.unit == LengthUnit::Percent) {
        percent(node, edge, BoundLength(extent.value));
    } else {
        // There are no auto margins in this layout.
        points(node, edge, BoundLength(ResolveExtent(extent, lengths, css::kNoPercentBase, 0)));
    }
}

void SyncEdges(YGNodeRef node, const LayoutStyle& style, const LengthContext& lengths) {
    const Edges border = ResolveBorders(style, lengths);
    YGNodeStyleSetBorder(node, YGEdgeLeft, border.left);
    YGNodeStyleSetBorder(node, YGEdgeTop, border.top);
    YGNodeStyleSetBorder(node, YGEdgeRight, border.right);
    YGNodeStyleSetBorder(node, YGEdgeBottom, border.bottom);

    auto margin = [&](YGEdge edge, const Extent& value) {
        SetEdge(node, YGNodeStyleSetMargin, YGNodeStyleSetMarginPercent, edge, value, lengths);
    };
    margin(YGEdgeLeft, style.marginLeft);
    margin(YGEdgeTop, style.marginTop);
    margin(YGEdgeRight, style.marginRight);
    margin(YGEdgeBottom, style.marginBottom);
    auto padding = [&](YGEdge edge, const Length& value) {
        SetEdge(node, YGNodeStyleSetPadding, YGNodeStyleSetPaddingPercent, edge, Extent::Of(value), lengths);
    };
    padding(YGEdgeLeft, style.paddingLeft);
    padding(YGEdgeTop, style.paddingTop);
    padding(YGEdgeRight, style.paddingRight);
    padding(YGEdgeBottom, style.paddingBottom);
}

// A fixed box is laid out against the view, which Yoga does not know as its containing block: percentages
// become pixels here, and ReadYogaResults places the box.
Extent AgainstView(const Extent& extent, float viewSize) {
    if (!extent.IsLength() || extent.unit != LengthUnit::Percent) return extent;
    return Extent::Pixels(extent.value / 100 * viewSize);
}

void SyncInset(YGNodeRef node, YGEdge edge, const Extent& extent, const LayoutNode& layoutNode,
               float viewSize, const LengthContext& lengths) {
    if (!layoutNode.flags.isPositioned) {
        YGNodeStyleSetPosition(node, edge, YGUndefined);
        return;
    }
    const bool isPercent = extent.IsLength() && extent.unit == LengthUnit::Percent;
    if (isPercent && !layoutNode.flags.isFixed) {
        YGNodeStyleSetPositionPercent(node, edge, BoundLength(extent.value));
        return;
    }
    if (isPercent) {
        LogWarning(
            "Using % values with position:fixed is not supported. Percents will be calculated against "
            "viewport.");
    }
    YGNodeStyleSetPosition(node, edge, BoundLength(ResolveExtent(extent, lengths, viewSize, YGUndefined)));
}

void SyncPosition(YGNodeRef node, const LayoutNode& layoutNode, const LayoutStyle& style,
                  const FlexStyleContext& c) {
    const float viewWidth = c.lengths.vw * 100;
    const float viewHeight = c.lengths.vh * 100;
    // Between opposite insets Yoga would stretch a picture; the first one alone places it.
    const auto second = [&](const Extent& size, const Extent& start, const Extent& end) {
        const bool gives = !layoutNode.flags.isReplaced || size.IsLength() || !start.IsLength();
        return gives ? end : Extent{};
    };
    SyncInset(node, YGEdgeLeft, style.left, layoutNode, viewWidth, c.lengths);
    SyncInset(node, YGEdgeRight, second(style.width, style.left, style.right), layoutNode, viewWidth,
              c.lengths);
    SyncInset(node, YGEdgeTop, style.top, layoutNode, viewHeight, c.lengths);
    SyncInset(node, YGEdgeBottom, second(style.height, style.top, style.bottom), layoutNode, viewHeight,
              c.lengths);
}

// Opposite insets of a fixed box with an auto size give its size, as they do for an absolute one; not that of
// a picture.
Extent FixedSize(const LayoutNode& node, const Extent& size, const Extent& start, const Extent& end,
                 float viewSize, const LengthContext& lengths) {
    if (size.IsLength() || !start.IsLength() || !end.IsLength() || node.flags.isReplaced)
        return AgainstView(size, viewSize);
    const float taken = ResolveExtent(start, lengths, viewSize, 0) + ResolveExtent(end, lengths, viewSize, 0);
    return Extent::Pixels(std::fmax(viewSize - taken, 0.0f));
}

void SyncSizes(YGNodeRef node, const LayoutNode& layoutNode, const LayoutStyle& style,
               const LengthContext& lengths) {
    if (layoutNode.flags.isFixed) {
        const float viewWidth = lengths.vw * 100;
        const float viewHeight = lengths.vh * 100;
        SetLength(node, kWidth,
                  FixedSize(layoutNode, style.width, style.left, style.right, viewWidth, lengths), lengths);
        SetLength(node, kHeight,
                  FixedSize(layoutNode, style.height, style.top, style.bottom, viewHeight, lengths), lengths);
        SetLength(node, kMinWidth, AgainstView(style.minWidth, viewWidth), lengths);
        SetLength(node, kMinHeight, AgainstView(style.minHeight, viewHeight), lengths);
        SetLength(node, kMaxWidth, AgainstView(style.maxWidth, viewWidth), lengths);
        SetLength(node, kMaxHeight, AgainstView(style.maxHeight, viewHeight), lengths);
        return;
    }
    SetLength(node, kWidth, style.width, lengths);
    SetLength(node, kHeight, style.height, lengths);
    SetLength(node, kMinWidth, style.minWidth, lengths);
    SetLength(node, kMinHeight, style.minHeight, lengths);
    SetLength(node, kMaxWidth, style.maxWidth, lengths);
    SetLength(node, kMaxHeight, style.maxHeight, lengths);
}

// A box between an absolute one and its containing block is static in Yoga too, which then looks for the
// nearest ancestor that is not; the root always is one. Without an absolute box below it makes no difference,
// and Yoga walks through all static boxes of a containing block whenever it lays that out.
YGPositionType PositionType(const LayoutNode& node, bool isRoot) {
    if (isRoot) return YGPositionTypeRelative;
    if (node.flags.isFixed || node.flags.isAbsolute) return YGPositionTypeAbsolute;
    const bool isStatic = !node.flags.isPositioned && node.absoluteBelow;
    return isStatic ? YGPositionTypeStatic : YGPositionTypeRelative;
}

// See LayoutNode::absoluteBelow.
void MarkAbsoluteBelow(const LayoutNode& node, const LayoutHandle* root) {
    if (!node.flags.isFixed && !node.flags.isAbsolute && !node.absoluteBelow) return;
    for (LayoutHandle* parent = node.parent; parent != nullptr; parent = parent->node().parent) {
        LayoutNode& above = parent->node();
        if (above.absoluteBelow) break;
        above.absoluteBelow = true;
        if (above.flex) YGNodeStyleSetPositionType(above.flex, PositionType(above, parent == root));
    }
}

// Where a style is remembered.
FlexStyleContext::Written& WrittenPlace(FlexStyleContext& context, const LayoutStyle* style) {
    return context
        .written[static_cast<uint64_t>(reinterpret_cast<uintptr_t>(style)) * 0x9E3779B97F4A7C15u >> 60];
}

// All of a node's style but for the position type.
void SyncBox(YGNodeRef node, const LayoutNode& layoutNode, FlexStyleContext& context) {
    const LayoutStyle& style = *layoutNode.style->layout;
    YGNodeStyleSetDisplay(node, YGDisplayFlex);
    SyncContainer(node, style, layoutNode.style->text->textAlign);
    YGNodeStyleSetAlignSelf(node, SelfAlignment(layoutNode));
    SyncFlex(node, style.flex, context);
    SyncEdges(node, style, context.lengths);
    SyncSizes(node, layoutNode, style, context.lengths);
    SyncPosition(node, layoutNode, style, context);
}

}  // namespace

Edges ResolveBorders(const LayoutStyle& style, const LengthContext& lengths) {
    auto width = [&](const css::BorderWidth& border, css::BorderStyleType type) {
        return type >= css::BorderStyleType::Dotted
                   ? BoundResult(BoundLength(ResolveBorderWidth(border, lengths)))
                   : 0.0f;
    };
    return {width(style.borderLeftWidth, style.borderLeftStyle),
            width(style.borderRightWidth, style.borderRightStyle),
            width(style.borderTopWidth, style.borderTopStyle),
            width(style.borderBottomWidth, style.borderBottomStyle)};
}

bool SyncStyleToYoga(LayoutHandle& handle, FlexStyleContext& context) {
    LayoutNode& layoutNode = handle.node();
    YGNodeRef node = layoutNode.flex;
    const LayoutStyle& style = *layoutNode.style->layout;
    RefreshNodeFlags(layoutNode);
    if (node == nullptr) return false;
    if (style.display == css::CSSDisplay::None) {
        YGNodeStyleSetDisplay(node, YGDisplayNone);
        return true;
    }
    const css::TextLayoutStyle& text = *layoutNode.style->text;
    context.lengths.em = text.computedFontSize;
    const YGPositionType position = PositionType(layoutNode, &handle == context.root);
    const FlexStyleKey key{&style, text.computedFontSize, text.textAlign};
    FlexStyleContext::Written& same = WrittenPlace(context, &style);
    // The position type of a written node may have changed since, with what was found below it.
    if (same.key == key && !layoutNode.flags.isReplaced &&
        YGNodeStyleGetPositionType(same.node) == position) {
        YGNodeCopyStyle(node, same.node);
    } else {
        YGNodeStyleSetPositionType(node, position);
        SyncBox(node, layoutNode, context);
        if (!layoutNode.flags.isReplaced) same = {key, node};
    }
    SyncChildAlignment(layoutNode);
    MarkAbsoluteBelow(layoutNode, context.root);
    return true;
}

}  // namespace qorvex::layout
