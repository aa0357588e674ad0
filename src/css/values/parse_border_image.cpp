// Text forms of the border image records: one to four values in the order top, right, bottom, left.
#include "core/logging/log.h"
#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

namespace {

// Fills the sides that were not given as CSS does: right from top, bottom from top, left from right.
template <class Sides>
void CompleteSides(Sides& sides, size_t count) {
    if (count < 2) sides[1] = sides[0];
    if (count < 3) sides[2] = sides[0];
    if (count < 4) sides[3] = sides[1];
}

bool ParseNumberOrLength(std::string_view text, bool allowAuto, NumberOrLength& out) {
    if (allowAuto && EqualsIgnoreCase(text, "auto")) {
        out = {NumberOrLengthKind::Auto, Length()};
        return true;
    }
    float number;
    if (ParseFloat(text, number)) {
        out = NumberOrLength::Number(number);
    } else {
        out.kind = NumberOrLengthKind::Length;
        if (!ParseLength(text, out.length)) return false;
    }
    return out.length.value >= 0;
}

template <class Record>
bool ParseFourNumbersOrLengths(std::string_view text, bool allowAuto, Record& out) {
    Words<4> words(text);
    if (words.count < 1 || words.count > 4) return false;
    for (size_t i = 0; i < words.count; ++i)
        if (!ParseNumberOrLength(words.at[i], allowAuto, out.sides[i])) return false;
    CompleteSides(out.sides, words.count);
    return true;
}

template <class Record>
void SerialiseFour(const Record& record, CssString& out) {
    bool first = true;
    for (const NumberOrLength& side : record.sides) {
        if (!first) out.push_back(' ');
        first = false;
        if (side.kind == NumberOrLengthKind::Auto)
            out.append("auto");
        else if (side.kind == NumberOrLengthKind::Number)
            AppendNumber(side.length.value, out);
        else
            Serialise(side.length, out);
    }
}

}  // namespace

bool Parse(std::string_view text, BorderImageSliceType& out) {
    out = BorderImageSliceType();
    Words<5> words(text);
    if (words.count < 1 || words.count > 5) return false;
    size_t count = 0;
    for (size_t i = 0; i < words.count; ++i) {
        std::string_view word = words.at[i];
        if (EqualsIgnoreCase(word, "fill")) {
            if (out.fill) return false;
            out.fill = true;
            continue;
        }
        if (count == 4) return false;
        BorderImageSliceType::Side& side = out.sides[count++];
        side.isPercent = word.ends_with('%');
        if (side.isPercent) word.remove_suffix(1);
        if (!ParseFloat(word, side.value) || side.value < 0) return false;
    }
    if (count == 0) return false;
    CompleteSides(out.sides, count);
    return true;
}

void Serialise(const BorderImageSliceType& value, CssString& out) {
    bool first = true;
    for (const BorderImageSliceType::Side& side : value.sides) {
        if (!first) out.push_back(' ');
        first = false;
        AppendNumber(side.value, out);
        if (side.isPercent) out.push_back('%');
    }
    if (value.fill) out.append(" fill");
}

bool Parse(std::string_view text, BorderImageWidthType& out) {
    return ParseFourNumbersOrLengths(text, true, out);
}
void Serialise(const BorderImageWidthType& value, CssString& out) {
    SerialiseFour(value, out);
}

bool Parse(std::string_view text, BorderImageOutsetType& out) {
    return ParseFourNumbersOrLengths(text, false, out);
}
void Serialise(const BorderImageOutsetType& value, CssString& out) {
    SerialiseFour(value, out);
}

bool Parse(std::string_view text, BorderImageRepeatType& out) {
    Words<2> words(text);
    if (words.count < 1 || words.count > 2) return false;
    if (!ParseKeyword(words.at[0], out.x) || !ParseKeyword(words.at[words.count - 1], out.y)) return false;
    if (out.x == BorderImageRepeatMode::Space) {
        LogWarning("'space' is not supported for horizontal border-image-repeat. Fallback to 'repeat'");
        out.x = BorderImageRepeatMode::Repeat;
        if (words.count == 1) out.y = out.x;
    }
    if (out.y == BorderImageRepeatMode::Space) {
        LogWarning("'space' is not supported for vertical border-image-repeat. Fallback to 'repeat'");
        out.y = BorderImageRepeatMode::Repeat;
    }
    return true;
}

void Serialise(const BorderImageRepeatType& value, CssString& out) {
    Serialise(value.x, out);
    if (value.y == value.x) return;
    out.push_back(' ');
    Serialise(value.y, out);
}

}  // namespace qorvex::css
