// What an author who knows the web must be told about a single property.
#pragma once

#include <string_view>

#include "css/values/property_id.h"

namespace qorvex::css {

constexpr std::string_view NoteOf(PropertyId id) {
    switch (id) {
        case PropertyId::Display:
            return "There is no `inline-block`, `grid` or `table`. Every box is a flex item: a `block` lays "
                   "its "
                   "children out as a column, an `inline` as a row. `simple` is the engine's own fast mode, "
                   "see "
                   "above. `initial` is not taken";
        case PropertyId::OverflowX:
        case PropertyId::OverflowY:
            return "`scroll` and `auto` clip as `hidden` does; no scroll bars are drawn";
        case PropertyId::Position:
            return "`sticky` does not exist";
        case PropertyId::Flex:
            return "A longhand of its own: there are no `flex-grow`, `flex-shrink` and `flex-basis`";
        case PropertyId::AlignItems:
            return "`baseline` does not exist";
        case PropertyId::MarginLeft:
        case PropertyId::MarginRight:
            return "`auto` is 0: center with flexbox";
        case PropertyId::MarginTop:
        case PropertyId::MarginBottom:
            return "`auto` is 0. Margins do not collapse";
        case PropertyId::Width:
        case PropertyId::Height:
            return "Padding and border are part of the size: boxes are sized as with `box-sizing: "
                   "border-box`";
        case PropertyId::BorderTopStyle:
        case PropertyId::BorderRightStyle:
        case PropertyId::BorderBottomStyle:
        case PropertyId::BorderLeftStyle:
            return "A side without a style has no width";
        case PropertyId::MaskRepeat:
            return "Not repeated unless told";
        case PropertyId::MaskMode:
            return "`luminance` becomes `alpha`";
        case PropertyId::MaskClip:
            return "All but the first three become `border-box`";
        case PropertyId::MixBlendMode:
            return "`additive` is the engine's own";
        case PropertyId::UserSelect:
            return "`auto` takes the parent's value";
        case PropertyId::SelectionBackgroundColor:
        case PropertyId::SelectionColor:
            return "What `::selection` sets";
        case PropertyId::FontSize:
            return "Resolved where it is declared; children inherit pixels. 0 and below give the parent's "
                   "size";
        case PropertyId::FontWeight:
            return "Also any whole number from 1 to 1000, taken as the nearest hundred";
        case PropertyId::FontFitMode:
            return "Makes the text as large as its box, or only smaller";
        case PropertyId::TextAlign:
            return "Also aligns the children of a block";
        case PropertyId::FontSdf:
            return "Whether glyphs are drawn from distance fields";
        case PropertyId::CompositionId:
            return "Hands the element's drawing to the game's own compositor under this name";
        case PropertyId::CustomEffectName:
            return "Draws the element through an effect of the game's renderer";
        case PropertyId::TransitionProperty:
            return "Nothing changes smoothly until it is named here";
        default:
            return {};
    }
}

}  // namespace qorvex::css
