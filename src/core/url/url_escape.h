// The cleaning that comes before parsing, and its inverse.
#pragma once

#include "core/memory/temp_vector.h"

namespace qorvex {

// Drops tabs and line ends, and percent-encodes what may not stand in a URL. A "%" stays, so that text which
// is encoded already is not encoded twice.
void EscapeForURL(std::string_view in, TempString& out);

}  // namespace qorvex
