// Small image files of one colour, written without a compressor.
#pragma once

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

namespace qorvex::test {

namespace detail {
inline void Put(std::string& out, uint32_t value, int bytes, bool big) {
    for (int i = 0; i < bytes; ++i)
        out.push_back(static_cast<char>(value >> 8 * (big ? bytes - 1 - i : i)));
}

inline void PutChunk(std::string& out, const std::string& type, const std::string& data) {
    Put(out, static_cast<uint32_t>(data.size()), 4, true);
    uint32_t crc = 0xFFFFFFFF;
    for (const char c : type + data) {
        crc ^= static_cast<uint8_t>(c);
        for (int bit = 0; bit < 8; ++bit)
            crc = crc >> 1 ^ (crc & 1 ? 0xEDB88320 : 0);
    }
    out += type + data;
    Put(out, ~crc, 4, true);
}
}  // namespace detail

// RGBA in the order of the bytes: red is 0xFF0000FF.
struct Picture {
    uint32_t width;
    uint32_t height;
    std::vector<uint32_t> pixels;
};

inline Picture Plain(uint32_t width, uint32_t height, uint32_t rgba) {
    return {width, height, std::vector<uint32_t>(size_t{width} * height, rgba)};
}

inline std::string Png(const Picture& picture) {
    using detail::Put;
    std::string rows;
    for (uint32_t y = 0; y < picture.height; ++y) {
        rows.push_back(0);
        for (uint32_t x = 0; x < picture.width; ++x)
            Put(rows, picture.pixels[size_t{y} * picture.width + x], 4, false);
    }
    std::string data("\x78\x01", 2);
    for (size_t at = 0; at < rows.size(); at += 65535) {
        const auto length = static_cast<uint32_t>(std::min<size_t>(65535, rows.size() - at));
        data.push_back(at + length == rows.size());
        Put(data, length, 2, false);
        Put(data, ~length, 2, false);
        data.append(rows, at, length);
    }
    uint32_t a = 1, b = 0;
    for (const char c : rows)
        a = (a + static_cast<uint8_t>(c)) % 65521, b = (b + a) % 65521;
    Put(data, b << 16 | a, 4, true);

    std::string header;
    Put(header, picture.width, 4, true);
    Put(header, picture.height, 4, true);
    header.append("\x08\x06\x00\x00\x00", 5);
    std::string file("\x89PNG\r\n\x1a\n");
    detail::PutChunk(file, "IHDR", header);
    detail::PutChunk(file, "IDAT", data);
    detail::PutChunk(file, "IEND", "");
    return file;
}

// An animation of red, blue, green, black, red ... frames; delays in hundredths of a second.
inline std::string Gif(uint32_t width, uint32_t height, const std::vector<uint32_t>& delays) {
    using detail::Put;
    std::string file("GIF89a");
    Put(file, width, 2, false);
    Put(file, height, 2, false);
    file.append("\x91\x00\x00", 3);  // four colours follow
    file.append("\xFF\x00\x00\x00\x00\xFF\x00\xFF\x00\x00\x00\x00", 12);
    for (size_t frame = 0; frame < delays.size(); ++frame) {
        file.append("\x21\xF9\x04\x00", 4);
        Put(file, delays[frame], 2, false);
        file.append("\x00\x00\x2C\x00\x00\x00\x00", 7);
        Put(file, width, 2, false);
        Put(file, height, 2, false);
        file.append("\x00\x02", 2);
        // Codes of three bits; a clear code before each pixel keeps them at that.
        std::string codes;
        uint32_t bits = 0, filled = 0;
        const auto put = [&](uint32_t code) {
            bits |= code << filled, filled += 3;
            for (; filled >= 8; filled -= 8, bits >>= 8)
                codes.push_back(static_cast<char>(bits));
        };
        for (uint32_t pixel = 0; pixel < width * height; ++pixel)
            put(4), put(static_cast<uint32_t>(frame % 4));
        put(5);
        codes.push_back(static_cast<char>(bits));
        for (size_t at = 0; at < codes.size(); at += 255) {
            const std::string block = codes.substr(at, 255);
            file.push_back(static_cast<char>(block.size()));
            file += block;
        }
        file.push_back(0);
    }
    file.push_back(0x3B);
    return file;
}

}  // namespace qorvex::test
