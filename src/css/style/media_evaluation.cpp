// Media Queries Level 3, 4: the features that the engine knows.
#include "css/style/rule_index.h"

namespace qorvex::css {
namespace {

bool Evaluate(const MediaFeature& feature, const LengthContext& metrics) {
    constexpr float kRatioTolerance = 0.001f;
    const float width = metrics.vw * 100, height = metrics.vh * 100;
    const float ratio = width / height;  // a viewport without height has an infinite ratio
    const float length = ResolveLength(feature.length, metrics, 0);
    switch (feature.code) {
        case MediaFeatureCode::AspectRatio:
            return std::fabs(ratio - feature.number) <= kRatioTolerance;
        case MediaFeatureCode::MinAspectRatio:
            return !(ratio + kRatioTolerance < feature.number);
        case MediaFeatureCode::MaxAspectRatio:
            return !(feature.number + kRatioTolerance < ratio);
        case MediaFeatureCode::MinWidth:
            return !(length > width);
        case MediaFeatureCode::MaxWidth:
            return !(width > length);
        case MediaFeatureCode::MinHeight:
            return !(length > height);
        case MediaFeatureCode::MaxHeight:
            return !(height > length);
        case MediaFeatureCode::Orientation:
            return (feature.number != 0) == (width >= height);
    }
    return false;
}

}  // namespace

bool EvaluateMedia(const MediaFeatureList& features, const LengthContext& metrics) {
    for (const MediaFeature& feature : features) {
        if (!Evaluate(feature, metrics)) return false;
    }
    return true;
}

}  // namespace qorvex::css
