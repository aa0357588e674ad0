#include "css/parser/convert_at_rules.h"

#include <bit>

#include "core/logging/log.h"
#include "css/values/keyframe_units.h"
#include "css/values/number_parser.h"
#include "css/values/text_reader.h"
#include "css/values/value_parsers.h"

namespace qorvex::css {

namespace {

std::string_view WithoutQuotes(std::string_view text) {
    if (text.size() >= 2 && (text[0] == '"' || text[0] == '\'')) return text.substr(1, text.size() - 2);
    return text;
}

// The first url( ) in the text, wherever it stands.
bool ConvertFontSource(std::string_view text, CssString& url) {
    if (text.find("local(") != std::string_view::npos) {
        LogWarning("Skipping local() in src string for @font-face ", text, " as it is not supported");
    }
    size_t start = text.find("url(");
    if (start != std::string_view::npos) {
        // Words end at spaces and commas outside parentheses: what is left is the function alone.
        std::string_view item;
        ListReader list(text.substr(start));
        if (list.Next(item)) {
            Words<1> words(item);
            url.clear();
            if (ParseUrl(words.at[0], 0, url)) return true;
        }
    }
    LogWarning("Unable to parse src string for @font-face: ", text);
    return false;
}

void ConvertFontWeight(std::string_view text, int32_t& weight) {
    int32_t number = 0;
    if (EqualsIgnoreCase(text, "normal")) {
        weight = 400;
    } else if (EqualsIgnoreCase(text, "bold")) {
        weight = 700;
    } else if (ParseInt(text, number) && number >= 0 && number <= 1000) {
        weight = number;
    } else {
        LogWarning(
            "font-weight descriptor in @font-face declaration accepts only specific weight values: [0-1000], "
            "normal, "
            "bold. Default value will be used instead.");
    }
}

}  // namespace

namespace {

// A descriptor holds a plain value: there is no element that a variable or a parent could belong to.
bool IsPlainDescriptor(const DeclarationSyntax& descriptor) {
    static constexpr std::string_view kNames[] = {"font-family", "font-weight", "font-style", "src"};
    std::string_view what = descriptor.value;
    if (descriptor.flags & (kHasVar | kHasCalc)) {
        what = "custom expression";
    } else if (EqualsIgnoreCase(descriptor.value, "inherit")) {
        what = "inherited";
    } else if (std::find(std::begin(kNames), std::end(kNames), descriptor.name) != std::end(kNames)) {
        return true;
    }
    LogDebug("Ignoring @font-face property declaration '", descriptor.name, "' containing ", what);
    return false;
}

}  // namespace

std::optional<FontFace> ConvertFontFace(const FontFaceSyntax& syntax, ConversionContext& context) {
    FontFace face;
    bool hasSource = false;
    for (const DeclarationSyntax& descriptor : syntax.declarations) {
        if (!IsPlainDescriptor(descriptor)) continue;
        if (descriptor.name == "font-family") {
            // A face has one name; a list of them names none.
            ListReader names(descriptor.value);
            std::string_view name, other;
            face.family.clear();
            if (names.Next(name) && !names.Next(other)) face.family = WithoutQuotes(name);
        } else if (descriptor.name == "font-weight") {
            ConvertFontWeight(descriptor.value, face.weight);
        } else if (descriptor.name == "font-style") {
            if (!Parse(descriptor.value, face.style)) face.style = FontStyle::Normal;
        } else if (descriptor.name == "src") {
            CssString url;
            hasSource = true;
            if (ConvertFontSource(descriptor.value, url)) face.url = ResolveUrl(url, context.base);
        }
    }
    // Without a family nothing can ask for the face, and without a source there is none.
    if (face.family.empty()) LogWarning("Invalid font-family given for @font-face rule!");
    if (!hasSource) LogWarning("Unable to parse src string for @font-face: ");
    if (face.family.empty() || face.url.empty()) return std::nullopt;
    return face;
}

namespace {

// from, to, or a percentage from 0 to 100; others name no moment of the animation (CSS Animations Level 1,
// 3).
std::optional<float> ConvertOffset(std::string_view text) {
    if (text.find("from") != std::string_view::npos) return 0.0f;
    if (text.find("to") != std::string_view::npos) return 1.0f;
    float percent = 0;
    size_t length = ReadFloat(text, percent);
    if (length == 0 || text.substr(length) != "%" || percent < 0 || percent > 100) return std::nullopt;
    return percent / 100;
}

class KeyframesBuilder {
  public:
    KeyframesBuilder(KeyframesRule& rule, size_t& budget) : rule_(rule), budget_(budget) {}

    void Add(const CssVector<float>& offsets, const Declaration& value, const DeclarationSyntax& syntax) {
        size_t index = TrackOf(value.property());
        KeyframeTrack& track = rule_.tracks[index];
        if (!track.frames.empty() && !FitInOneAnimation(track.frames[0].value, value)) {
            LogWarning("Keyframe animations must use the same unit for the same property in all blocks - ",
                       rule_.name, "-", PropertyName(value.property()), ": ", syntax.value);
            return;
        }
        for (float offset : offsets)
            AddFrame(index, offset, value);
    }

  private:
    size_t TrackOf(PropertyId property) {
        uint8_t& place = trackOfProperty_[IndexOf(property)];
        if (place == 0) {
            rule_.tracks.emplace_back().property = property;
            place = static_cast<uint8_t>(rule_.tracks.size());
        }
        return place - 1u;
    }

    // A moment that has a value already gets the new one in its place.
    void AddFrame(size_t index, float offset, const Declaration& value) {
        CssVector<KeyframeTrack::Frame>& frames = rule_.tracks[index].frames;
        uint64_t key = uint64_t{index} << 32 | std::bit_cast<uint32_t>(offset);
        auto [place, isNew] = frameOfMoment_.try_emplace(key, static_cast<uint32_t>(frames.size()));
        if (!isNew) {
            frames[place->second].value = value;
            return;
        }
        if (budget_ == 0) {
            frameOfMoment_.erase(key);
            if (!warned_)
                LogWarning("Too many keyframe values in one sheet, the rest is left out: ", rule_.name);
            warned_ = true;
            return;
        }
        --budget_;
        frames.push_back({offset, value});
    }

    KeyframesRule& rule_;
    size_t& budget_;
    bool warned_ = false;
    std::array<uint8_t, kLonghandCount> trackOfProperty_{};
    CssHashMap<uint64_t, uint32_t> frameOfMoment_;
};

}  // namespace

KeyframesRule ConvertKeyframes(const KeyframesSyntax& syntax, ConversionContext& context, size_t& budget) {
    KeyframesRule rule;
    rule.name = WithoutQuotes(syntax.name);
    KeyframesBuilder builder(rule, budget);
    CssVector<float> offsets;
    CssVector<Declaration> values;
    for (const KeyframeBlockSyntax& block : syntax.blocks) {
        offsets.clear();
        for (const KeyframeSelectorSyntax& selector : block.selectors)
            if (std::optional<float> offset = ConvertOffset(selector.text)) offsets.push_back(*offset);
        if (offsets.empty()) continue;
        for (const DeclarationSyntax& declaration : block.declarations) {
            values.clear();
            ConvertDeclaration(declaration, UnknownProperty::Skip, context, values);
            for (const Declaration& value : values)
                builder.Add(offsets, value, declaration);
        }
    }
    return rule;
}

}  // namespace qorvex::css
