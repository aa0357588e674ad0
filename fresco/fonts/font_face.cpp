#include "fresco/fonts/font_face.h"

namespace fresco {

void FontFace::PreloadText(const char* utf8, size_t length) const {
    Vector<uint32_t> codePoints;
    DecodeUtf8(utf8, length, &codePoints);
    PreloadGlyphs(codePoints.data(), codePoints.size());
}

void DecodeUtf8(const char* text, size_t length, Vector<uint32_t>* out) {
    const auto* p = reinterpret_cast<const uint8_t*>(text);
    const uint8_t* end = p + length;
    while (p < end) {
        const uint32_t lead = *p++;
        if (lead < 0x80) {
            out->push_back(lead);
            continue;
        }
        const int trail = lead >= 0xF0 && lead < 0xF5   ? 3
                          : lead >= 0xE0 && lead < 0xF0 ? 2
                          : lead >= 0xC2 && lead < 0xE0 ? 1
                                                        : 0;
        uint32_t code = lead & (0x3Fu >> trail);
        int read = 0;
        while (read < trail && p + read < end && (p[read] & 0xC0) == 0x80)
            code = code << 6 | (p[read++] & 0x3F);
        constexpr uint32_t kLeast[] = {0, 0x80, 0x800, 0x10000};
        const bool valid = trail > 0 && read == trail && code >= kLeast[trail] && code <= 0x10FFFF &&
                           (code < 0xD800 || code > 0xDFFF);
        if (valid) p += trail;
        out->push_back(valid ? code : 0xFFFD);
    }
}

}  // namespace fresco
