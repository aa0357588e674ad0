// 64 hexadecimal digits from the shape of the interfaces: the record table and the versions. A client's own
// rendering library returns those of the headers that it was compiled with; the engine compares them with its
// own.
#pragma once
#include <fresco/command_records.h>

namespace fresco {

struct BuildIdentifier {
    char text[65] = {};

    constexpr BuildIdentifier() {
#define FRESCO_TEXT(name, tail, fields) #name #tail #fields ";"
#define FRESCO_FIELD(type, field)
        constexpr char shape[] = FRESCO_COMMANDS(FRESCO_TEXT, FRESCO_FIELD) "interfaces 3";
#undef FRESCO_TEXT
#undef FRESCO_FIELD
        for (uint64_t part = 0; part < 4; ++part) {
            uint64_t hash = 0xCBF29CE484222325ull + part * 0x9E3779B97F4A7C15ull;
            for (const char c : shape)
                hash = (hash ^ uint8_t(c)) * 0x100000001B3ull;
            for (int i = 0; i < 16; ++i)
                text[part * 16 + uint64_t(i)] = "0123456789abcdef"[hash >> (60 - 4 * i) & 15];
        }
    }
};

inline constexpr BuildIdentifier kBuildIdentifier;

}  // namespace fresco
