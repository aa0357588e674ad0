// Text forms of the text records.
#include "css/values/number_parser.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

bool Parse(std::string_view text, FontWeight& out) {
    if (ParseKeyword(text, out)) return out != FontWeight::Inherit;
    int32_t number;
    if (!ParseInt(text, number) || number < 1 || number > 1000) return false;
    out = static_cast<FontWeight>(std::clamp((number + 50) / 100, 1, 9));
    return true;
}

void Serialise(const FontWeight& value, CssString& out) {
    out.append(KeywordText(value));
}

namespace {

bool IsQuoted(std::string_view text) {
    return text.size() >= 2 && (text[0] == '"' || text[0] == '\'') && text.back() == text[0];
}

// One quoted text, or identifiers joined by single spaces.
bool ParseName(std::string_view text, CssString& out) {
    if (IsQuoted(text)) {
        std::string_view inner = text.substr(1, text.size() - 2);
        // The quote that closes must be the last character: "a" "b" is no name.
        for (size_t i = 0; i < inner.size(); ++i) {
            if (inner[i] == text[0]) return false;
            if (inner[i] == '\\') ++i;
        }
        out = inner;
        return true;
    }
    out.clear();
    WordReader words(text);
    std::string_view word;
    while (words.Next(word)) {
        if (!IsIdentifier(word)) return false;
        if (!out.empty()) out.push_back(' ');
        out.append(word);
    }
    return !out.empty();
}

// Words that mean something else when they stand alone without quotes.
bool IsReserved(std::string_view name) {
    return EqualsIgnoreCase(name, "none") || EqualsIgnoreCase(name, "inherit") ||
           EqualsIgnoreCase(name, "initial");
}

void SerialiseQuoted(std::string_view name, CssString& out) {
    const char quote = QuoteFor(name);
    out.push_back(quote);
    out.append(name);
    out.push_back(quote);
}

void SerialiseName(std::string_view name, CssString& out) {
    bool plain = !name.empty() && !IsReserved(name) && !name.starts_with(' ') && !name.ends_with(' ') &&
                 name.find("  ") == std::string_view::npos &&
                 name.find_first_of("\t\n\r\f") == std::string_view::npos;
    WordReader words(name);
    std::string_view word;
    while (plain && words.Next(word))
        plain = IsIdentifier(word);
    if (plain)
        out.append(name);
    else
        SerialiseQuoted(name, out);
}

bool ParseSpacing(std::string_view text, SpacingKind& kind, Length& length) {
    if (EqualsIgnoreCase(text, "normal")) {
        kind = SpacingKind::Normal;
        return true;
    }
    kind = SpacingKind::Length;
    return ParseLength(text, length);
}

void SerialiseSpacing(SpacingKind kind, const Length& length, CssString& out) {
    static constexpr std::string_view kWords[] = {"normal", "initial", "inherit"};
    if (kind == SpacingKind::Length)
        Serialise(length, out);
    else
        out.append(kWords[static_cast<size_t>(kind)]);
}

}  // namespace

bool Parse(std::string_view text, FontFamily& out) {
    return ParseList(text, out, ParseName);
}

void Serialise(const FontFamily& value, CssString& out) {
    SerialiseList(value, "", out, [](const CssString& name, CssString& text) { SerialiseName(name, text); });
}

bool Parse(std::string_view text, LetterSpacing& out) {
    out = LetterSpacing();
    return ParseSpacing(text, out.kind, out.length);
}

void Serialise(const LetterSpacing& value, CssString& out) {
    SerialiseSpacing(value.kind, value.length, out);
}

bool Parse(std::string_view text, LineHeight& out) {
    out = LineHeight();
    float multiple;
    if (ParseFloat(text, multiple)) {
        out.kind = SpacingKind::Length;
        out.length = {LengthUnit::Em, multiple};
        return true;
    }
    return ParseSpacing(text, out.kind, out.length);
}

void Serialise(const LineHeight& value, CssString& out) {
    SerialiseSpacing(value.kind, value.length, out);
}

// An empty name stands for "none", which keeps its place beside the other lists.
bool Parse(std::string_view text, AnimationName& out) {
    if (EqualsIgnoreCase(text, "none")) return true;
    return ParseList(text, out, [](std::string_view item, CssString& name) {
        if (EqualsIgnoreCase(item, "none")) return true;
        if (IsQuoted(item)) return ParseName(item, name);
        if (!IsIdentifier(item)) return false;
        name = item;
        return true;
    });
}

void Serialise(const AnimationName& value, CssString& out) {
    SerialiseList(value, "none", out, [](const CssString& name, CssString& text) {
        if (name.empty())
            text.append("none");
        else if (IsIdentifier(name) && !IsReserved(name))
            text.append(name);
        else
            SerialiseQuoted(name, text);
    });
}

}  // namespace qorvex::css
