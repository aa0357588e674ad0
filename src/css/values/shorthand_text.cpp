// Shorthands of text: font, text-stroke.
#include "css/values/shorthands.h"
#include "css/values/value_parsers.h"
#include "css/values/value_text.h"

namespace qorvex::css {

bool ExpandFont(std::string_view text, ShorthandOutput& out) {
    Declaration style, weight, size, lineHeight, family;
    WordReader words(text);
    std::string_view word;
    if (!words.Next(word)) return false;
    // Style and weight in either order; "normal" is a style first, then a weight.
    for (int i = 0; i < 2; ++i) {
        bool taken = (style.property() == PropertyId::kUnknown &&
                      OperationsOf(PropertyId::FontStyle).parse(word, style)) ||
                     (weight.property() == PropertyId::kUnknown &&
                      OperationsOf(PropertyId::FontWeight).parse(word, weight));
        if (!taken) break;
        if (!words.Next(word)) return false;
    }
    // "12px/14px" is one word; with spaces around the slash the next ones belong to it.
    std::string_view rest = Trim(words.rest());
    size_t slash = word.find('/');
    std::string_view height = slash == std::string_view::npos ? std::string_view() : word.substr(slash + 1);
    bool hasHeight = slash != std::string_view::npos;
    if (!hasHeight && rest.starts_with('/')) {
        hasHeight = true;
        rest = Trim(rest.substr(1));
    }
    if (hasHeight && height.empty()) {
        WordReader more(rest);
        if (!more.Next(height)) return false;
        rest = Trim(more.rest());
    }
    if (!OperationsOf(PropertyId::FontSize).parse(word.substr(0, slash), size)) return false;
    if (hasHeight && !OperationsOf(PropertyId::LineHeight).parse(height, lineHeight)) return false;
    if (!OperationsOf(PropertyId::FontFamily).parse(rest, family)) return false;
    out.AddOrInitial(PropertyId::FontFamily, family);
    out.AddOrInitial(PropertyId::FontSize, size);
    out.AddOrInitial(PropertyId::FontStyle, style);
    out.AddOrInitial(PropertyId::FontWeight, weight);
    out.AddOrInitial(PropertyId::LineHeight, lineHeight);
    return true;
}

bool ExpandTextStroke(std::string_view text, ShorthandOutput& out) {
    Declaration width, color;
    WordReader words(text);
    std::string_view word;
    while (words.Next(word)) {
        bool taken = (width.property() == PropertyId::kUnknown &&
                      OperationsOf(PropertyId::TextStrokeWidth).parse(word, width)) ||
                     (color.property() == PropertyId::kUnknown &&
                      OperationsOf(PropertyId::TextStrokeColor).parse(word, color));
        if (!taken) return false;
    }
    out.AddOrInitial(PropertyId::TextStrokeWidth, width);
    out.AddOrInitial(PropertyId::TextStrokeColor, color);
    return true;
}

}  // namespace qorvex::css
