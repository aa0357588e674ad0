// Percent escapes of URL text (RFC 3986, section 2.1).
#pragma once

#include <string_view>

namespace qorvex {

// Writes the decoded text with a terminating zero to out, which has room for one byte more than the input;
// returns the bytes written, terminator included. "%" and two hexadecimal digits of either case become that
// byte; anything else stays as it stands.
unsigned DecodePercentEscapes(std::string_view in, char* out);

}  // namespace qorvex
