#include "core/url/url_escape.h"

namespace qorvex {

namespace {

bool StaysAsItIs(unsigned char c) {
    if (c < 0x21 || c > 0x7E) return false;
    return std::string_view("\"<>\\^`{}|").find(static_cast<char>(c)) == std::string_view::npos;
}

}  // namespace

void EscapeForURL(std::string_view in, TempString& out) {
    static constexpr char kHex[] = "0123456789ABCDEF";
    out.reserve(in.size() * 3);
    for (const char c : in) {
        if (c == '\0') break;
        if (c == '\t' || c == '\n' || c == '\r') continue;
        const auto byte = static_cast<unsigned char>(c);
        if (StaysAsItIs(byte)) {
            out.push_back(c);
        } else {
            out.push_back('%');
            out.push_back(kHex[byte >> 4]);
            out.push_back(kHex[byte & 15]);
        }
    }
}

}  // namespace qorvex
