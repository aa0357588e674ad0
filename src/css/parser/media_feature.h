// Conditions of @media blocks and of the media attribute.
#pragma once

#include <cstdint>

#include "css/values/css_containers.h"
#include "css/values/length.h"

namespace qorvex::css {

enum class MediaFeatureCode : uint8_t {
    AspectRatio = 0,
    MinAspectRatio = 1,
    MaxAspectRatio = 2,
    MinWidth = 3,
    MaxWidth = 4,
    MinHeight = 5,
    MaxHeight = 6,
    Orientation = 7,
};

struct MediaFeature {
    MediaFeatureCode code = MediaFeatureCode::AspectRatio;
    float number = 0;  // a ratio; of orientation 1 landscape, 0 portrait
    Length length;     // of the widths and heights
    friend bool operator==(const MediaFeature&, const MediaFeature&) = default;
};

using MediaFeatureList = CssVector<MediaFeature>;

}  // namespace qorvex::css
