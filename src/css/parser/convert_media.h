#pragma once

#include "css/parser/media_feature.h"
#include "css/parser/syntax.h"

namespace qorvex::css {

// The usable features of a query; others are dropped with a log line.
[[nodiscard]] MediaFeatureList ConvertMediaFeatures(const MediaQuerySyntax& query);

}  // namespace qorvex::css
