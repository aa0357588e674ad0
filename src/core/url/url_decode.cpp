#include "core/url/url_decode.h"

namespace qorvex {

namespace {

int HexValue(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

}  // namespace

unsigned DecodePercentEscapes(std::string_view in, char* out) {
    char* end = out;
    for (size_t i = 0; i < in.size(); ++i) {
        const int high = in[i] == '%' && i + 2 < in.size() ? HexValue(in[i + 1]) : -1;
        const int low = high >= 0 ? HexValue(in[i + 2]) : -1;
        if (low >= 0) {
            *end++ = static_cast<char>(high * 16 + low);
            i += 2;
        } else {
            *end++ = in[i];
            // A digit behind the "%" goes along with it: it cannot begin anything itself.
            if (high >= 0) *end++ = in[++i];
        }
    }
    *end++ = '\0';
    return static_cast<unsigned>(end - out);
}

}  // namespace qorvex
