// Font files put together from the tables of an installed font, so that no binary stands in the tree.
#pragma once
#include <algorithm>

#include "canvas.h"

namespace fresco::test {

using Bytes = std::vector<uint8_t>;

inline uint32_t Read32(const Bytes& bytes, size_t at) {
    return uint32_t(bytes[at]) << 24 | uint32_t(bytes[at + 1]) << 16 | uint32_t(bytes[at + 2]) << 8 |
           bytes[at + 3];
}
inline void Put16(Bytes& out, uint32_t value) {
    out.push_back(uint8_t(value >> 8)), out.push_back(uint8_t(value));
}
inline void Put32(Bytes& out, uint32_t value) {
    Put16(out, value >> 16), Put16(out, value & 0xFFFF);
}
inline uint32_t Tag(const char* name) {
    return uint32_t(name[0]) << 24 | uint32_t(name[1]) << 16 | uint32_t(name[2]) << 8 | uint32_t(name[3]);
}

struct Table {
    uint32_t tag;
    Bytes bytes;
};

inline std::vector<Table> TablesOf(const Bytes& font) {
    std::vector<Table> tables;
    const size_t count = size_t(font[4]) << 8 | font[5];
    for (size_t i = 0; i < count; ++i) {
        const size_t entry = 12 + i * 16;
        const size_t offset = Read32(font, entry + 8), length = Read32(font, entry + 12);
        tables.push_back({Read32(font, entry), Bytes(font.begin() + ptrdiff_t(offset),
                                                     font.begin() + ptrdiff_t(offset + length))});
    }
    return tables;
}

// The same tables as a plain font, or uncompressed as WOFF.
inline Bytes Build(std::vector<Table> tables, bool woff) {
    std::sort(tables.begin(), tables.end(), [](const Table& a, const Table& b) { return a.tag < b.tag; });
    const uint32_t count = uint32_t(tables.size());
    const size_t entrySize = woff ? 20 : 16, headerSize = woff ? 44 : 12;
    size_t offset = headerSize + entrySize * count;
    Bytes directory, body;
    uint32_t plainSize = 12 + 16 * count;
    for (const Table& table : tables) {
        const uint32_t length = uint32_t(table.bytes.size());
        Put32(directory, table.tag);
        if (!woff) Put32(directory, 0);
        Put32(directory, uint32_t(offset + body.size()));
        Put32(directory, length);
        if (woff) Put32(directory, length), Put32(directory, 0);
        body.insert(body.end(), table.bytes.begin(), table.bytes.end());
        while (body.size() % 4)
            body.push_back(0);
        plainSize += (length + 3) & ~3u;
    }
    Bytes out;
    if (woff) {
        for (const uint32_t word : {Tag("wOFF"), 0x00010000u, uint32_t(offset + body.size())})
            Put32(out, word);
        Put16(out, count), Put16(out, 0), Put32(out, plainSize);
        out.resize(headerSize, 0);
    } else {
        Put32(out, 0x00010000), Put16(out, count);
        out.resize(headerSize, 0);
    }
    out.insert(out.end(), directory.begin(), directory.end());
    out.insert(out.end(), body.begin(), body.end());
    return out;
}

inline uint32_t GlyphOf(const IFont& font, uint32_t code) {
    uint32_t glyph = 0;
    font.GetGlyphIndices(&code, 1, &glyph);
    return glyph;
}

inline FontId Load(IFontService& service, const Bytes& bytes, SdfMode sdf = SdfMode::Never,
                   uint32_t wanted = kAnyStyle) {
    MemoryReader reader(bytes);
    return service.LoadFace(&reader, 0, sdf, wanted);
}

inline void DrawText(Canvas& canvas, FontId font, const char* text, float size, float y,
                     Color color = {0, 0, 0, 1}) {
    CommandBuffer* b = Library::CreateBuffer(0, 0);
    TextPaint paint;
    paint.font = font, paint.size = size, paint.x = 4, paint.y = y;
    paint.paint.color = color;
    b->FillString(text, std::strlen(text), paint);
    canvas.Draw(b);
}

}  // namespace fresco::test
