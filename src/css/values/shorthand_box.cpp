// Shorthands of the box: four sides, border sides, corners, overflow.
#include "css/values/shorthands.h"
#include "css/values/value_parsers.h"
#include "css/values/value_text.h"

namespace qorvex::css {

namespace {

// Which of one to four values, given in the order top, right, bottom, left, belongs to a side.
enum Side { kTop, kRight, kBottom, kLeft };

std::string_view ValueOfSide(const Words<4>& words, Side side) {
    static constexpr uint8_t kValueOf[4][4] = {{0, 0, 0, 0}, {0, 1, 0, 1}, {0, 1, 2, 1}, {0, 1, 2, 3}};
    return words.at[kValueOf[words.count - 1][side]];
}

// `sides` tells in which order the four longhands of the row run.
bool ExpandSides(PropertyId shorthand, std::string_view text, const Side (&sides)[4], ShorthandOutput& out) {
    Words<4> words(text);
    if (words.count < 1 || words.count > 4) return false;
    std::span<const PropertyId> longhands = LonghandsOf(shorthand);
    for (size_t i = 0; i < 4; ++i)
        if (!out.Add(longhands[i], ValueOfSide(words, sides[i]))) return false;
    return true;
}

constexpr Side kBottomFirst[] = {kBottom, kLeft, kRight, kTop};
constexpr Side kTopFirst[] = {kTop, kLeft, kRight, kBottom};

// Width, style and colour in any order, each at most once.
bool ReadBorderSide(std::string_view text, const PropertyId (&ids)[3], Declaration (&parts)[3]) {
    WordReader words(text);
    std::string_view word;
    while (words.Next(word)) {
        bool taken = false;
        for (size_t i = 0; i < 3 && !taken; ++i)
            taken = parts[i].property() == PropertyId::kUnknown && OperationsOf(ids[i]).parse(word, parts[i]);
        if (!taken) return false;
    }
    return true;
}

bool ExpandBorderSide(PropertyId shorthand, std::string_view text, ShorthandOutput& out) {
    std::span<const PropertyId> longhands = LonghandsOf(shorthand);
    const PropertyId ids[3] = {longhands[0], longhands[1], longhands[2]};
    Declaration parts[3];
    if (!ReadBorderSide(text, ids, parts)) return false;
    for (size_t i = 0; i < 3; ++i)
        out.AddOrInitial(ids[i], parts[i]);
    return true;
}

}  // namespace

bool ExpandMargin(std::string_view text, ShorthandOutput& out) {
    return ExpandSides(PropertyId::Margin, text, kBottomFirst, out);
}

bool ExpandPadding(std::string_view text, ShorthandOutput& out) {
    return ExpandSides(PropertyId::Padding, text, kBottomFirst, out);
}

bool ExpandBorderWidth(std::string_view text, ShorthandOutput& out) {
    return ExpandSides(PropertyId::BorderWidth, text, kTopFirst, out);
}

bool ExpandBorderColor(std::string_view text, ShorthandOutput& out) {
    return ExpandSides(PropertyId::BorderColor, text, kBottomFirst, out);
}

bool ExpandBorderStyle(std::string_view text, ShorthandOutput& out) {
    return ExpandSides(PropertyId::BorderStyle, text, kBottomFirst, out);
}

bool ExpandBorderBottom(std::string_view text, ShorthandOutput& out) {
    return ExpandBorderSide(PropertyId::BorderBottom, text, out);
}

bool ExpandBorderLeft(std::string_view text, ShorthandOutput& out) {
    return ExpandBorderSide(PropertyId::BorderLeft, text, out);
}

bool ExpandBorderRight(std::string_view text, ShorthandOutput& out) {
    return ExpandBorderSide(PropertyId::BorderRight, text, out);
}

bool ExpandBorderTop(std::string_view text, ShorthandOutput& out) {
    return ExpandBorderSide(PropertyId::BorderTop, text, out);
}

bool ExpandBorder(std::string_view text, ShorthandOutput& out) {
    constexpr PropertyId kParts[3] = {PropertyId::BorderTopWidth, PropertyId::BorderTopStyle,
                                      PropertyId::BorderTopColor};
    Declaration parts[3];
    if (!ReadBorderSide(text, kParts, parts)) return false;
    for (size_t i = 0; i < 3; ++i)
        if (parts[i].property() == PropertyId::kUnknown) parts[i] = Declaration::Initial(kParts[i]);
    // Four longhands of each part in a row: widths, styles, colours.
    constexpr PropertyId kGroups[3] = {PropertyId::BorderWidth, PropertyId::BorderStyle,
                                       PropertyId::BorderColor};
    for (size_t i = 0; i < 3; ++i)
        for (PropertyId longhand : LonghandsOf(kGroups[i]))
            out.Add(parts[i].WithProperty(longhand));
    return true;
}

bool ExpandBorderRadius(std::string_view text, ShorthandOutput& out) {
    size_t slash = text.find('/');
    Words<4> horizontal(text.substr(0, slash));
    Words<4> vertical(slash == std::string_view::npos ? text : text.substr(slash + 1));
    if (horizontal.count < 1 || horizontal.count > 4 || vertical.count < 1 || vertical.count > 4)
        return false;
    // Given in the order top-left, top-right, bottom-right, bottom-left.
    constexpr Side kCorners[] = {kTop, kRight, kLeft, kBottom};
    for (size_t i = 0; i < 4; ++i) {
        BorderRadius radius;
        if (!Parse(ValueOfSide(horizontal, kCorners[i]), radius.horizontal)) return false;
        if (!Parse(ValueOfSide(vertical, kCorners[i]), radius.vertical)) return false;
        if (radius.horizontal.value < 0 || radius.vertical.value < 0) return false;
        Declaration corner = Declaration::Make<PropertyId::BorderTopLeftRadius>(radius);
        out.Add(corner.WithProperty(LonghandsOf(PropertyId::BorderRadius)[i]));
    }
    return true;
}

bool ExpandOverflow(std::string_view text, ShorthandOutput& out) {
    Words<2> words(text);
    if (words.count < 1 || words.count > 2) return false;
    return out.Add(PropertyId::OverflowX, words.at[0]) &&
           out.Add(PropertyId::OverflowY, words.at[words.count - 1]);
}

}  // namespace qorvex::css
