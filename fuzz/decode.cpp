// Bytes that stand for characters: percent escapes both ways, UTF-8 to code points.
#include <cstdint>
#include <memory>
#include <string>

#include "core/memory/temp_allocator.h"
#include "core/url/url_escape.h"
#include "layout/text/characters.h"
#include "support/engine.h"

#include "core/url/url_decode.h"

namespace qorvex::fuzz {
namespace {

// The plain way: one character after the other.
std::string DecodePlainly(std::string_view in) {
    std::string out;
    for (size_t i = 0; i < in.size(); ++i) {
        const auto is_digit = [&](size_t at) {
            return at < in.size() && std::isxdigit(static_cast<uint8_t>(in[at]));
        };
        if (in[i] == '%' && is_digit(i + 1) && is_digit(i + 2)) {
            out += static_cast<char>(std::stoi(std::string(in.substr(i + 1, 2)), nullptr, 16));
            i += 2;
        } else {
            out += in[i];
        }
    }
    return out;
}

std::string Decode(std::string_view in) {
    const std::unique_ptr<char[]> out(new char[in.size() + 1]);
    const unsigned written = DecodePercentEscapes(in, out.get());
    Require(written > 0 && written <= in.size() + 1 && out[written - 1] == '\0', "decoded text has no end");
    return {out.get(), written - 1};
}

void CheckEscapes(std::string_view text) {
    const std::string decoded = Decode(text);
    RequireSame(decoded, DecodePlainly(text), "decoding another way");
    const TempMark mark;
    TempString escaped;
    EscapeForURL(text, escaped);
    Require(escaped.size() <= 3 * text.size(), "escaped text is too long");
    TempString twice;
    EscapeForURL(escaped.view(), twice);
    RequireSame(twice.view(), escaped.view(), "escaping twice");
}

void CheckCharacters(std::string_view text) {
    for (const auto mode : {css::WhiteSpaceMode::Normal, css::WhiteSpaceMode::NoWrap,
                            css::WhiteSpaceMode::Pre, css::WhiteSpaceMode::PreWrap}) {
        const TempMark mark;
        layout::Characters characters;
        layout::DecodeCharacters(text, mode, characters);
        Require(characters.codes.size() == characters.offsets.size(), "each code has its place");
        int64_t last = -1;
        for (size_t i = 0; i < characters.codes.size(); ++i) {
            const uint32_t code = characters.codes[i];
            Require(code < 0x110000 && (code < 0xD800 || code > 0xDFFF), "no Unicode scalar value");
            Require(characters.offsets[i] > last && characters.offsets[i] < text.size(), "places ascend");
            last = characters.offsets[i];
        }
    }
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    const qorvex::fuzz::Input input;
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    qorvex::fuzz::CheckEscapes(text);
    qorvex::fuzz::CheckCharacters(text);
    return 0;
}
