// SVG path text as absolute segments (SVG 2, 9.3): what clip-path: path() holds and what draws it.
#pragma once

#include <cstdint>
#include <string_view>

#include "css/values/css_containers.h"

namespace qorvex::css {

enum class PathVerb : uint8_t { Move, Line, Quad, Cubic, Close };

// Coordinates follow the verbs: 2 floats for Move and Line, 4 for Quad, 6 for Cubic, none for Close. Arcs are
// turned into cubics by the parser.
struct SvgPathData {
    CssVector<PathVerb> verbs;
    CssVector<float> coordinates;

    bool empty() const { return verbs.empty(); }
    friend bool operator==(const SvgPathData&, const SvgPathData&) = default;
};

// Reads as much as is well formed. `consumed` is where reading stopped: the text's size when all of it was
// read. False when not even a first move-to could be read.
[[nodiscard]] bool ParseSvgPath(std::string_view text, SvgPathData& out, size_t& consumed);

}  // namespace qorvex::css
