// Fonts that the client registers with a System.
#pragma once

#include <cstdint>

namespace qorvex {

struct FontStyles {
    enum FontStyle : std::uint8_t { Undefined = 0, Normal = 1, Italic = 2, Oblique = 3 };
};

// Hundreds of the CSS weight: 4 is normal, 7 is bold. 0 leaves the weight to the font file.
using FontWeight = std::uint8_t;

struct FontSDF {
    enum Mode : std::uint32_t { Off = 0, On = 1, Auto = 2 };
};

// Which face a font file is to be. An empty family, a style of Undefined or a weight of 0 are taken from the
// file. Texts are copied.
struct FontDescription {
    const char* FamilyName = nullptr;
    FontStyles::FontStyle Style = FontStyles::Undefined;
    FontWeight Weight = 0;
};

// One glyph page of a bitmap font that the client has decoded already: premultiplied RGBA8 pixels, read
// during the call only.
struct UserFontImage {
    const void* Pixels = nullptr;
    std::uint32_t Width = 0;
    std::uint32_t Height = 0;
    std::uint32_t RowPitch = 0;  // bytes
};

// A bitmap font. Description is the text of its glyph table (AngelCode BMFont, text form), copied.
struct UserFontDescription {
    const char* FamilyName = nullptr;
    bool Italic = false;
    bool Bold = false;
    FontWeight Weight = 0;  // 0: 7 when Bold, else 4
    const char* Description = nullptr;
    std::uint32_t DescriptionSize = 0;
};

}  // namespace qorvex
