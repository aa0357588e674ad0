// 64 hexadecimal digits from the shape of the interfaces: the record table and the versions.
#include <fresco/command_records.h>
#include <fresco/rendering_library.h>

namespace fresco {
namespace {

#define FRESCO_TEXT(name, tail, fields) #name #tail #fields ";"
#define FRESCO_FIELD(type, field)
constexpr char kShape[] = FRESCO_COMMANDS(FRESCO_TEXT, FRESCO_FIELD) "interfaces 2";
#undef FRESCO_TEXT
#undef FRESCO_FIELD

struct Identifier {
    char text[65] = {};
    constexpr Identifier() {
        for (uint64_t part = 0; part < 4; ++part) {
            uint64_t hash = 0xCBF29CE484222325ull + part * 0x9E3779B97F4A7C15ull;
            for (const char c : kShape)
                hash = (hash ^ uint8_t(c)) * 0x100000001B3ull;
            for (int i = 0; i < 16; ++i)
                text[part * 16 + uint64_t(i)] = "0123456789abcdef"[hash >> (60 - 4 * i) & 15];
        }
    }
};

constexpr Identifier kIdentifier;

}  // namespace

const char* GetBuildIdentifier() {
    return kIdentifier.text;
}

}  // namespace fresco
