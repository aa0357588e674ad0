// The user-agent sheet: what a page looks like before its author says anything.
#pragma once

#include <string_view>

namespace qorvex::css {

std::string_view DefaultSheetText();

}  // namespace qorvex::css
