// The benchmark program calls itself for what has to be measured in a fresh process.
#pragma once

#include <string_view>

namespace qorvex::bench {

inline constexpr const char* kFirstFrameChild = "--child-first-frame";
inline constexpr const char* kFirstContextChild = "--child-first-context";

// Does not return when `argument` is one of the above; prints the seconds it took.
bool RunFirstFrameChild(std::string_view argument);

}  // namespace qorvex::bench
