#include "css/parser/convert_media.h"

#include "core/logging/log.h"
#include "css/parser/convert.h"
#include "css/values/number_parser.h"
#include "css/values/text_reader.h"

namespace qorvex::css {

namespace {

// In the order of MediaFeatureCode.
constexpr std::string_view kNames[] = {"aspect-ratio", "min-aspect-ratio", "max-aspect-ratio", "min-width",
                                       "max-width",    "min-height",       "max-height",       "orientation"};

bool ParseRatio(std::string_view text, float& out) {
    size_t slash = text.find('/');
    float below = 1;
    if (!ParseFloat(Trim(text.substr(0, slash)), out)) return false;
    if (slash != std::string_view::npos && !ParseFloat(Trim(text.substr(slash + 1)), below)) return false;
    if (out == 0 || below == 0) return false;
    out /= below;
    return std::isfinite(out);
}

bool ConvertFeature(const MediaExpressionSyntax& syntax, MediaFeature& out) {
    size_t code = 0;
    while (code < std::size(kNames) && kNames[code] != syntax.name)
        ++code;
    if (code == std::size(kNames)) {
        LogWarning("Unable to parse media feature: ", syntax.name);
        return false;
    }
    out.code = static_cast<MediaFeatureCode>(code);
    if (out.code <= MediaFeatureCode::MaxAspectRatio) {
        if (ParseRatio(syntax.value, out.number)) return true;
        LogWarning("Unable to parse media aspect ratio: ", syntax.value);
        return false;
    }
    if (out.code != MediaFeatureCode::Orientation) {
        if (ParseLength(syntax.value, out.length)) return true;
        LogWarning("Unable to parse media length: ", syntax.value);
        return false;
    }
    bool landscape = EqualsIgnoreCase(syntax.value, "landscape");
    out.number = landscape ? 1 : 0;
    if (landscape || EqualsIgnoreCase(syntax.value, "portrait")) return true;
    LogWarning("Unable to parse media orientation: ", syntax.value);
    return false;
}

}  // namespace

MediaFeatureList ConvertMediaFeatures(const MediaQuerySyntax& query) {
    MediaFeatureList features;
    for (const MediaExpressionSyntax& expression : query.expressions) {
        MediaFeature feature;
        if (ConvertFeature(expression, feature)) features.push_back(feature);
    }
    return features;
}

// A media attribute has one list of features: that of the first query with a usable one.
std::optional<MediaFeatureList> ConvertMediaQuery(const ParserContext& context) {
    for (const MediaSyntax& media : context.GetMediaBlocks()) {
        for (const MediaQuerySyntax& query : media.queries) {
            MediaFeatureList features = ConvertMediaFeatures(query);
            if (!features.empty()) return features;
        }
    }
    return std::nullopt;
}

}  // namespace qorvex::css
